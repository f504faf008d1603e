#include "apps/notebook/TileCache.h"

#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/graphics/paint/MKPaint.h"

#include <algorithm>

namespace Moka::Notebook {
namespace {

// The part of a tile that is page: those on the right and at the bottom reach over its edge.
int GetExtent(int index, int whole) {
    return std::clamp(whole - index * TileCache::kSide, 0, TileCache::kSide);
}

float ToFloat(int value) { return static_cast<float>(value); }

} // namespace

TileCache::TileCache(IGLMsgQueue& queue, std::size_t limitBytes, Paint paint)
    : mQueue(queue), mLimit(limitBytes / kTileBytes), mPaint(std::move(paint)) {}

RectF TileCache::Level::GetPageArea(Place const& place) const {
    auto const side = static_cast<float>(kSide / zoom);
    float const left = ToFloat(place.first) * side;
    float const top = ToFloat(place.second) * side;
    return {left, top, left + side, top + side};
}

bool TileCache::Draw(IMKCanvas& screen, Viewport const& view, int pageHeight, bool isZooming) {
    ++mFrame;
    if (view.zoom != mNow.zoom && isZooming) {
        ShowScaled(screen, view, pageHeight, mBefore);
        ShowScaled(screen, view, pageHeight, mNow);
        return false;
    }
    if (view.zoom != mNow.zoom) {
        if (!mNow.tiles.empty()) mBefore = std::move(mNow);
        mNow = {view.zoom, {}};
    }
    ShowScaled(screen, view, pageHeight, mBefore);
    bool const isDone = ShowExact(screen, view, pageHeight);
    if (isDone) mBefore.tiles.clear();
    return isDone;
}

void TileCache::ShowScaled(IMKCanvas& screen, Viewport const& view, int pageHeight, Level const& level) {
    if (level.tiles.empty()) return;
    RectF const seen = view.GetPageArea();
    int const width = static_cast<int>(std::ceil(Page::kWidth * level.zoom));
    int const height = static_cast<int>(std::ceil(pageHeight * level.zoom));
    auto const ratio = static_cast<float>(view.zoom / level.zoom);
    MKPaint const paint;
    for (auto const& [place, tile] : level.tiles) {
        if (tile.isEmpty || !Overlaps(level.GetPageArea(place), seen)) continue;
        float const w = ToFloat(GetExtent(place.first, width));
        float const h = ToFloat(GetExtent(place.second, height));
        float const left = ToFloat(place.first * kSide) * ratio - ToFloat(view.x);
        float const top = ToFloat(place.second * kSide) * ratio - ToFloat(view.y - view.top);
        screen.DrawBitmap(tile.bitmap.Get(), RectF(0, 0, w, h),
                          RectF(left, top, left + w * ratio, top + h * ratio), &paint);
    }
}

bool TileCache::ShowExact(IMKCanvas& screen, Viewport const& view, int pageHeight) {
    int const width = view.Scale(Page::kWidth);
    int const height = view.Scale(pageHeight);
    int const left = std::max(0, view.x) / kSide;
    int const top = std::max(0, view.y) / kSide;
    int const right = (std::min(width, view.x + view.width) - 1) / kSide;
    int const bottom = (std::min(height, view.y + view.height) - 1) / kSide;
    mNeeded = static_cast<std::size_t>(std::max(0, right - left + 1)) *
              static_cast<std::size_t>(std::max(0, bottom - top + 1));
    std::size_t objects = 0;
    bool isDone = true;
    MKPaint paint;
    for (int row = top; row <= bottom; ++row) {
        for (int column = left; column <= right; ++column) {
            Place const place(column, row);
            auto found = mNow.tiles.find(place);
            if (found == mNow.tiles.end()) found = mNow.tiles.emplace(place, MakeTile()).first;
            Tile& tile = found->second;
            tile.seen = mFrame;
            if (tile.isStale && objects < kObjectsAFrame && tile.canvas) {
                Prepare(tile, place);
                objects += 1 + mPaint(*tile.canvas, mNow.GetPageArea(place));
                tile.canvas->Restore(-1);
            }
            isDone = isDone && !tile.isStale;
            if (tile.isEmpty) continue;
            RectF const part(0, 0, ToFloat(GetExtent(column, width)), ToFloat(GetExtent(row, height)));
            RectF to = part;
            to.left += ToFloat(column * kSide - view.x);
            to.right += ToFloat(column * kSide - view.x);
            to.top += ToFloat(row * kSide - view.y + view.top);
            to.bottom += ToFloat(row * kSide - view.y + view.top);
            screen.DrawBitmap(tile.bitmap.Get(), part, to, &paint);
        }
    }
    return isDone;
}

void TileCache::Prepare(Tile& tile, Place const& place) const {
    tile.isStale = tile.isEmpty = false;
    tile.canvas->Save(IMKCanvasBase::SaveAll);
    tile.canvas->PreTranslate(ToFloat(-place.first * kSide), ToFloat(-place.second * kSide));
    auto const zoom = static_cast<float>(mNow.zoom);
    if (zoom != 1) tile.canvas->PreScale(zoom, zoom);
}

TileCache::Tile TileCache::MakeTile() {
    Tile tile;
    std::size_t const limit = std::max(mLimit, mNeeded);
    bool const isFull = mNow.tiles.size() + mBefore.tiles.size() >= limit;
    if (isFull && (TakeOldest(mBefore, tile) || TakeOldest(mNow, tile))) {
        tile.isStale = tile.isEmpty = true;
        return tile;
    }
    tile.bitmap = NewBitmap(mQueue, kSide, kSide);
    tile.canvas = NewCanvas(mQueue, tile.bitmap);
    return tile;
}

bool TileCache::TakeOldest(Level& level, Tile& tile) {
    auto const oldest =
        std::min_element(level.tiles.begin(), level.tiles.end(),
                         [](auto const& a, auto const& b) { return a.second.seen < b.second.seen; });
    if (oldest == level.tiles.end() || oldest->second.seen == mFrame) return false;
    tile = std::move(oldest->second);
    level.tiles.erase(oldest);
    return true;
}

void TileCache::Invalidate(RectF const& area) {
    for (auto& [place, tile] : mNow.tiles)
        if (Overlaps(mNow.GetPageArea(place), area)) tile.isStale = true;
}

void TileCache::Add(RectF const& area, std::function<void(IMKCanvas&)> const& draw) {
    for (auto& [place, tile] : mNow.tiles) {
        if (tile.isStale || !Overlaps(mNow.GetPageArea(place), area)) continue;
        Prepare(tile, place);
        draw(*tile.canvas);
        tile.canvas->Restore(-1);
    }
}

} // namespace Moka::Notebook
