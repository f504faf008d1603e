// GlWorkarounds: faults of drivers and how the renderer avoids them: one table of rows, in the source
// file, with driver, cause and cure.
// Owner:  the context, which reads GL_RENDERER once.
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
    // Those that the driver of the current context needs; logs a line of debug priority for each.
    GlWorkarounds();

    bool Needs(GlWorkaround what) const { return (mNeeded & BitOf(what)) != 0; }

private:
    static unsigned BitOf(GlWorkaround what) { return 1u << static_cast<unsigned>(what); }

    unsigned mNeeded = 0;
};

} // namespace Moka::detail
