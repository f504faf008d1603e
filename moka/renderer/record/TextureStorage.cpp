#include "moka/renderer/record/TextureStorage.h"

#include "moka/base/Trace.h"
#include "moka/renderer/record/Recorder.h"

#include <utility>

namespace Moka::detail {

std::shared_ptr<TextureStorage> TextureStorage::Create(std::shared_ptr<Recorder> const& recorder, int width,
                                                       int height, PixelSource const& source) {
    Device& device = recorder->GetDevice();
    DeviceName const name = device.CreateTexture(width, height);
    if (name == 0) return nullptr;
    ++recorder->counters.textures;
    auto storage = std::make_shared<TextureStorage>(recorder, name, width, height);
    if (!source.pixels) return storage->Clear() ? storage : nullptr;
    std::int64_t const stride =
        std::int64_t{source.rowLength > 0 ? source.rowLength : width} * kBytesPerPixel;
    auto const* const first = static_cast<unsigned char const*>(source.pixels) + source.y * stride +
                              std::ptrdiff_t{source.x} * kBytesPerPixel;
    PixelBlock const all = PixelBlock::Clip(0, 0, width, height, width, height);
    TraceScope const trace("renderer", "Upload", "bytes", all.GetBytes());
    device.Upload(name, all, first, stride);
    recorder->counters.bytesUploaded += all.GetBytes();
    return storage;
}

TextureStorage::TextureStorage(std::shared_ptr<Recorder> recorder, DeviceName name, int width, int height)
    : mRecorder(std::move(recorder)), mName(name), mWidth(width), mHeight(height) {}

TextureStorage::~TextureStorage() {
    mRecorder->Drop(DroppedKind::FrameBuffer, mIdleFrameBuffer);
    mRecorder->Drop(DroppedKind::Texture, mName);
}

// Clears by way of a frame buffer, not by an upload of zeros: no memory is filled and transferred, and tiled
// GPUs clear without touching the texels. A texture without pixels is usually drawn into next, so the frame
// buffer is needed anyway.
bool TextureStorage::Clear() {
    DeviceName const frameBuffer = TakeFrameBuffer();
    if (frameBuffer == 0) return false;
    mRecorder->Add(TextureClear{Describe(frameBuffer)});
    ReturnFrameBuffer(frameBuffer);
    return true;
}

DeviceName TextureStorage::TakeFrameBuffer() {
    if (mIdleFrameBuffer != 0) return std::exchange(mIdleFrameBuffer, 0);
    DeviceName const name = mRecorder->GetDevice().CreateFrameBuffer(mName, mWidth, mHeight);
    if (name != 0) ++mRecorder->counters.frameBuffers;
    return name;
}

void TextureStorage::ReturnFrameBuffer(DeviceName frameBuffer) {
    mRecorder->Drop(DroppedKind::FrameBuffer, std::exchange(mIdleFrameBuffer, frameBuffer));
}

TargetRef TextureStorage::Describe(DeviceName frameBuffer) const {
    return {frameBuffer, mName, mWidth, mHeight, 0};
}

} // namespace Moka::detail
