#include "moka/renderer/gles/GlFrameBuffer.h"

#include "moka/renderer/gles/GlContext.h"
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

// One with a render buffer attached is of no use to the storage.
GlFrameBuffer::~GlFrameBuffer() {
    if (!mStorage) return;
    if (depthStencil == 0) {
        mStorage->GiveFrameBuffer(mName);
        return;
    }
    GlContext& context = *mStorage->GetContext();
    context.depthStencilPool.Forget(*this);
    context.Drop(GlNameKind::FrameBuffer, mName);
}

} // namespace Moka::detail
