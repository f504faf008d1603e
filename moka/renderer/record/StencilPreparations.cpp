#include "moka/renderer/record/StencilPreparations.h"

#include "moka/renderer/record/ProgramState.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <utility>

namespace Moka::detail {
namespace {

bool WritesStencil(RunState const& state) {
    return state.depthStencil.IsStencil() && state.depthStencil.GetWriteMask() != 0;
}

// Converts low and high from normalized device coordinates to pixels, and adds one pixel on either side.
void ToPixels(float low, float high, int size, int* first, int* count) {
    float const scale = static_cast<float>(size) * 0.5f;
    auto const clamp = [=](float pixel) {
        return static_cast<int>(std::clamp(pixel, 0.0f, static_cast<float>(size)));
    };
    *first = clamp(std::floor((low + 1) * scale) - 1);
    *count = clamp(std::ceil((high + 1) * scale) + 1) - *first;
}

ScissorRect ToPixels(DrawBounds const& bounds, TargetRef const& target) {
    if (!bounds.IsKnown()) return {0, 0, target.width, target.height};
    ScissorRect rect;
    ToPixels(bounds.left, bounds.right, target.width, &rect.x, &rect.width);
    ToPixels(bounds.bottom, bounds.top, target.height, &rect.y, &rect.height);
    return rect;
}

bool IsInside(ScissorRect const& inner, ScissorRect const& outer) {
    return inner.x >= outer.x && inner.y >= outer.y && inner.x + inner.width <= outer.x + outer.width &&
           inner.y + inner.height <= outer.y + outer.height;
}

ScissorRect Unite(ScissorRect const& a, ScissorRect const& b) {
    ScissorRect all{std::min(a.x, b.x), std::min(a.y, b.y), 0, 0};
    all.width = std::max(a.x + a.width, b.x + b.width) - all.x;
    all.height = std::max(a.y + a.height, b.y + b.height) - all.y;
    return all;
}

} // namespace

void StencilPreparations::Recipe::Clear() {
    steps.clear();
    values.clear();
    vertices.clear();
}

bool StencilPreparations::Step::IsSame(Step const& other) const {
    if (isClear || other.isClear) return isClear == other.isClear && clearValue == other.clearValue;
    return state == other.state && count == other.count && stride == other.stride;
}

bool StencilPreparations::Recipe::IsSame(Recipe const& other) const {
    auto const areSame = [](Step const& a, Step const& b) { return a.IsSame(b); };
    return target.width == other.target.width && target.height == other.target.height &&
           std::equal(steps.begin(), steps.end(), other.steps.begin(), other.steps.end(), areSame) &&
           values == other.values && vertices == other.vertices;
}

bool StencilPreparations::TakeClear(DepthStencilClear const& clear) {
    DeviceName const buffer = clear.target.depthStencil;
    if (clear.clearDepth || !clear.clearStencil || clear.scissor.on) {
        Complete(clear.target);
        Forget(buffer);
        return false;
    }
    // A preparation of the same buffer that no draw has used is dropped.
    if (!IsPendingFor(buffer)) Finish();
    mPending.Clear();
    mPending.target = clear.target;
    mPending.steps.push_back({true, clear.stencil, {}, 0, 0, 0, 0, 0});
    mIsPending = true;
    return true;
}

bool StencilPreparations::TakeDraw(RunState const& state, ProgramState const& program, float const* vertices,
                                   int count, int stride) {
    bool const belongs = IsPendingFor(state.target.depthStencil) && WritesStencil(state) &&
                         !state.blend.IsColorWrite() && !state.scissor.on && !state.depthStencil.IsDepth() &&
                         program.GetSamplerCount() == 0;
    if (!belongs) return false;
    std::vector<unsigned char> const& values = program.GetValues();
    Step step{false, 0,     state, mPending.values.size(), values.size(), mPending.vertices.size(),
              count, stride};
    step.state.target = {};
    mPending.values.insert(mPending.values.end(), values.begin(), values.end());
    mPending.vertices.insert(mPending.vertices.end(), vertices,
                             vertices + static_cast<std::ptrdiff_t>(count) * stride);
    mPending.steps.push_back(step);
    return true;
}

void StencilPreparations::BeforeDraw(RunState const& state, DrawBounds const& bounds) {
    if (state.target.depthStencil == 0) return;
    DeviceName const buffer = state.target.depthStencil;
    if (WritesStencil(state)) {
        Complete(state.target);
        Forget(buffer);
        return;
    }
    Content* content = Find(buffer);
    if (IsPendingFor(buffer)) {
        mIsPending = false;
        if (!content || !content->recipe.IsSame(mPending)) {
            content = &Replace(buffer);
            std::swap(content->recipe, mPending);
        }
    }
    if (content) Ensure(*content, state.target, ToPixels(bounds, state.target));
}

void StencilPreparations::Finish() {
    if (!mIsPending) return;
    mIsPending = false;
    TargetRef const target = mPending.target;
    Content& content = Replace(target.depthStencil);
    std::swap(content.recipe, mPending);
    Ensure(content, target, ToPixels({}, target));
}

void StencilPreparations::Complete(TargetRef const& target) {
    Finish();
    if (Content* const content = Find(target.depthStencil)) Ensure(*content, target, ToPixels({}, target));
}

bool StencilPreparations::Recipe::Uses(DeviceName program) const {
    return std::any_of(steps.begin(), steps.end(),
                       [=](Step const& step) { return !step.isClear && step.state.program == program; });
}

bool StencilPreparations::Uses(DeviceName program) const {
    return (mIsPending && mPending.Uses(program)) ||
           std::any_of(mContents.begin(), mContents.end(),
                       [=](Content const& content) { return content.recipe.Uses(program); });
}

StencilPreparations::Content* StencilPreparations::Find(DeviceName buffer) {
    auto const found = std::find_if(mContents.begin(), mContents.end(),
                                    [=](Content const& content) { return content.buffer == buffer; });
    return found == mContents.end() ? nullptr : &*found;
}

// Returns the entry of the buffer, with unknown content.
StencilPreparations::Content& StencilPreparations::Replace(DeviceName buffer) {
    Content* content = Find(buffer);
    if (!content && mContents.size() == kMostContents) {
        std::rotate(mContents.begin(), mContents.begin() + 1, mContents.end());
        content = &mContents.back();
    } else if (!content) {
        mContents.emplace_back();
        content = &mContents.back();
    }
    content->buffer = buffer;
    content->list = 0;
    content->part = {};
    return *content;
}

// Extends a preparation in the current list to cover part, or records one again that was flushed.
void StencilPreparations::Ensure(Content& content, TargetRef const& target, ScissorRect const& part) {
    if (content.list != 0 && IsInside(part, content.part)) return;
    if (content.list != mList.GetNumber()) {
        Record(content, target, part);
        return;
    }
    content.part = Unite(content.part, part);
    for (std::size_t const command : content.commands) mList.SetScissor(command, {true, content.part});
}

void StencilPreparations::Record(Content& content, TargetRef const& target, ScissorRect const& part) {
    ScissorState const scissor{true, part};
    content.list = 0;
    content.commands.clear();
    for (Step const& step : content.recipe.steps) {
        if (step.isClear) {
            mList.Add(DepthStencilClear{target, scissor, false, true, 1.0f, step.clearValue});
        } else {
            RunState state = step.state;
            state.target = target;
            state.scissor = scissor;
            mList.AddSeparateDraw({state, &content.recipe.values[step.values], step.valueBytes,
                                   &content.recipe.vertices[step.vertices], step.count, step.stride});
        }
        content.commands.push_back(mList.GetList().commands.size() - 1);
    }
    content.part = part;
    content.list = mList.GetNumber();
}

void StencilPreparations::Forget(DeviceName depthStencil) {
    if (IsPendingFor(depthStencil)) mIsPending = false;
    if (Content* const content = Find(depthStencil))
        mContents.erase(mContents.begin() + (content - mContents.data()));
}

void StencilPreparations::ForgetUses(DeviceName program) {
    if (mPending.Uses(program)) mIsPending = false;
    mContents.erase(std::remove_if(mContents.begin(), mContents.end(),
                                   [=](Content const& content) { return content.recipe.Uses(program); }),
                    mContents.end());
}

void StencilPreparations::ForgetAll() {
    mIsPending = false;
    mContents.clear();
}

} // namespace Moka::detail
