// TileCache: the page's pixels at one zoom, in square tiles. A tile is drawn when it is first visible, and redrawn when
// an object on it has changed. While the zoom changes, the tiles of the previous zoom are shown scaled.
// Each tile is a bitmap of one strip, because scissor clips of custom drawables are correct only there.
// Owner:   the application, which destroys it before its queue.
// Thread:  the window's.
// Memory:  kTileBytes for each tile. The limit is raised to the number of visible tiles. At the limit, the tile that was
//          invisible for the longest time is reused.
// Cost:    each frame draws for about kFrameTime, estimated from the times of earlier frames. A tile is drawn off
//          screen, over several frames if necessary; until it is complete, the window shows paper, its old pixels, or
//          those of the previous zoom. Visible tiles are drawn first, then those in the direction of the last scroll.
#pragma once

#include "apps/notebook/Painter.h"
#include "apps/notebook/Viewport.h"
#include "moka/graphics/bitmap/IMKBitmap.h"

#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <utility>
#include <vector>

namespace Moka::Notebook {

class TileCache {
public:
    static constexpr int kSide = 256;
    static constexpr std::size_t kTileBytes = std::size_t{4} * kSide * kSide;
    static constexpr double kFrameTime = 25; // milliseconds

    TileCache(IGLMsgQueue& queue, std::size_t limitBytes, Painter const& painter)
        : mQueue(queue), mPainter(painter), mLimit(limitBytes / kTileBytes) {}

    // Draws the view. isZooming: keep the tiles of the previous zoom for now. lastFrame: the duration of the last frame
    // in milliseconds. Returns true if all visible tiles, and those in the scroll direction, are up to date.
    bool Draw(IMKCanvas& screen, Viewport const& view, int pageHeight, bool isZooming, double lastFrame);

    // Call Invalidate when objects in the area have changed, and Add when the object was put on top.
    void Invalidate(RectF const& area);
    void Add(ObjectPtr const& object);
    void Clear();

    std::size_t CountBytes() const { return CountTiles() * kTileBytes; }

private:
    using Place = std::pair<int, int>; // column, row
    struct Tile {
        RefPtr<IMKBitmap> bitmap;
        RefPtr<IMKCanvas> canvas;
        bool isStale = false;   // must be redrawn
        std::uint64_t seen = 0; // the last frame in which it was visible
    };
    struct Level {
        double zoom = 1;
        std::map<Place, Tile> tiles; // complete ones

        RectF GetPageArea(Place const& place) const;
    };
    struct Draft {
        Place place;
        Objects objects;
        std::size_t next = 0; // the index of the next object to draw
        bool isStale = false;
    };

    static void AddPlaces(Viewport const& view, int pageHeight, std::vector<Place>& places);
    std::vector<Place> FindWanted(Viewport const& view, int pageHeight);
    bool Fill(std::vector<Place> const& wanted);
    bool Begin(std::vector<Place> const& wanted);
    double Continue(double budget);
    void DrawOn(Tile const& tile, Place const& place, Object const& object) const;
    void Adapt(double lastFrame);
    static void ShowPaper(IMKCanvas& screen, Viewport const& view, int pageHeight);
    static void Show(IMKCanvas& screen, Viewport const& view, int pageHeight, Level const& level);
    std::size_t CountTiles() const {
        return mNow.tiles.size() + mBefore.tiles.size() + (mSpare.bitmap ? 1 : 0);
    }
    Tile TakeTile();
    bool TakeOldest(Level& level, Tile& tile) const;

    IGLMsgQueue& mQueue;
    Painter const& mPainter;
    std::size_t const mLimit; // tiles
    std::size_t mNeeded = 0;  // the number of visible tiles
    Level mNow;
    Level mBefore;               // the previous zoom, shown where mNow has no tile yet
    Tile mSpare;                 // the draft is drawn on it
    std::optional<Draft> mDraft; // of mNow
    double mBudget = 2000;       // for a frame, in points of strokes
    bool mIsSpent = false;
    int mLast[2] = {0, 0};      // the view's corner in the last frame
    int mDirection[2] = {0, 1}; // of its last movement
    std::uint64_t mFrame = 0;
};

} // namespace Moka::Notebook
