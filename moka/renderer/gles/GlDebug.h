// GlDebug: KHR_debug messages, object labels and groups, and GL errors.
// Thread: render thread.
// Fails:  silently. Without KHR_debug there are no messages, labels or groups.
#pragma once

#include "moka/renderer/RendererFactory.h"

#include "moka/renderer/gles/GlFunctions.h"
// gl2ext.h needs the types of the core header.
#include <GLES2/gl2ext.h>

namespace Moka::detail {

struct Counters;

class GlDebug {
public:
    explicit GlDebug(Counters& counters) : mCounters(counters) {}

    // Installs a callback in a debug context, unless the host has set its own. The callback logs and counts
    // messages of error severity.
    void Attach(RendererProcLoader loader);
    void Detach();

    // identifier: GL_TEXTURE and so on. Labels longer than the driver's limit are cut.
    void Label(GLenum identifier, GLuint name, char const* text) const;

    // True if the driver has groups and debug output was enabled when the context was attached.
    bool HasGroups() const { return mPushGroup != nullptr; }

    // Reads the pending GL errors. Returns false if there were any since the last check. Logs each error with
    // the operation and counts it, unless the driver's callback has reported it. glGetError is slow on some
    // drivers, so call this after expensive operations only, never after a draw.
    bool Check(char const* doing);
    // Checks after a single GL call in debug builds; see GlFunctions.h.
    void CheckCall(char const* call);

private:
    friend class GlDebugGroup;

    void LoadGroups(RendererProcLoader loader);
    void InstallCallback(RendererProcLoader loader);
    bool TakeErrors(char const* doing);

    Counters& mCounters;
    PFNGLOBJECTLABELKHRPROC mObjectLabel = nullptr;
    PFNGLPUSHDEBUGGROUPKHRPROC mPushGroup = nullptr;
    PFNGLPOPDEBUGGROUPKHRPROC mPopGroup = nullptr;
    PFNGLDEBUGMESSAGECALLBACKKHRPROC mSetCallback = nullptr; // null if our callback is not installed
    GLint mMaxLabelLength = 0;
    bool mCallFailed = false; // since the last check
};

// Makes GL debuggers show the GL calls of a scope as a group.
class GlDebugGroup {
public:
    // Requires debug.HasGroups().
    GlDebugGroup(GlDebug const& debug, char const* name) : mPop(debug.mPopGroup) {
        debug.mPushGroup(GL_DEBUG_SOURCE_APPLICATION_KHR, 0, -1, name);
    }
    ~GlDebugGroup() { mPop(); }
    GlDebugGroup(GlDebugGroup const&) = delete;
    GlDebugGroup& operator=(GlDebugGroup const&) = delete;

private:
    PFNGLPOPDEBUGGROUPKHRPROC const mPop;
};

} // namespace Moka::detail
