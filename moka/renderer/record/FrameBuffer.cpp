#include "moka/renderer/record/FrameBuffer.h"

#include "moka/renderer/record/TextureStorage.h"

#include <utility>

namespace Moka::detail {

FrameBuffer::FrameBuffer(DeviceName hosts) : mName(hosts) {}

FrameBuffer::FrameBuffer(std::shared_ptr<TextureStorage> storage)
    : mName(storage->TakeFrameBuffer()), mStorage(std::move(storage)) {}

FrameBuffer::~FrameBuffer() {
    if (mStorage) mStorage->ReturnFrameBuffer(mName);
}

} // namespace Moka::detail
