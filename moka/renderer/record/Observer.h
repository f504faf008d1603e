// RecorderObserver: sees every request to the renderer in the order of arrival and can make creations fail.
// Tests use it to check the order of calls and the handling of failures. Other programs leave theObserver
// null.
// Owner:  the test, which sets theObserver while no thread uses the renderer.
// Thread: called on the thread that makes the request, before the request takes effect; a creation is
//         reported after it, with the new object.
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
    // A pointer to one of the renderer's interfaces, or null.
    RequestValue(void const* value) : kind(Kind::Object), object(value) {}

    Kind kind;
    long long integer = 0;
    float number = 0;
    char const* text = nullptr;
    void const* object = nullptr;
};

struct RendererRequest {
    ObjectKind kind;
    void const* object; // the caller's interface pointer; null for static functions
    char const* operation;
    std::initializer_list<RequestValue> values;
};

struct DrawRequest {
    RequestedState& state;
    void const* graphics;
    PrimitiveType primitive;
    float const* vertices; // the first drawn vertex
    int floatsPerVertex;
    int first; // its index among the vertices of SetVertices
    int count;
};

// A clear of `target`, which need not be active.
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
    // A parameter binding of the program was set.
    virtual void OnValue(void const* program, char const* name, BindingType type, void const* value) = 0;
    // data points to count times floatsPerVertex floats, or is null.
    virtual void OnVertices(void const* graphics, int stream, void const* data, int count) = 0;
    // Called after OnRequest for the same draw or clear.
    virtual void OnDraw(DrawRequest const& draw) = 0;
    virtual void OnClear(ClearRequest const& clear) = 0;
};

extern RecorderObserver* theObserver;

// Functions that every draw calls test theObserver themselves, to save this call.
template <class... Values>
[[gnu::cold, gnu::noinline]] void Observe(ObjectKind kind, void const* object, char const* operation,
                                          Values const&... values) {
    if (theObserver) theObserver->OnRequest({kind, object, operation, {RequestValue(values)...}});
}

} // namespace Moka::detail
