// GlVertexFormats: one vertex array for each vertex layout. All use one vertex buffer, which every submission
// fills again.
// Thread: render thread.
#pragma once

#include "moka/renderer/VertexDescriptor.h"
#include "moka/renderer/device/AppendBuffer.h"
#include "moka/renderer/gles/GlFunctions.h"

#include <vector>

namespace Moka::detail {

class GlState;

class GlVertexFormats {
public:
    explicit GlVertexFormats(GlState& state) : mState(state) {}

    // Returns the index of the layout; equal layouts have the same one. Makes no GL call.
    int Find(VertexDescriptor const& descriptor);

    // Replaces the buffer's contents.
    void Upload(AppendBuffer<float> const& vertices);
    // Makes draws read the buffer in this layout.
    void Bind(int format);
    // Like Bind, but vertex 0 of a draw is vertex `first` of the buffer. Each vertex also reads its record
    // number from numberBuffer, starting at index `numbers`, at location kRecordLocation.
    void BindNumbered(int format, int first, GLuint numberBuffer, std::size_t numbers);

    void Clear();

private:
    struct Format {
        VertexDescriptor descriptor;
        GLuint vertexArray = 0;
        GLuint numberedArray = 0;
        int first = 0; // the first vertex of the numbered array
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
