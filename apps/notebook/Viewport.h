// Viewport: which part of the page the window shows. The page's corner lies on a whole pixel of the window, so
// that tiles are copied pixel by pixel.
// Units: the window's pixels, unless a name says page.
#pragma once

#include "apps/notebook/Page.h"
#include "moka/graphics/canvas/IMKCanvas.h"

#include <algorithm>
#include <cmath>

namespace Moka::Notebook {

struct Viewport {
    static constexpr double kMinZoom = 0.1;
    static constexpr double kMaxZoom = 8;
    static constexpr int kEdge = 24; // that may be seen beside the page

    double zoom = 1;
    int x = 0; // of the view's corner on the page, scaled
    int y = 0;
    int width = 1;
    int height = 1; // of the view, below the toolbar
    int top = 0;    // the toolbar's height

    PointF ToPage(PointF const& at) const {
        return {static_cast<float>((static_cast<double>(at.x) + x) / zoom),
                static_cast<float>((static_cast<double>(at.y) - top + y) / zoom)};
    }
    RectF GetPageArea() const {
        PointF const from = ToPage({0, static_cast<float>(top)});
        PointF const to = ToPage({static_cast<float>(width), static_cast<float>(top + height)});
        return {from.x, from.y, to.x, to.y};
    }
    int Scale(int page) const { return static_cast<int>(std::ceil(page * zoom)); }

    // The canvas's units become the page's.
    void Apply(IMKCanvas& canvas) const {
        canvas.PreTranslate(static_cast<float>(-x), static_cast<float>(top - y));
        if (zoom != 1) canvas.PreScale(static_cast<float>(zoom), static_cast<float>(zoom));
    }

    void Pan(float dx, float dy) {
        x -= static_cast<int>(std::lround(dx));
        y -= static_cast<int>(std::lround(dy));
    }
    // What is there stays there.
    void ZoomAt(PointF const& at, double factor) {
        double const before = zoom;
        zoom = std::clamp(zoom * factor, kMinZoom, kMaxZoom);
        if (std::abs(zoom - 1) < 0.02) zoom = 1;
        double const ratio = zoom / before;
        double const across = static_cast<double>(at.x);
        double const down = static_cast<double>(at.y) - top;
        x = static_cast<int>(std::lround((x + across) * ratio - across));
        y = static_cast<int>(std::lround((y + down) * ratio - down));
    }
    // Keeps the page in the view; one that is narrower lies in the middle.
    void Clamp(int pageHeight) {
        int const pageWidth = Scale(Page::kWidth);
        x = pageWidth + 2 * kEdge <= width ? (pageWidth - width) / 2
                                           : std::clamp(x, -kEdge, pageWidth + kEdge - width);
        y = std::clamp(y, 0, std::max(0, Scale(pageHeight) + kEdge - height));
    }
};

} // namespace Moka::Notebook
