// GlWorkarounds: the driver faults that the renderer works around. The source file has one table of them,
// with driver, cause and cure.
// Owner:  the device, which reads GL_RENDERER once.
// Thread: render thread.
#pragma once

namespace Moka::detail {

enum class GlWorkaround : unsigned {
    BindForDrawingToRead,
    FinishBeforeCopies,
    AvoidMediump,
};

class GlWorkarounds {
public:
    // Selects the workarounds for the driver of the current context. Logs each with debug priority.
    GlWorkarounds();

    bool Needs(GlWorkaround what) const { return (mNeeded & BitOf(what)) != 0; }

private:
    static unsigned BitOf(GlWorkaround what) { return 1u << static_cast<unsigned>(what); }

    unsigned mNeeded = 0;
};

} // namespace Moka::detail
