// TileCache: the page's pixels at one zoom, in square bitmaps of one strip each, drawn when they are seen first and
// again when what is on them has changed. While the zoom changes, the tiles of the zoom before are shown scaled.
// One strip: a custom drawable is clipped rightly there.
// Owner:   the application; destroyed before its queue.
// Thread:  the window's.
// Memory:  kTileBytes a tile, the limit in all; raised to what the window needs. The tile longest unseen is used
//          anew.
// Cost:    a frame draws as much as fits into about kFrameTime, by what the frames before took. A tile is drawn aside,
//          over several frames if need be, and then shown whole; until then paper, its old pixels, or those of the
//          zoom before are seen. What is seen comes first, then what comes into view if it moves on as it did.
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

    // Shows the view. isZooming: the tiles of the zoom before stay for now. lastFrame: the milliseconds it took.
    // True when all that is seen, or will be soon, is as it should be.
    bool Draw(IMKCanvas& screen, Viewport const& view, int pageHeight, bool isZooming, double lastFrame);

    // What is on the area has changed, or (Add) the object has come on top.
    void Invalidate(RectF const& area);
    void Add(ObjectPtr const& object);
    void Clear();

    std::size_t CountBytes() const { return CountTiles() * kTileBytes; }

private:
    using Place = std::pair<int, int>; // column, row
    struct Tile {
        RefPtr<IMKBitmap> bitmap;
        RefPtr<IMKCanvas> canvas;
        bool isStale = false;   // to be drawn again
        std::uint64_t seen = 0; // the frame
    };
    struct Level {
        double zoom = 1;
        std::map<Place, Tile> tiles; // drawn whole

        RectF GetPageArea(Place const& place) const;
    };
    struct Draft {
        Place place;
        Objects objects;
        std::size_t next = 0; // of them
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
    std::size_t mNeeded = 0;  // tiles of the view
    Level mNow;
    Level mBefore;               // shown where mNow has nothing yet
    Tile mSpare;                 // the draft is drawn on it
    std::optional<Draft> mDraft; // of mNow
    double mBudget = 2000;       // of a frame, in points of strokes
    bool mIsSpent = false;
    int mLast[2] = {0, 0};      // the view's corner in the last frame
    int mDirection[2] = {0, 1}; // in which it moved last
    std::uint64_t mFrame = 0;
};

} // namespace Moka::Notebook
