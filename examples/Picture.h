// Picture: the picture of all examples: a ruled page of the window's size, with a card and a highlighter.
#pragma once

#include "moka/graphics/MokaGraphics.h"

namespace Examples {

inline Moka::MKPaint MakePaint(unsigned argb) {
    Moka::MKPaint paint;
    paint.SetColor(static_cast<int>(argb));
    return paint;
}

inline void DrawPicture(Moka::IMKCanvas& canvas, int width, int height) {
    auto const w = static_cast<float>(width);
    auto const h = static_cast<float>(height);
    canvas.ClearAll(static_cast<int>(0xFFF7F5F0));
    Moka::MKPaint const rule = MakePaint(0xFFB8C8D8);
    for (float y = 40; y < h; y += 24) canvas.DrawRect(0, y, w, y + 1, &rule);
    Moka::MKPaint const margin = MakePaint(0xFFD86050);
    canvas.DrawRect(w - 32, 0, w - 30, h, &margin);

    Moka::MKPaint const card = MakePaint(0xFF2A4A6A);
    canvas.DrawRoundRect(w / 8, h / 8, w / 2, h / 2, 12, 12, &card);
    Moka::MKPaint const sun = MakePaint(0xFFE8A030);
    canvas.DrawCircle(w / 2, h / 2, h / 6, &sun);
    Moka::MKPaint const marker = MakePaint(0x60FFE000);
    canvas.Save(Moka::IMKCanvasBase::SaveAll);
    canvas.PreRotate(-10, w / 2, h / 2);
    canvas.DrawRect(w / 6, h * 0.6f, w * 5 / 6, h * 0.7f, &marker);
    canvas.Restore(-1);
}

} // namespace Examples
