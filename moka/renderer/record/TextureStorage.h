// TextureStorage: the texels that several texture objects and render targets share. The last owner deletes
// them, once.
// Owner:  shared.
// Thread: render thread; the last owner may go on any.
// Units:  texels; row 0 is the first row uploaded.
#pragma once

#include "moka/renderer/PixelBuffer.h"
#include "moka/renderer/device/RunState.h"

#include <memory>

namespace Moka::detail {

class Recorder;

class TextureStorage {
public:
    // Within a request. Transparent when source has no pixels. Null when the device refuses.
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

    // Within a request: a frame buffer over these texels; 0 when the device refuses. The storage keeps one that
    // is returned, because reading a pixel takes one and returns it.
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
