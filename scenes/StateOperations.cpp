#include "scenes/SceneSteps.h"

namespace Moka::Scenes {
namespace {

// The names of each enumeration, in the order of its numbers.
std::vector<std::string> const kClipOps{"Intersect", "Replace",    "Union",
                                        "Xor",       "Difference", "ReverseDifference"};
std::vector<std::string> const kSaveFlags{"SaveAll", "SaveMatrix", "SaveClip"};

int GetEnum(SceneFields& fields, char const* key, std::vector<std::string> const& names, int otherwise) {
    SceneValue const* const value = fields.Find(key);
    return value ? ReadEnum(*value, names) : otherwise;
}

SceneOperation ReadClear(SceneFields& fields, SceneNames const&) {
    return {[c = ReadColor(fields.Get("color"))](IMKCanvas& canvas, SceneBitmaps const&) {
        canvas.Clear(c.x, c.y, c.z, c.w);
    }};
}

SceneOperation ReadClearAll(SceneFields& fields, SceneNames const&) {
    return {[c = ReadColor(fields.Get("color"))](IMKCanvas& canvas, SceneBitmaps const&) {
        canvas.ClearAll(c.x, c.y, c.z, c.w);
    }};
}

SceneOperation ReadSave(SceneFields& fields, SceneNames const&) {
    int const flag = GetEnum(fields, "flag", kSaveFlags, IMKCanvasBase::SaveAll);
    return {[flag](IMKCanvas& canvas, SceneBitmaps const&) {
        canvas.Save(static_cast<IMKCanvasBase::SaveFlag>(flag));
    }};
}

SceneOperation ReadRestore(SceneFields& fields, SceneNames const&) {
    SceneValue const* const value = fields.Find("level");
    int const level = value ? ReadInt(*value) : -1;
    return {[level](IMKCanvas& canvas, SceneBitmaps const&) { canvas.Restore(level); }};
}

SceneOperation ReadSetClipRect(SceneFields& fields, SceneNames const&) {
    int const op = GetEnum(fields, "op", kClipOps, IMKCanvasBase::Intersect);
    return {[x = fields.GetInt("x"), y = fields.GetInt("y"), width = fields.GetInt("width"),
             height = fields.GetInt("height"), op](IMKCanvas& canvas, SceneBitmaps const&) {
        canvas.SetClipRect(x, y, width, height, static_cast<IMKCanvasBase::ClipOp>(op));
    }};
}

using MatrixOperation = void (IMKCanvasBase::*)(Matrix3f const&);
using PairOperation = void (IMKCanvasBase::*)(float, float);
using TurnOperation = void (IMKCanvasBase::*)(float);
using PivotOperation = void (IMKCanvasBase::*)(float, float, float);

template <MatrixOperation operation>
SceneOperation ReadMatrixOperation(SceneFields& fields, SceneNames const&) {
    return {[matrix = ReadMatrix(fields.Get("matrix"))](IMKCanvas& canvas, SceneBitmaps const&) {
        (canvas.*operation)(matrix);
    }};
}

template <PairOperation operation>
SceneOperation ReadScale(SceneFields& fields, SceneNames const&) {
    return {[sx = fields.GetFloat("sx"), sy = fields.GetFloat("sy")](IMKCanvas& canvas, SceneBitmaps const&) {
        (canvas.*operation)(sx, sy);
    }};
}

template <PairOperation operation>
SceneOperation ReadTranslate(SceneFields& fields, SceneNames const&) {
    return {[tx = fields.GetFloat("tx"), ty = fields.GetFloat("ty")](IMKCanvas& canvas, SceneBitmaps const&) {
        (canvas.*operation)(tx, ty);
    }};
}

template <TurnOperation turn, PivotOperation turnAround>
SceneOperation ReadRotate(SceneFields& fields, SceneNames const&) {
    float const degrees = fields.GetFloat("degrees");
    bool const hasX = fields.Find("px") != nullptr;
    bool const hasY = fields.Find("py") != nullptr;
    if (!hasX && !hasY)
        return {[degrees](IMKCanvas& canvas, SceneBitmaps const&) { (canvas.*turn)(degrees); }};
    return {[degrees, px = fields.GetFloat("px"), py = fields.GetFloat("py")](
                IMKCanvas& canvas, SceneBitmaps const&) { (canvas.*turnAround)(degrees, px, py); }};
}

} // namespace

SceneOperationTable const& GetStateOperations() {
    using C = IMKCanvasBase;
    static SceneOperationTable const kTable{
        {"Clear", ReadClear},
        {"ClearAll", ReadClearAll},
        {"Save", ReadSave},
        {"Restore", ReadRestore},
        {"SetClipRect", ReadSetClipRect},
        {"SetMatrix", ReadMatrixOperation<&C::SetMatrix>},
        {"PreConcat", ReadMatrixOperation<&C::PreConcat>},
        {"PostConcat", ReadMatrixOperation<&C::PostConcat>},
        {"PreScale", ReadScale<&C::PreScale>},
        {"PostScale", ReadScale<&C::PostScale>},
        {"PreTranslate", ReadTranslate<&C::PreTranslate>},
        {"PostTranslate", ReadTranslate<&C::PostTranslate>},
        {"PreRotate", ReadRotate<&C::PreRotate, &C::PreRotate>},
        {"PostRotate", ReadRotate<&C::PostRotate, &C::PostRotate>},
    };
    return kTable;
}

} // namespace Moka::Scenes
