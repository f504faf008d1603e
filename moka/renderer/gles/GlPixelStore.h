// GlPixelStore: how pixels lie in memory, all of it that touches two-dimensional transfers. The default
// values are GL's own; that is how the renderer leaves it after each transfer.
#pragma once

#include <GLES3/gl3.h>

namespace Moka::detail {

struct GlPixelStore {
    GLuint buffer = 0;
    GLint alignment = 4;
    GLint rowLength = 0; // pixels; 0 for tightly packed rows
    GLint skipRows = 0;
    GLint skipPixels = 0;

    friend bool operator==(GlPixelStore const& a, GlPixelStore const& b) {
        return a.buffer == b.buffer && a.alignment == b.alignment && a.rowLength == b.rowLength &&
               a.skipRows == b.skipRows && a.skipPixels == b.skipPixels;
    }
};

// The names of one direction.
struct GlUnpackNames {
    static constexpr GLenum kBuffer = GL_PIXEL_UNPACK_BUFFER;
    static constexpr GLenum kAlignment = GL_UNPACK_ALIGNMENT;
    static constexpr GLenum kRowLength = GL_UNPACK_ROW_LENGTH;
    static constexpr GLenum kSkipRows = GL_UNPACK_SKIP_ROWS;
    static constexpr GLenum kSkipPixels = GL_UNPACK_SKIP_PIXELS;
};

struct GlPackNames {
    static constexpr GLenum kBuffer = GL_PIXEL_PACK_BUFFER;
    static constexpr GLenum kAlignment = GL_PACK_ALIGNMENT;
    static constexpr GLenum kRowLength = GL_PACK_ROW_LENGTH;
    static constexpr GLenum kSkipRows = GL_PACK_SKIP_ROWS;
    static constexpr GLenum kSkipPixels = GL_PACK_SKIP_PIXELS;
};

// For GlShadow. There is no query: foreign code finds GL's defaults again, not what it left.
template <class Names>
struct GlPixelStoreAccess {
    using Value = GlPixelStore;

    static void Apply(Value const& value, Value const* known) {
        if (!known || known->buffer != value.buffer) glBindBuffer(Names::kBuffer, value.buffer);
        Store(Names::kAlignment, value.alignment, known ? &known->alignment : nullptr);
        Store(Names::kRowLength, value.rowLength, known ? &known->rowLength : nullptr);
        Store(Names::kSkipRows, value.skipRows, known ? &known->skipRows : nullptr);
        Store(Names::kSkipPixels, value.skipPixels, known ? &known->skipPixels : nullptr);
    }

private:
    static void Store(GLenum name, GLint value, GLint const* known) {
        if (!known || *known != value) glPixelStorei(name, value);
    }
};

} // namespace Moka::detail
