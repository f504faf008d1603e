// IGraphicsObject: vertices of one layout, and the drawing of them.
// Owner:  whoever created it, until Release().
// Thread: render thread.
// What a draw is made of (target, scissor, blend and depth-stencil state, program and its parameters,
// textures, vertices) is taken down when it is asked for; changing any of it afterwards does not reach it.
#pragma once

#include "moka/renderer/DrawBounds.h"

namespace Moka {

enum class PrimitiveType { TriangleList, TriangleStrip };

class IGraphicsObject {
public:
    // Copies count vertices for stream 0, replacing all of the earlier ones, also with none. data may be null
    // when count is 0. Another stream, a negative count and null data are refused with a log line and leave
    // no vertices behind.
    virtual void SetVertices(int stream, void const* data, int count) = 0;

    // Draws count vertices from the first one on, all that are left with -1; what is not there is not drawn.
    // Drawing nothing is legal. False when nothing can be drawn: no program that compiled is current, the
    // context is gone, or instances is not 1 (one log line).
    virtual bool Draw(int first, int count, int instances) = 0;

    virtual void Release() = 0;

    // Encloses all that draws of the present vertices cover, whatever their program does. Lets them join earlier
    // draws that they do not touch. Handing vertices over forgets it.
    virtual void SetBounds(DrawBounds const&) {}

protected:
    ~IGraphicsObject() = default;
};

} // namespace Moka
