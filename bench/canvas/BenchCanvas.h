// BenchCanvas: a caller-side canvas with its bitmap, and the shapes that the benchmarks draw.
#pragma once

#include "bench/canvas/Frame.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/graphics/paint/MKPaint.h"
#include "moka/host/RenderThread.h"

namespace Moka::Bench {

constexpr int kSide = 1024; // of the targets
constexpr int kShapes = 5000;
constexpr int kWarmUpFrames = 3;

enum class Colors { Same, Distinct };

inline RefPtr<IMKBitmap> MakeBitmap(int width, int height) {
    return NewBitmap(GetRenderThread(), width, height);
}

struct BenchCanvas {
    explicit BenchCanvas(int width = kSide, int height = kSide)
        : bitmap(MakeBitmap(width, height)), canvas(NewCanvas(GetRenderThread(), bitmap)) {}

    RefPtr<IMKBitmap> const bitmap;
    RefPtr<IMKCanvas> const canvas;
};

// Returns the top left corner of shape i. Shapes are spread over the target, at fractions of a pixel.
inline PointF PlaceOf(int i, int size) {
    int const room = kSide - size - 2;
    return {static_cast<float>(1 + i * 37 % room) + 0.25f, static_cast<float>(1 + i * 91 % room) + 0.5f};
}

inline RectF BoxOf(int i, int size) {
    PointF const place = PlaceOf(i, size);
    return {place.x, place.y, place.x + static_cast<float>(size), place.y + static_cast<float>(size)};
}

inline Vector4<float> ColorOf(int i, Colors colors) {
    if (colors == Colors::Same) i = 0;
    return {static_cast<float>(i & 0xFF) / 255, static_cast<float>(i >> 8) / 255, 0.5f, 0.75f};
}

inline void SetColor(MKPaint& paint, Vector4<float> const& c) { paint.SetColor(c.x, c.y, c.z, c.w); }

} // namespace Moka::Bench
