// FrameBuffer: what a render target draws into: a frame buffer over a texture's storage, or one that belongs to
// the host and is never deleted.
// Owner:  shared; a target made from the current frame buffer shares the active target's.
// Thread: render thread.
#pragma once

#include "moka/renderer/device/RunState.h"

#include <memory>

namespace Moka::detail {

class TextureStorage;

class FrameBuffer {
public:
    explicit FrameBuffer(DeviceName hosts);
    // Within a request: takes one of the storage's and returns it in the end. 0 when the device refuses.
    explicit FrameBuffer(std::shared_ptr<TextureStorage> storage);
    ~FrameBuffer();
    FrameBuffer(FrameBuffer const&) = delete;
    FrameBuffer& operator=(FrameBuffer const&) = delete;

    DeviceName GetName() const { return mName; }
    // Null for a host's.
    TextureStorage* GetStorage() const { return mStorage.get(); }

private:
    DeviceName const mName;
    std::shared_ptr<TextureStorage> const mStorage;
};

} // namespace Moka::detail
