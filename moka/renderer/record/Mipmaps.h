// Mipmaps: which textures have levels that show their contents, in the order of requests. A draw that samples
// with TextureFilterMipmapped has the levels made before it unless they are here; whatever changes a texture
// takes it out.
// Owner:  the recorder.
// Thread: render thread, within a request.
// Cost:   nothing while no texture is sampled so.
#pragma once

#include "moka/renderer/device/RunState.h"

#include <unordered_set>

namespace Moka::detail {

class Mipmaps {
public:
    // False: the levels show older contents, or there are none.
    bool IsCurrent(DeviceName texture) const { return mCurrent.count(texture) != 0; }
    void SetCurrent(DeviceName texture) { mCurrent.insert(texture); }
    // The texture's contents change, or the texture goes.
    void Forget(DeviceName texture) {
        if (!mCurrent.empty()) mCurrent.erase(texture);
    }

private:
    std::unordered_set<DeviceName> mCurrent;
};

} // namespace Moka::detail
