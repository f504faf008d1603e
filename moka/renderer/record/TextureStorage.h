// TextureStorage: the texels that several texture objects and render targets share. The last owner deletes
// them.
// Owner:  shared.
// Thread: render thread. The last owner may be deleted on any thread.
// Units:  texels; row 0 is the first row uploaded.
#pragma once

#include "moka/renderer/PixelBuffer.h"
#include "moka/renderer/device/RunState.h"

#include <memory>

namespace Moka::detail {

class Recorder;

class TextureStorage {
public:
    // Call this within a request. The texels are transparent if source has no pixels. Returns null if the
    // device cannot create the texture.
    static std::shared_ptr<TextureStorage> Create(std::shared_ptr<Recorder> const& recorder, int width,
                                                  int height, PixelSource const& source);
    TextureStorage(std::shared_ptr<Recorder> recorder, DeviceName name, int width, int height);
    ~TextureStorage();
    TextureStorage(TextureStorage const&) = delete;
    TextureStorage& operator=(TextureStorage const&) = delete;

    std::shared_ptr<Recorder> const& GetRecorder() const { return mRecorder; }
    DeviceName GetName() const { return mName; }
    int GetWidth() const { return mWidth; }
    int GetHeight() const { return mHeight; }

    // Call this within a request. Returns a frame buffer with this texture attached, or 0 if the device
    // cannot create one. A returned frame buffer is kept for the next call, because each read-back takes and
    // returns one.
    DeviceName TakeFrameBuffer();
    void ReturnFrameBuffer(DeviceName frameBuffer);
    TargetRef Describe(DeviceName frameBuffer) const;

private:
    bool Clear();

    std::shared_ptr<Recorder> const mRecorder;
    DeviceName const mName;
    int const mWidth;
    int const mHeight;
    DeviceName mIdleFrameBuffer = 0;
};

} // namespace Moka::detail
