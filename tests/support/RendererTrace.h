// RendererTrace: what a test knows of the renderer, and plans for it. The renderer is the real one over a device
// without a driver (TracingDevice.h); the trace observes it: it writes down each request in the order of arrival,
// counts what is alive, fails creations where a test asks it to, and notices misuse that a driver would answer with
// a leak, a black picture or a crash much later.
// Owner:   one per process, never destroyed.
// Thread:  any; but pipeline state, texels, textures' parameters, the active target and the current program are
//          for the thread that attached the context.
// Misuse:  a request on another thread than the declared one, or after the object's release as far as its address
//          tells; a depth-stencil buffer released while attached. The request goes on: the test fails by looking
//          at GetViolations(). A texture deleted off the render thread counts too, which the interface allows.
#pragma once

#include "moka/renderer/device/RunState.h"
#include "moka/renderer/record/Observer.h"
#include <array>
#include <map>
#include <string>
#include <variant>
#include <vector>

namespace Moka {
class ITextureObject;
} // namespace Moka

namespace Moka::Testing {

using detail::ObjectKind;

// TracedDraw, TracedClear: what would have changed a picture, in order, each with the state in force.
// Values, independent of the objects they tell of: those may be gone when a test looks.

// The fixed-function state that was requested.
struct PipelineState {
    BlendStateDescriptor blend = detail::RunState::WithoutBlending();
    DepthStencilStateDescriptor depthStencil{false, false}; // the tests in force, not what was last applied
    bool scissorOn = false;
    ScissorRect scissor;
    bool stencilClip = false;
};

struct TracedUniform {
    std::string text;           // as in the calls
    std::vector<float> numbers; // a bool, an int and a texture unit are one; matrices are column-major
};

struct TracedDraw {
    PipelineState state;
    std::string target;          // "target 1"; "none" when nothing is active
    std::vector<float> vertices; // those drawn, first and count applied; empty when nothing was
    int first = 0;               // of the vertices handed over
    int count = 0;               // that were there and were drawn

    std::string shader;                            // the name its creator gave it
    std::map<std::string, TracedUniform> uniforms; // those ever set, by name
};

struct TracedClear {
    PipelineState state;
    std::string target; // what is cleared, whichever target is active
    std::array<float, 4> color{};
};

using TracedEvent = std::variant<TracedDraw, TracedClear>;

class RendererTrace {
public:
    // Back to the beginning: no context, no calls, no violations, no planned failures, the usual capabilities,
    // numbers from 1. Objects still alive are inert and may be released later. On the thread that attached the
    // context, if there is one.
    static void Reset();

    // The requests so far, which are then forgotten: "texture 1 SetParameter 4 1". Objects are named by kind and number
    // in order of creation: "texture 1", "target 1", "buffer 1", "program 1", "graphics 1", "blend 1", "depthstencil 1";
    // static functions belong to "renderer", those of the scissor to "rasterizer". Operations are named as in the
    // interfaces; the deletion of a texture is its "Release", a creation is the new object's "Create"; what is done to a
    // handle on a parameter is an operation of its program: "program 1 SetParameter uFactor 0.5", "program 1
    // ReleaseParameter uFactor".
    static std::vector<std::string> TakeCalls();

    // The draws and the clears, as values, in order. A draw without a current program is none, one of no vertices is
    // one.
    static std::vector<TracedDraw> GetDraws();
    static std::vector<TracedClear> GetClears();
    // Both in their common order, which are then forgotten.
    static std::vector<TracedEvent> TakeEvents();
    // What a draw would find now.
    static PipelineState GetState();

    // Off, for long runs: calls, events and values of parameters are forgotten and kept no more, and a released
    // object is forgotten at once. On again after Reset().
    static void KeepRecords(bool keep);

    static std::vector<std::string> GetViolations();

    // What the device offers, 4096 texels and "tracing renderer" unless set. Takes effect at once, in place of
    // the limit of a context that is attached.
    static void SetMaxTextureSize(int texels);
    static void SetGpuName(char const* name);

    // Makes the n-th creation from now fail (1 is the next one), or every one of a kind until
    // StopFailing(). Programs are made in every case and are not counted.
    static void FailCreation(int n);
    static void FailCreations(ObjectKind kind);
    static void StopFailing();

    // The render thread is the one that attached the context. A test whose queue is pumped on that thread
    // declares it while tasks run and none in between, so that a call that should have been a task is noticed.
    static void DeclareRenderThread(); // the calling thread
    static void DeclareNoRenderThread();

    // The image, rows packed, in texture order.
    static std::vector<unsigned char> GetTexels(ITextureObject const* texture);
    // The value last set, or the initial one; -1 for an id that names no parameter.
    static int GetParameter(ITextureObject const* texture, int id);

    // Names as in the calls, "none" for nothing.
    static std::string GetActiveTarget();

    // Objects not yet released, and handles on parameters not yet deleted, of whatever context.
    static int CountLiveObjects();
};

} // namespace Moka::Testing
