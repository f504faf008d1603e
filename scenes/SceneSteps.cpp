#include "scenes/SceneSteps.h"

#include "scenes/SceneError.h"

#include <algorithm>
#include <memory>
#include <optional>

namespace Moka::Scenes {
namespace {

using Kind = SceneValue::Kind;

constexpr int kMaxRepeat = 100'000;

void CheckCount(long long count, SceneValue const& value) {
    if (count > kMaxOperations)
        throw SceneValueError(value, ": a scene may have " + std::to_string(kMaxOperations) +
                                         " operations, repetitions and batches counted one by one");
}

// Translates, rotates and scales the following operations. As with the canvas's Pre functions, points are
// scaled first.
struct Placement {
    Placement() = default;
    explicit Placement(SceneFields& fields) {
        if (SceneValue const* const value = fields.Find("translate")) translate = ReadPoint(*value);
        if (SceneValue const* const value = fields.Find("rotate")) rotate = ReadFloat(*value);
        if (SceneValue const* const value = fields.Find("scale")) scale = ReadPoint(*value);
    }

    void Apply(IMKCanvas& canvas) const {
        if (translate) canvas.PreTranslate(translate->x, translate->y);
        if (rotate) canvas.PreRotate(*rotate);
        if (scale) canvas.PreScale(scale->x, scale->y);
    }

    std::optional<PointF> translate;
    std::optional<float> rotate;
    std::optional<PointF> scale;
};

struct Group {
    Placement placement;
    std::optional<Matrix3f> matrix;
    std::optional<Rect> clip;
    int repeat = 1;
    Placement advance; // from one repetition to the next
    SceneSteps content;

    void Play(IMKCanvas& canvas, SceneBitmaps const& bitmaps) const {
        int const level = canvas.Save(IMKCanvasBase::SaveAll);
        placement.Apply(canvas);
        if (matrix) canvas.PreConcat(*matrix);
        if (clip)
            canvas.SetClipRect(clip->left, clip->top, clip->GetWidth(), clip->GetHeight(),
                               IMKCanvasBase::Intersect);
        for (int i = 0; i < repeat; ++i) PlayOnce(i, canvas, bitmaps);
        canvas.Restore(level);
    }

private:
    void PlayOnce(int index, IMKCanvas& canvas, SceneBitmaps const& bitmaps) const {
        if (index > 0) advance.Apply(canvas);
        if (repeat == 1) return content.Play(canvas, bitmaps);
        int const level = canvas.Save(IMKCanvasBase::SaveAll);
        content.Play(canvas, bitmaps);
        canvas.Restore(level);
    }
};

Rect ReadClip(SceneValue const& value) {
    std::vector<float> const n = ReadFloats(value, 4, "[x, y, width, height]");
    auto const at = [&](std::size_t i) { return ReadInt(value.items[i], -1'000'000, 1'000'000); };
    return {at(0), at(1), at(0) + at(2), at(1) + at(3)};
}

void ReadRepeat(SceneValue const& value, Group& group) {
    SceneFields fields(value);
    group.repeat = ReadInt(fields.Get("count"), 1, kMaxRepeat);
    group.advance = Placement(fields);
    fields.CheckAll();
}

SceneOperation ReadGroup(SceneFields& fields, SceneNames const& names) {
    auto const group = std::make_shared<Group>();
    group->placement = Placement(fields);
    if (SceneValue const* const value = fields.Find("matrix")) group->matrix = ReadMatrix(*value);
    if (SceneValue const* const value = fields.Find("clip")) group->clip = ReadClip(*value);
    if (SceneValue const* const value = fields.Find("repeat")) ReadRepeat(*value, *group);
    group->content = ReadSteps(fields.Get("operations"), names);
    return {[group](IMKCanvas& canvas, SceneBitmaps const& bitmaps) { group->Play(canvas, bitmaps); },
            // An empty group counts as well, because repeating it takes time.
            std::max(1LL, group->content.count) * group->repeat, group->content.needsGpu};
}

SceneOperationReader FindReader(std::string const& name) {
    if (name == "Group") return ReadGroup;
    for (SceneOperationTable const* const table :
         {&GetDrawingOperations(), &GetDrawableOperations(), &GetStateOperations()}) {
        auto const found = table->find(name);
        if (found != table->end()) return found->second;
    }
    return nullptr;
}

std::string ListOperations() {
    std::string names = "Group";
    for (SceneOperationTable const* const table :
         {&GetDrawingOperations(), &GetDrawableOperations(), &GetStateOperations()})
        for (auto const& entry : *table) names += ", " + entry.first;
    return names;
}

SceneOperation ReadOperation(SceneValue const& value, SceneNames const& names) {
    if (value.kind != Kind::Object || value.keys.size() != 1)
        ThrowExpected(value, "an object with one name, as {\"DrawCircle\": { ... }}");
    std::string const& name = value.keys.front();
    SceneOperationReader const reader = FindReader(name);
    if (!reader)
        throw SceneValueError(value.items.front(), " is no operation; there are " + ListOperations());
    SceneFields fields(value.items.front());
    SceneOperation operation = reader(fields, names);
    fields.CheckAll();
    return operation;
}

} // namespace

SceneSteps ReadSteps(SceneValue const& value, SceneNames const& names) {
    if (value.kind != Kind::List) ThrowExpected(value, "a list of operations");
    SceneSteps result;
    for (SceneValue const& item : value.items) {
        SceneOperation operation = ReadOperation(item, names);
        result.count += std::max(1LL, operation.count);
        CheckCount(result.count, item);
        result.needsGpu = result.needsGpu || operation.needsGpu;
        result.steps.push_back(std::move(operation.step));
    }
    return result;
}

} // namespace Moka::Scenes
