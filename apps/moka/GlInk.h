// GlInk: ink drawn with bare GL, by a program and a vertex array of its own. It shares nothing with the renderer
// and cleans up nothing behind itself.
// Thread: render thread.
#pragma once

#include "moka/graphics/math/Matrix4.h"
#include "moka/graphics/math/Vector.h"

#include <memory>
#include <vector>

namespace Moka::Tool {

// How far from the middle of the ink, and the ink's radius there.
struct InkVertex {
    float x, y;
    float across, radius;
};

class GlInk {
public:
    // Throws with the driver's text when it refuses the program.
    static std::unique_ptr<GlInk> Create();
    ~GlInk(); // deletes its names, whatever is bound
    GlInk(GlInk const&) = delete;
    GlInk& operator=(GlInk const&) = delete;

    // Draws a triangle strip in a premultiplied colour over what is there. It sets all that it depends on,
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
