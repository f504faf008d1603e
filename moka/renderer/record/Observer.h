// RecorderObserver: sees every request to the renderer in the order of arrival, and may refuse creations. For
// tests of the order of calls and of failing creations; null in every other program.
// Owner:  the test, which sets theObserver while no thread uses the renderer.
// Thread: called on the thread that makes the request, before the request takes effect; a creation is reported
//         after it, with the new object.
#pragma once

#include "moka/renderer/IGraphicsObject.h"
#include "moka/renderer/IParameterBinding.h"

#include <array>
#include <initializer_list>
#include <type_traits>

namespace Moka::detail {

class RequestedState;
struct TargetRef;

enum class ObjectKind {
    kTexture,
    kRenderTarget,
    kDepthStencilBuffer,
    kProgram,
    kGraphicsObject,
    kBlendState,
    kDepthStencilState,
    kRasterizer,
    kRenderer, // the static functions of RendererFactory
};

// One argument of a request.
struct RequestValue {
    enum class Kind { Integer, Number, Text, Object };

    template <class T, std::enable_if_t<std::is_integral_v<T> || std::is_enum_v<T>, int> = 0>
    RequestValue(T value) : kind(Kind::Integer), integer(static_cast<long long>(value)) {}
    RequestValue(float value) : kind(Kind::Number), number(value) {}
    RequestValue(char const* value) : kind(Kind::Text), text(value) {}
    // Of our interfaces; null is no object.
    RequestValue(void const* value) : kind(Kind::Object), object(value) {}

    Kind kind;
    long long integer = 0;
    float number = 0;
    char const* text = nullptr;
    void const* object = nullptr;
};

struct RendererRequest {
    ObjectKind kind;
    void const* object; // the interface pointer that the caller has; null for static functions
    char const* operation;
    std::initializer_list<RequestValue> values;
};

struct DrawRequest {
    RequestedState& state;
    void const* graphics;
    PrimitiveType primitive;
    float const* vertices; // those that are drawn
    int floatsPerVertex;
    int first; // of the vertices that were handed over
    int count;
};

// Of a target, whichever is active.
struct ClearRequest {
    RequestedState& state;
    void const* target;
    bool clearsColor;
    std::array<float, 4> color;
    bool clearsDepth;
    float depth;
    bool clearsStencil;
    int stencil;
};

class RecorderObserver {
public:
    virtual ~RecorderObserver() = default;

    // False makes the creation fail as if memory had run out.
    virtual bool MayCreate(ObjectKind kind) = 0;
    virtual void OnRequest(RendererRequest const& request) = 0;
    // A handle of program sets a value of the type.
    virtual void OnValue(void const* program, char const* name, BindingType type, void const* value) = 0;
    // The vertices are count times floatsPerVertex floats, null when there are none.
    virtual void OnVertices(void const* graphics, int stream, void const* data, int count) = 0;
    // Behind the request of the draw or the clear.
    virtual void OnDraw(DrawRequest const& draw) = 0;
    virtual void OnClear(ClearRequest const& clear) = 0;
};

extern RecorderObserver* theObserver;

// Requests that every draw makes test theObserver themselves, which saves the call.
template <class... Values>
void Observe(ObjectKind kind, void const* object, char const* operation, Values const&... values) {
    if (theObserver) theObserver->OnRequest({kind, object, operation, {RequestValue(values)...}});
}

} // namespace Moka::detail
