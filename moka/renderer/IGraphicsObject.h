/// IGraphicsObject: holds vertices of one layout and draws them.
/// Owner:  the creator, until Release().
/// Thread: render thread.
/// Draw records target, scissor, blend and depth-stencil state, program and its parameters, textures and
/// vertices by value: later changes of them do not reach the draw.
#pragma once

#include "moka/renderer/DrawBounds.h"

namespace Moka {

/// How vertices form triangles.
enum class PrimitiveType { TriangleList, TriangleStrip };

class IGraphicsObject {
public:
    /// Replaces all vertices by copies of these. stream must be 0. With a count of 0, which needs no data,
    /// the object has no vertices. Another stream, a negative count or null data logs an error, and the
    /// object has no vertices.
    virtual void SetVertices(int stream, void const* data, int count) = 0;

    /// Draws count vertices, starting with vertex first; -1 means all vertices from there. The range is cut
    /// at the last vertex, and may be empty. Returns false if nothing can be drawn: the current program did
    /// not compile or there is none, the context is detached, or memory runs out. instances must be 1;
    /// another number logs an error and draws nothing.
    virtual bool Draw(int first, int count, int instances) = 0;

    /// Deletes the object.
    virtual void Release() = 0;

    /// Optional. The box must enclose all pixels that draws of the current vertices cover. Such draws may be
    /// merged with earlier draws of their state, ahead of draws that they do not overlap. SetVertices resets
    /// the box.
    virtual void SetBounds(DrawBounds) {}

protected:
    ~IGraphicsObject() = default;
};

} // namespace Moka
