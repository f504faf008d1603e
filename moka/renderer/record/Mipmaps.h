// Mipmaps: the set of textures whose mipmap levels are current, in the order of requests. Before a draw that
// samples with TextureFilterMipmapped, the recorder generates the levels of textures that are not in the set.
// Each change of a texture removes it from the set.
// Owner:  the recorder.
// Thread: render thread, within a request.
// Cost:   nothing until a texture is sampled with TextureFilterMipmapped.
#pragma once

#include "moka/renderer/device/RunState.h"

#include <unordered_set>

namespace Moka::detail {

class Mipmaps {
public:
    // False if the levels are outdated or do not exist.
    bool IsCurrent(DeviceName texture) const { return mCurrent.count(texture) != 0; }
    void SetCurrent(DeviceName texture) { mCurrent.insert(texture); }
    // Call this when the texture's contents change or the texture is deleted.
    void Forget(DeviceName texture) {
        if (!mCurrent.empty()) mCurrent.erase(texture);
    }

private:
    std::unordered_set<DeviceName> mCurrent;
};

} // namespace Moka::detail
