/// IRasterizerState: the scissor test: pixels outside the rectangle are neither drawn nor cleared.
/// Owner:  the renderer, which has one such object.
/// Thread: render thread.
/// Units:  pixels of the target, origin at its first row and column: the bottom left of a host's frame
///         buffer, the first texel of an off-screen target.
/// Getters return cached values. They query GL only if external GL may have changed the state.
#pragma once

namespace Moka {

/// A rectangle of the scissor test, in pixels.
struct ScissorRect {
    /// The corner with the smallest coordinates, and the size.
    int x = 0;
    int y = 0;
    int width = 0;
    int height = 0;

    /// Compares all values.
    friend bool operator==(ScissorRect const& a, ScissorRect const& b) {
        return a.x == b.x && a.y == b.y && a.width == b.width && a.height == b.height;
    }
};

class IRasterizerState {
public:
    /// The scissor test of later draws and clears.
    virtual bool IsScissorEnabled() = 0;
    virtual void SetScissorEnabled(bool on) = 0;
    virtual ScissorRect GetScissorRect() = 0;
    /// Negative sizes become 0.
    virtual void SetScissorRect(ScissorRect const& rect) = 0;

protected:
    ~IRasterizerState() = default;
};

} // namespace Moka
