#include "moka/renderer/gles/GlWorkarounds.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/gles/GlFunctions.h"

#include <cstring>

namespace Moka::detail {
namespace {

struct Row {
    char const* renderer; // how the driver's GL_RENDERER begins
    GlWorkaround what;
    char const* cause;
    char const* cure;
};

// llvmpipe copies texels with the CPU once no queued scene writes them. It looks at one scene only, the oldest
// that names the texture: where that one samples it, a later one that draws into it is overlooked, and the
// copy has the old texels. Seen with Mesa 22.3 in every repetition, as soon as it has threads of its own
// (LP_NUM_THREADS above 0). A read-back looks at the bound draw frame buffer as well; a copy has another one
// bound. Flushing, binding the texture anew or attaching it anew does not help.
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
