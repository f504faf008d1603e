// GlFrameBuffer: what render targets draw into: a frame buffer over a texture's storage, or a name that
// belongs to the host and is never deleted.
// Owner:  shared; a target made from the current frame buffer shares the active target's.
// Thread: render thread.
#pragma once

#include <GLES3/gl3.h>

#include <memory>

namespace Moka::detail {

class GlTextureStorage;

class GlFrameBuffer {
public:
    // Null, with one error line, when the driver refuses.
    static std::shared_ptr<GlFrameBuffer> Over(std::shared_ptr<GlTextureStorage> storage);
    static std::shared_ptr<GlFrameBuffer> OfHost(GLuint name);
    ~GlFrameBuffer();
    GlFrameBuffer(GlFrameBuffer const&) = delete;
    GlFrameBuffer& operator=(GlFrameBuffer const&) = delete;

    GLuint GetName() const { return mName; }
    // Null for the host's.
    GlTextureStorage* GetStorage() const { return mStorage.get(); }

    // The render buffer that is attached in GL, 0 for none; GlDepthStencilPool's to change.
    GLuint depthStencil = 0;

private:
    GlFrameBuffer(GLuint name, std::shared_ptr<GlTextureStorage> storage);

    GLuint const mName;
    std::shared_ptr<GlTextureStorage> const mStorage;
};

} // namespace Moka::detail
