// GlTextureStorage: the texels that one or several texture objects and render targets share, and the GL name
// over them. The last owner's going deletes the name, once.
// Owner:  shared.
// Thread: render thread; the last owner may go on any.
// Units:  texels; row 0 is GL's row 0 and the first row uploaded.
#pragma once

#include "moka/renderer/PixelBuffer.h"

#include <GLES3/gl3.h>

#include <cstdint>
#include <memory>

namespace Moka {
class Rect;
}

namespace Moka::detail {

class GlContext;

class GlTextureStorage {
public:
    // Transparent when source has no pixels. Null, with one error line, when the driver refuses.
    static std::shared_ptr<GlTextureStorage> Create(std::shared_ptr<GlContext> context, int width, int height,
                                                    PixelSource const& source);
    ~GlTextureStorage();
    GlTextureStorage(GlTextureStorage const&) = delete;
    GlTextureStorage& operator=(GlTextureStorage const&) = delete;

    std::shared_ptr<GlContext> const& GetContext() const { return mContext; }
    GLuint GetName() const { return mName; }
    int GetWidth() const { return mWidth; }
    int GetHeight() const { return mHeight; }

    // pixels addresses rect's first pixel; stride in bytes. What lies outside is skipped.
    void Upload(Rect const& rect, void const* pixels, std::int64_t stride);

    // From the frame buffer that name stands for, its first rows and columns, at most width x height.
    void CopyFrom(GLuint frameBuffer, bool hasAlpha, int width, int height);
    // To the frame buffer that name stands for, whatever the scissor is.
    void CopyTo(GLuint frameBuffer);

    // The number of the last draw list that named it.
    std::uint64_t listed = 0;

    // A frame buffer with this texture for its colour and nothing else; 0, with one error line, when the
    // driver refuses. The storage keeps one that is given back, because reading a pixel takes and gives one.
    GLuint TakeFrameBuffer();
    void GiveFrameBuffer(GLuint name);

private:
    GlTextureStorage(std::shared_ptr<GlContext> context, int width, int height);

    bool Allocate();
    bool Clear();
    // Where a copy would otherwise miss what was drawn last.
    void FinishDrawing();
    void Blit(GLuint from, GLuint to, int width, int height);
    GLuint MakeFrameBuffer();

    std::shared_ptr<GlContext> const mContext;
    int const mWidth;
    int const mHeight;
    GLuint mName = 0;
    GLuint mIdleFrameBuffer = 0;
};

} // namespace Moka::detail
