// GlVertexFormats: one vertex array for each layout of vertices in use, all over one buffer that every submission
// fills anew.
// Thread: render thread.
#pragma once

#include "moka/renderer/VertexDescriptor.h"
#include "moka/renderer/device/VertexBuffer.h"
#include "moka/renderer/gles/GlFunctions.h"

#include <vector>

namespace Moka::detail {

class GlState;

class GlVertexFormats {
public:
    explicit GlVertexFormats(GlState& state) : mState(state) {}

    // The number of the layout, the same for equal ones. Nothing is made in GL yet.
    int Find(VertexDescriptor const& descriptor);

    // Within an operation: replaces the buffer's contents.
    void Upload(VertexBuffer const& vertices);
    // Within an operation: draws read the buffer in this layout.
    void Bind(int format);
    // The same, with vertex 0 of a draw at vertex first of the buffer, and a number for each vertex at
    // GlslVariant's location, from numbers on.
    void BindNumbered(int format, int first, GLuint numberBuffer, std::size_t numbers);

    void Clear();

private:
    struct Format {
        VertexDescriptor descriptor;
        GLuint vertexArray = 0;
        GLuint numberedArray = 0;
        int first = 0; // vertex that the numbered array begins at
        std::size_t numbers = 0;
    };

    void MakeVertexArray(GLuint* vertexArray);
    void SetAttributes(VertexDescriptor const& descriptor, int first);
    void DeleteVertexArray(GLuint vertexArray);

    GlState& mState;
    std::vector<Format> mFormats;
    GLuint mBuffer = 0;
};

} // namespace Moka::detail
