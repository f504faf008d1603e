// TileCache: the page's pixels at one zoom, in square bitmaps of one strip each, drawn when they are seen first and
// again when what is on them has changed. While the zoom changes, the tiles of the zoom before are shown scaled.
// One strip: a custom drawable is clipped rightly there.
// Owner:   the application; destroyed before its queue.
// Thread:  the window's.
// Memory:  kTileBytes a tile, the limit in all; raised to what the window needs. The tile longest unseen is used
//          anew.
// Cost:    of a frame, at most about kObjectsAFrame objects and one tile more; the rest comes with the next frames.
#pragma once

#include "apps/notebook/Viewport.h"
#include "moka/base/RefPtr.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/task/IGLMsgQueue.h"

#include <cstddef>
#include <cstdint>
#include <functional>
#include <map>
#include <utility>
#include <vector>

namespace Moka::Notebook {

class TileCache {
public:
    static constexpr int kSide = 256;
    static constexpr std::size_t kTileBytes = std::size_t{4} * kSide * kSide;
    static constexpr std::size_t kObjectsAFrame = 200;

    // Draws the page's area on a canvas in its units and returns the number of objects.
    using Paint = std::function<std::size_t(IMKCanvas&, RectF const&)>;
    TileCache(IGLMsgQueue& queue, std::size_t limitBytes, Paint paint);

    // Shows the view. isZooming: the tiles of the zoom before stay for now. True when all that is seen is as it
    // should be.
    bool Draw(IMKCanvas& screen, Viewport const& view, int pageHeight, bool isZooming);

    // What is on the area has changed, or (Add) has something more on it, which `draw` draws.
    void Invalidate(RectF const& area);
    void Add(RectF const& area, std::function<void(IMKCanvas&)> const& draw);
    void Clear() { mNow.tiles.clear(); }

    std::size_t CountBytes() const { return (mNow.tiles.size() + mBefore.tiles.size()) * kTileBytes; }

private:
    using Place = std::pair<int, int>; // column, row
    struct Tile {
        RefPtr<IMKBitmap> bitmap;
        RefPtr<IMKCanvas> canvas;
        bool isStale = true;    // to be drawn
        bool isEmpty = true;    // never drawn for this place
        std::uint64_t seen = 0; // the frame
    };
    struct Level {
        double zoom = 1;
        std::map<Place, Tile> tiles;

        RectF GetPageArea(Place const& place) const;
    };

    Tile MakeTile();
    bool TakeOldest(Level& level, Tile& tile);
    void Prepare(Tile& tile, Place const& place) const;
    static void ShowScaled(IMKCanvas& screen, Viewport const& view, int pageHeight, Level const& level);
    bool ShowExact(IMKCanvas& screen, Viewport const& view, int pageHeight);

    IGLMsgQueue& mQueue;
    std::size_t const mLimit; // tiles
    std::size_t mNeeded = 0;  // tiles of the view
    Paint const mPaint;
    Level mNow;
    Level mBefore; // shown where mNow has nothing yet
    std::uint64_t mFrame = 0;
};

} // namespace Moka::Notebook
