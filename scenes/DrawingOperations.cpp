#include "moka/graphics/drawable/MKStrokeDrawable.h"
#include "scenes/SceneError.h"
#include "scenes/SceneSteps.h"

namespace Moka::Scenes {
namespace {

using Kind = SceneValue::Kind;

SceneOperation ReadDrawLine(SceneFields& fields, SceneNames const& names) {
    return {[from = fields.GetPoint("from"), to = fields.GetPoint("to"), paint = GetPaint(fields, names)](
                IMKCanvas& canvas, SceneBitmaps const&) { canvas.DrawLine(from, to, &paint); }};
}

SceneOperation ReadDrawSimpleLine(SceneFields& fields, SceneNames const& names) {
    return {[from = fields.GetPoint("from"), to = fields.GetPoint("to"), paint = GetPaint(fields, names)](
                IMKCanvas& canvas, SceneBitmaps const&) { canvas.DrawSimpleLine(from, to, &paint); }};
}

SceneOperation ReadDrawRect(SceneFields& fields, SceneNames const& names) {
    return {[rect = fields.GetRect("rect"), paint = GetPaint(fields, names)](
                IMKCanvas& canvas, SceneBitmaps const&) { canvas.DrawRect(rect, &paint); }};
}

SceneOperation ReadDrawRoundRect(SceneFields& fields, SceneNames const& names) {
    return {[rect = fields.GetRect("rect"), rx = fields.GetFloat("rx"), ry = fields.GetFloat("ry"),
             paint = GetPaint(fields, names)](IMKCanvas& canvas, SceneBitmaps const&) {
        canvas.DrawRoundRect(rect, rx, ry, &paint);
    }};
}

SceneOperation ReadDrawCircle(SceneFields& fields, SceneNames const& names) {
    return {[cx = fields.GetFloat("cx"), cy = fields.GetFloat("cy"), radius = fields.GetFloat("radius"),
             paint = GetPaint(fields, names)](IMKCanvas& canvas, SceneBitmaps const&) {
        canvas.DrawCircle(cx, cy, radius, &paint);
    }};
}

// Reads the positions of a batch: a list, or {"columns", "rows", "from", "step"} for a grid, row by row.
template <class Place, class ReadOne, class ReadGridPlace>
std::vector<Place> ReadPlaces(SceneValue const& value, ReadOne const& readOne,
                              ReadGridPlace const& readGridPlace) {
    std::vector<Place> places;
    if (value.kind == Kind::List) {
        for (SceneValue const& item : value.items) places.push_back(readOne(item));
        return places;
    }
    if (value.kind != Kind::Object) ThrowExpected(value, "a list or a grid, { \"columns\", ... }");
    SceneFields fields(value);
    int const columns = ReadInt(fields.Get("columns"), 1, 10'000);
    int const rows = ReadInt(fields.Get("rows"), 1, 10'000);
    if (static_cast<long long>(columns) * rows > kMaxOperations)
        throw SceneValueError(value, ": more than " + std::to_string(kMaxOperations) + " places");
    PointF const from = fields.GetPoint("from");
    PointF const step = fields.GetPoint("step");
    auto const makePlace = readGridPlace(fields);
    fields.CheckAll();
    for (int row = 0; row < rows; ++row)
        for (int column = 0; column < columns; ++column)
            places.push_back(makePlace(from.x + step.x * static_cast<float>(column),
                                       from.y + step.y * static_cast<float>(row)));
    return places;
}

std::vector<PointF> ReadPoints(SceneValue const& value) {
    return ReadPlaces<PointF>(value, ReadPoint,
                              [](SceneFields&) { return [](float x, float y) { return PointF(x, y); }; });
}

std::vector<RectF> ReadRects(SceneValue const& value) {
    return ReadPlaces<RectF>(value, ReadRect, [](SceneFields& fields) {
        return [size = fields.GetPoint("size")](float x, float y) {
            return RectF(x, y, x + size.x, y + size.y);
        };
    });
}

SceneOperation ReadDrawSimpleLines(SceneFields& fields, SceneNames const& names) {
    SceneValue const& value = fields.Get("points");
    std::vector<PointF> points = ReadPoints(value);
    if (points.size() % 2 != 0)
        throw SceneValueError(value, " must be an even number of points, not " +
                                         std::to_string(points.size()) + ": two for each line");
    long long const count = static_cast<long long>(points.size() / 2);
    return {[points = std::move(points), paint = GetPaint(fields, names)](
                IMKCanvas& canvas, SceneBitmaps const&) { canvas.DrawSimpleLines(points, &paint); },
            count};
}

SceneOperation ReadDrawStroke(SceneFields& fields, SceneNames const& names) {
    SceneValue const& value = fields.Get("points");
    if (value.kind != Kind::List) ThrowExpected(value, "a list of points, [x, y, width] each");
    std::vector<MKStrokePoint> points;
    for (SceneValue const& item : value.items) {
        std::vector<float> const n = ReadFloats(item, 3, "[x, y, width]");
        points.push_back({n[0], n[1], n[2]});
    }
    auto const count = static_cast<long long>(points.size());
    return {[points = std::move(points), paint = GetPaint(fields, names)](IMKCanvas& canvas,
                                                                          SceneBitmaps const& bitmaps) {
                auto const stroke = RefPtr<MKStrokeDrawable>::Adopt(new MKStrokeDrawable(bitmaps.queue));
                stroke->Append(points.data(), static_cast<int>(points.size()));
                canvas.Draw(stroke.Get(), &paint);
            },
            count, true};
}

SceneOperation ReadDrawBitmap(SceneFields& fields, SceneNames const& names) {
    std::size_t const bitmap = GetBitmap(fields, names);
    MKPaint const paint = GetPaint(fields, names);
    SceneValue const* const src = fields.Find("src");
    SceneValue const* const dst = fields.Find("dst");
    if (!dst && !src)
        return {[=, x = fields.GetFloat("x"), y = fields.GetFloat("y")](IMKCanvas& canvas,
                                                                        SceneBitmaps const& bitmaps) {
            canvas.DrawBitmap(bitmaps[bitmap].Get(), x, y, &paint);
        }};
    RectF const to = fields.GetRect("dst");
    if (!src)
        return {[=](IMKCanvas& canvas, SceneBitmaps const& bitmaps) {
            canvas.DrawBitmap(bitmaps[bitmap].Get(), to, &paint);
        }};
    return {[=, from = fields.GetRect("src")](IMKCanvas& canvas, SceneBitmaps const& bitmaps) {
        canvas.DrawBitmap(bitmaps[bitmap].Get(), from, to, &paint);
    }};
}

SceneOperation ReadDrawBitmapsAtPoints(SceneFields& fields, std::size_t bitmap, MKPaint const& paint) {
    std::vector<PointF> const points = ReadPoints(fields.Get("points"));
    return {[=](IMKCanvas& canvas, SceneBitmaps const& bitmaps) {
                std::vector<PointF> copy = points;
                canvas.DrawBitmaps(bitmaps[bitmap].Get(), copy, &paint);
            },
            static_cast<long long>(points.size())};
}

SceneOperation ReadDrawBitmaps(SceneFields& fields, SceneNames const& names) {
    std::size_t const bitmap = GetBitmap(fields, names);
    MKPaint const paint = GetPaint(fields, names);
    SceneValue const* const src = fields.Find("src");
    if (!src && !fields.Find("dsts")) return ReadDrawBitmapsAtPoints(fields, bitmap, paint);
    std::vector<RectF> const dsts = ReadRects(fields.Get("dsts"));
    long long const count = static_cast<long long>(dsts.size());
    if (!src)
        return {[=](IMKCanvas& canvas, SceneBitmaps const& bitmaps) {
                    canvas.DrawBitmaps(bitmaps[bitmap].Get(), dsts, &paint);
                },
                count};
    return {[=, from = fields.GetRect("src")](IMKCanvas& canvas, SceneBitmaps const& bitmaps) {
                canvas.DrawBitmaps(bitmaps[bitmap].Get(), from, dsts, &paint);
            },
            count};
}

} // namespace

MKPaint GetPaint(SceneFields& fields, SceneNames const& names) {
    SceneValue const* const value = fields.Find("paint");
    return value ? ReadPaint(*value, names.paints) : MKPaint();
}

std::size_t GetBitmap(SceneFields& fields, SceneNames const& names, char const* key) {
    SceneValue const& value = fields.Get(key);
    auto const found = names.bitmaps.find(ReadText(value));
    if (found != names.bitmaps.end()) return found->second;
    std::string known;
    for (auto const& entry : names.bitmaps) known += (known.empty() ? "" : ", ") + entry.first;
    ThrowExpected(value, known.empty() ? "described under \"bitmaps\"" : "one of " + known);
}

SceneOperationTable const& GetDrawingOperations() {
    static SceneOperationTable const kTable{
        {"DrawLine", ReadDrawLine},
        {"DrawSimpleLine", ReadDrawSimpleLine},
        {"DrawSimpleLines", ReadDrawSimpleLines},
        {"DrawRect", ReadDrawRect},
        {"DrawRoundRect", ReadDrawRoundRect},
        {"DrawCircle", ReadDrawCircle},
        {"DrawStroke", ReadDrawStroke},
        {"DrawBitmap", ReadDrawBitmap},
        {"DrawBitmaps", ReadDrawBitmaps},
    };
    return kTable;
}

} // namespace Moka::Scenes
