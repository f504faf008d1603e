// GlDebug: KHR_debug messages, object labels and groups, and GL errors.
// Thread: render thread.
// Fails:  silently; a driver without KHR_debug has no messages, labels and groups.
#pragma once

#include "moka/renderer/RendererFactory.h"

#include "moka/renderer/gles/GlFunctions.h"
// The prototypes of extensions come after the core header.
#include <GLES2/gl2ext.h>

namespace Moka::detail {

struct Counters;

class GlDebug {
public:
    explicit GlDebug(Counters& counters) : mCounters(counters) {}

    // In a debug context whose owner has not set a callback, messages of error severity go to the log and
    // into the statistics.
    void Attach(RendererProcLoader loader);
    void Detach();

    // identifier: GL_TEXTURE and so on. Longer labels than the driver takes are cut.
    void Label(GLenum identifier, GLuint name, char const* text) const;

    // True if the driver has groups and debug output was enabled when the context was attached.
    bool HasGroups() const { return mPushGroup != nullptr; }

    // Takes the pending GL errors; false when there were any since the last check. They are logged with the
    // operation, and counted, unless the driver's own message has been already. For places where the call
    // costs nothing beside the work, never for a draw.
    bool Check(char const* doing);
    // The same after one call, in debug builds; see GlFunctions.h.
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
    PFNGLDEBUGMESSAGECALLBACKKHRPROC mSetCallback = nullptr; // null: none of ours is installed
    GLint mMaxLabelLength = 0;
    bool mCallFailed = false; // since the last check
};

// A scope whose GL calls a debugger shows as a group.
class GlDebugGroup {
public:
    // debug has groups.
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
