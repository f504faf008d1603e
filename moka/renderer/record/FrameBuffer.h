// FrameBuffer: the frame buffer of a render target. It either has a texture's storage attached, or belongs to
// the host; a frame buffer of the host is never deleted.
// Owner:  shared. A target created from the current frame buffer shares that of the active target.
// Thread: render thread.
#pragma once

#include "moka/renderer/device/RunState.h"

#include <memory>

namespace Moka::detail {

class TextureStorage;

class FrameBuffer {
public:
    explicit FrameBuffer(DeviceName hosts);
    // Call this within a request. Takes a frame buffer from the storage; the destructor returns it. GetName()
    // is 0 if the device could not create one.
    explicit FrameBuffer(std::shared_ptr<TextureStorage> storage);
    ~FrameBuffer();
    FrameBuffer(FrameBuffer const&) = delete;
    FrameBuffer& operator=(FrameBuffer const&) = delete;

    DeviceName GetName() const { return mName; }
    // Null for a frame buffer of the host.
    TextureStorage* GetStorage() const { return mStorage.get(); }

private:
    DeviceName const mName;
    std::shared_ptr<TextureStorage> const mStorage;
};

} // namespace Moka::detail
