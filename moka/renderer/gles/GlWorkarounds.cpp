#include "moka/renderer/gles/GlWorkarounds.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/gles/GlFunctions.h"

#include <cstring>

namespace Moka::detail {
namespace {

struct Row {
    char const* renderer; // the beginning of the driver's GL_RENDERER
    GlWorkaround what;
    char const* cause;
    char const* cure;
};

// llvmpipe copies texels on the CPU when no queued scene writes them. It checks only the oldest scene that
// uses the texture. If that scene samples the texture, a later one that draws into it is missed, and the copy
// contains the old texels. Seen with Mesa 22.3 in every repetition if LP_NUM_THREADS is above 0. A read-back
// also checks the bound draw frame buffer; during a copy another one is bound. Flushing, or binding or
// attaching the texture again, does not help.
constexpr Row kTable[] = {
    {"llvmpipe", GlWorkaround::BindForDrawingToRead,
     "glReadPixels misses draws into a texture that older draws still sample",
     "the frame buffer is bound for drawing too"},
    {"llvmpipe", GlWorkaround::FinishBeforeCopies,
     "blits and texture copies miss draws into a texture that older draws still sample",
     "glFinish goes before the copy"},
    // Measured with lines of 64 px: 28 us of mediump, 13 of highp.
    {"llvmpipe", GlWorkaround::AvoidMediump,
     "mediump values are converted around each operation, which is slow", "programs are built with highp"},
};

} // namespace

GlWorkarounds::GlWorkarounds() {
    auto const* const renderer = reinterpret_cast<char const*>(Gl::GetString(GL_RENDERER));
    if (!renderer) return;
    for (Row const& row : kTable) {
        if (std::strncmp(renderer, row.renderer, std::strlen(row.renderer)) != 0) continue;
        mNeeded |= BitOf(row.what);
        __android_log_print(ANDROID_LOG_DEBUG, "mok_log", "workaround for %s: %s; %s", row.renderer,
                            row.cause, row.cure);
    }
}

} // namespace Moka::detail
