/// IGraphicsObject: vertices of one layout, and the drawing of them.
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
    /// Copies count vertices for stream 0, replacing all of the earlier ones, also with none. data may be
    /// null when count is 0. Another stream, a negative count and null data are refused with a log line and
    /// leave no vertices behind.
    virtual void SetVertices(int stream, void const* data, int count) = 0;

    /// Draws count vertices from the first one on, all that are left with -1. A range beyond the last vertex
    /// is cut. Drawing nothing is legal. False when nothing can be drawn: no program that compiled is
    /// current, the context is gone, or instances is not 1 (one log line).
    virtual bool Draw(int first, int count, int instances) = 0;

    /// Deletes the object.
    virtual void Release() = 0;

    /// The box must enclose all pixels that draws of the present vertices cover. Such draws may join earlier
    /// draws of their state, ahead of others that they do not touch. SetVertices forgets the box.
    virtual void SetBounds(DrawBounds const&) {}

protected:
    ~IGraphicsObject() = default;
};

} // namespace Moka
