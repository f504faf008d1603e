// GlInk: draws ink with plain GL calls, with its own program and vertex array. It does not use the renderer
// and does not restore GL state.
// Thread: render thread.
#pragma once

#include "moka/graphics/math/Matrix4.h"
#include "moka/graphics/math/Vector.h"

#include <memory>
#include <vector>

namespace Moka::Tool {

// A vertex, with its distance from the middle of the ink, and the ink's radius there.
struct InkVertex {
    float x, y;
    float across, radius;
};

class GlInk {
public:
    // Throws an exception with the driver's text if the program does not compile.
    static std::unique_ptr<GlInk> Create();
    ~GlInk(); // deletes its GL objects
    GlInk(GlInk const&) = delete;
    GlInk& operator=(GlInk const&) = delete;

    // Draws a triangle strip in a premultiplied colour, source-over. Sets all GL state that it depends on,
    // except target, viewport, clip and masks.
    void Draw(Matrix4<float> const& matrix, std::vector<InkVertex> const& strip,
              Vector4<float> const& color) const;
    // Makes its program and its vertex array current.
    void Bind() const;

private:
    GlInk();

    unsigned mProgram;
    unsigned mVertexArray = 0;
    unsigned mBuffer = 0;
};

} // namespace Moka::Tool
