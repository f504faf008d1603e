// RecordingRenderer: the test's side of the renderer that draws nothing. Linked instead of the real one, it
// keeps every image in memory, writes down each call, counts what is alive, fails where a test asks it to,
// and notices misuse that a real driver would answer with a leak, a black picture or a crash much later.
// Owner:   one per process, never destroyed. An object's memory is kept after its release until Reset(): so a
//          second release, or a use after it, is caught instead of being undefined (see KeepRecords).
// Thread:  everything here from any thread. The objects it makes belong to the declared render thread.
// Images:  RGBA8. A texture keeps its rows in upload order; the host's frame buffer is in GL order, bottom
//          row first. Uploads, copies and clears change them; a clear obeys the scissor but no stencil.
//          Draws do not: look at GetDraws().
// Misuse:  an operation on another thread than the render thread, after release, or a second release; a
//          depth-stencil buffer released while attached. A released object does nothing more, any other goes
//          on: the test fails by looking at GetViolations(), not by crashing. Stricter than the interface in
//          one point: deleting a texture off the render thread, which real renderers tolerate, counts too.
#pragma once

#include "tests/support/RecordingDraws.h"

#include <string>
#include <vector>

namespace Moka {
class IDepthStencilBuffer;
class IRenderTarget;
class IShaderProgram;
class ITextureObject;
} // namespace Moka

namespace Moka::Testing {

enum class ObjectKind {
    Texture,
    RenderTarget,
    DepthStencilBuffer,
    Program,
    GraphicsObject,
    BlendState,
    DepthStencilState,
};

// One call. Objects are named by kind and number in order of creation: "texture 1", "target 1", "buffer 1",
// "program 1", "graphics 1", "blend 1", "depthstencil 1"; static functions belong to "renderer", those of the
// scissor to "rasterizer". Operations are named as in the interfaces; the deletion of a texture is its
// "Release", a creation is the new object's "Create"; what is done to a handle on a parameter is an operation
// of its program: "program 1 SetParameter uFactor 0.5", "program 1 ReleaseParameter uFactor".
struct RecordedCall {
    std::string object;
    std::string operation;
    std::string arguments; // separated by spaces
};

// "texture 1 SetParameter 4 1"
std::string ToString(RecordedCall const& call);

class RecordingRenderer {
public:
    // Back to the beginning: no context, no calls, no violations, no planned failures, the usual limits,
    // numbers from 1. Objects still alive become inert and may be released later.
    static void Reset();

    static std::vector<RecordedCall> GetCalls();
    // The calls as lines, which are then forgotten.
    static std::vector<std::string> TakeCalls();
    static int CountCalls(std::string const& operation);

    // The draws and the clears, as values, in order; GetEvents() has both in their common order. A draw
    // without a current program is none, one of no vertices is one.
    static std::vector<RecordedDraw> GetDraws();
    static std::vector<RecordedClear> GetClears();
    static std::vector<RecordedEvent> GetEvents();
    // The events, which are then forgotten.
    static std::vector<RecordedEvent> TakeEvents();
    // What a draw would find now.
    static PipelineState GetState();

    // Off, for long runs: calls and events are forgotten and kept no more, and a released object is freed at
    // once, so that memory grows with the live objects only. A use after release is then undefined; other
    // violations, statistics and live objects are known all the same. On again after Reset().
    static void KeepRecords(bool keep);

    static std::vector<std::string> GetViolations();

    // What the device offers, 4096 texels unless set; takes effect at once. The limit of an attached context
    // still lowers it.
    static void SetMaxTextureSize(int texels);

    // What the device is called, "recording renderer" unless set.
    static void SetGpuName(std::string const& name);

    // Makes the n-th creation from now fail (1 is the next one), or every one of a kind until
    // StopFailing(). Programs are made in every case and are not counted.
    static void FailCreation(int n);
    static void FailCreations(ObjectKind kind);
    static void StopFailing();

    // The render thread is the one that attached the context. A test whose queue is pumped on its own thread
    // declares that thread while tasks run and none in between, so that a call that should have been a task
    // is still noticed.
    static void DeclareRenderThread(); // the calling thread
    static void DeclareNoRenderThread();

    // The name in the calls; "none" for null. Still valid after the object's release.
    static std::string NameOf(ITextureObject const* texture);
    static std::string NameOf(IRenderTarget const* target);
    static std::string NameOf(IDepthStencilBuffer const* buffer);
    static std::string NameOf(IShaderProgram const* program);

    // The image, rows packed, in texture order. Not recorded, allowed on any thread and after release.
    static std::vector<unsigned char> GetTexels(ITextureObject const* texture);

    // The value last set, or the initial one; -1 for an id that names no parameter.
    static int GetParameter(ITextureObject const* texture, int id);

    // The targets' and textures' state as the renderer sees it now; names as in the calls, "none" for
    // nothing.
    static std::string GetActiveTarget();
    static std::string GetCurrentProgram();
    static std::string GetBoundTexture(int unit);

    // What a uniform was set to last: its numbers, separated by spaces; empty before.
    static std::string GetParameter(IShaderProgram const* program, std::string const& name);

    // Objects not yet released, and handles on parameters not yet deleted, of whatever context.
    static int CountLiveObjects();
};

} // namespace Moka::Testing
