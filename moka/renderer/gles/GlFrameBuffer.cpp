#include "moka/renderer/gles/GlFrameBuffer.h"

#include "moka/renderer/gles/GlTextureStorage.h"

#include <utility>

namespace Moka::detail {

std::shared_ptr<GlFrameBuffer> GlFrameBuffer::Over(std::shared_ptr<GlTextureStorage> storage) {
    GLuint const name = storage->TakeFrameBuffer();
    if (name == 0) return nullptr;
    return std::shared_ptr<GlFrameBuffer>(new GlFrameBuffer(name, std::move(storage)));
}

std::shared_ptr<GlFrameBuffer> GlFrameBuffer::OfHost(GLuint name) {
    return std::shared_ptr<GlFrameBuffer>(new GlFrameBuffer(name, nullptr));
}

GlFrameBuffer::GlFrameBuffer(GLuint name, std::shared_ptr<GlTextureStorage> storage)
    : mName(name), mStorage(std::move(storage)) {}

GlFrameBuffer::~GlFrameBuffer() {
    if (mStorage) mStorage->GiveFrameBuffer(mName);
}

} // namespace Moka::detail
