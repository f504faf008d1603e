#include "moka/renderer/gles/GlRasterizer.h"

#include "moka/renderer/gles/GlContext.h"
#include "moka/renderer/gles/GlTables.h"

namespace Moka::detail {
namespace {

// function(context) within an operation; a default value without a context.
template <class Function>
auto WithContext(Function function) {
    using Result = decltype(function(*GlContext::GetAttached()));
    GlContext* const context = GlContext::GetAttached();
    if (!context) return Result();
    GlOperation const operation(*context);
    return operation ? function(*context) : Result();
}

} // namespace

bool GlRasterizer::IsScissorEnabled() {
    return WithContext([](GlContext& context) { return context.current.IsScissorEnabled(); });
}

void GlRasterizer::SetScissorEnabled(bool on) {
    WithContext([on](GlContext& context) {
        context.current.SetScissorEnabled(on);
        if (context.IsThrough()) context.state.SetScissorTest(on);
    });
}

ScissorRect GlRasterizer::GetScissorRect() {
    return WithContext([](GlContext& context) { return ScissorRect(context.current.GetScissorRect()); });
}

void GlRasterizer::SetScissorRect(ScissorRect const& rect) {
    WithContext([&rect](GlContext& context) {
        context.current.SetScissorRect(rect);
        if (context.IsThrough()) context.state.SetScissorRect(ToGlBox(context.current.GetScissorRect()));
    });
}

} // namespace Moka::detail
