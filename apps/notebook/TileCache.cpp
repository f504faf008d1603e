#include "apps/notebook/TileCache.h"

#include "moka/graphics/factory/BitmapsAndCanvases.h"

#include <algorithm>

namespace Moka::Notebook {
namespace {

// What a frame draws, in points of strokes; an object counts kObject more.
constexpr double kLeastBudget = 600;
constexpr double kMostBudget = 200'000;
constexpr double kObject = 20;
constexpr int kAhead = 2 * TileCache::kSide; // of the window's pixels, drawn before they are seen

// The part of a tile that is page: those on the right and at the bottom reach over its edge.
int GetExtent(int index, int whole) {
    return std::clamp(whole - index * TileCache::kSide, 0, TileCache::kSide);
}

float ToFloat(int value) { return static_cast<float>(value); }

double GetCost(Object const& object) {
    auto const* const stroke = std::get_if<Stroke>(&object.content);
    return kObject + (stroke ? static_cast<double>(stroke->points.size()) : kObject);
}

} // namespace

RectF TileCache::Level::GetPageArea(Place const& place) const {
    auto const side = static_cast<float>(kSide / zoom);
    float const left = ToFloat(place.first) * side;
    float const top = ToFloat(place.second) * side;
    return {left, top, left + side, top + side};
}

bool TileCache::Draw(IMKCanvas& screen, Viewport const& view, int pageHeight, bool isZooming,
                     double lastFrame) {
    ++mFrame;
    if (view.zoom != mNow.zoom && !isZooming) {
        if (!mNow.tiles.empty()) mBefore = std::move(mNow);
        mNow = {view.zoom, {}};
        mDraft.reset();
    }
    Adapt(lastFrame);
    bool const isDone = view.zoom == mNow.zoom && Fill(FindWanted(view, pageHeight));
    if (isDone) mBefore.tiles.clear();
    if (!isDone) ShowPaper(screen, view, pageHeight);
    Show(screen, view, pageHeight, mBefore);
    Show(screen, view, pageHeight, mNow);
    return isDone;
}

// Where there are no tiles yet.
void TileCache::ShowPaper(IMKCanvas& screen, Viewport const& view, int pageHeight) {
    MKPaint const paper = MakePaint(kPaper);
    float const left = ToFloat(-view.x);
    float const top = ToFloat(view.top - view.y);
    screen.DrawRect(left, top, left + ToFloat(view.Scale(Page::kWidth)),
                    top + ToFloat(view.Scale(pageHeight)), &paper);
}

void TileCache::Show(IMKCanvas& screen, Viewport const& view, int pageHeight, Level const& level) {
    RectF const seen = view.GetPageArea();
    int const width = static_cast<int>(std::ceil(Page::kWidth * level.zoom));
    int const height = static_cast<int>(std::ceil(pageHeight * level.zoom));
    auto const ratio = static_cast<float>(view.zoom / level.zoom);
    MKPaint const paint;
    for (auto const& [place, tile] : level.tiles) {
        if (!Overlaps(level.GetPageArea(place), seen)) continue;
        float const w = ToFloat(GetExtent(place.first, width));
        float const h = ToFloat(GetExtent(place.second, height));
        float const left = ToFloat(place.first * kSide) * ratio - ToFloat(view.x);
        float const top = ToFloat(place.second * kSide) * ratio - ToFloat(view.y - view.top);
        screen.DrawBitmap(tile.bitmap.Get(), RectF(0, 0, w, h),
                          RectF(left, top, left + w * ratio, top + h * ratio), &paint);
    }
}

void TileCache::AddPlaces(Viewport const& view, int pageHeight, std::vector<Place>& places) {
    int const left = std::max(0, view.x) / kSide;
    int const top = std::max(0, view.y) / kSide;
    int const right = (std::min(view.Scale(Page::kWidth), view.x + view.width) - 1) / kSide;
    int const bottom = (std::min(view.Scale(pageHeight), view.y + view.height) - 1) / kSide;
    for (int row = top; row <= bottom; ++row)
        for (int column = left; column <= right; ++column)
            if (std::find(places.begin(), places.end(), Place(column, row)) == places.end())
                places.emplace_back(column, row);
}

// What is seen, and behind it what comes next.
std::vector<TileCache::Place> TileCache::FindWanted(Viewport const& view, int pageHeight) {
    std::vector<Place> wanted;
    AddPlaces(view, pageHeight, wanted);
    mNeeded = wanted.size();
    int const now[2] = {view.x, view.y};
    if (now[0] != mLast[0] || now[1] != mLast[1]) {
        for (int axis : {0, 1}) {
            mDirection[axis] = (now[axis] > mLast[axis]) - (now[axis] < mLast[axis]);
            mLast[axis] = now[axis];
        }
    }
    Viewport ahead = view;
    ahead.x += mDirection[0] * kAhead;
    ahead.y += mDirection[1] * kAhead;
    AddPlaces(ahead, pageHeight, wanted);
    if (wanted.size() >= mLimit) wanted.resize(mNeeded);
    return wanted;
}

// A frame draws more or less than the one before, until it takes about kFrameTime.
void TileCache::Adapt(double lastFrame) {
    if (lastFrame > 1.2 * kFrameTime) mBudget = std::max(mBudget * 0.7, kLeastBudget);
    if (lastFrame < 0.9 * kFrameTime && mIsSpent) mBudget = std::min(mBudget * 1.2, kMostBudget);
    mIsSpent = false;
}

bool TileCache::Fill(std::vector<Place> const& wanted) {
    for (Place const& place : wanted) {
        auto const found = mNow.tiles.find(place);
        if (found != mNow.tiles.end()) found->second.seen = mFrame;
    }
    // Out of sight before it was done.
    if (mDraft && std::find(wanted.begin(), wanted.end(), mDraft->place) == wanted.end()) mDraft.reset();
    double budget = mBudget;
    while (budget > 0 && (mDraft || Begin(wanted))) budget -= Continue(budget);
    mIsSpent = budget <= 0;
    return !mIsSpent && !mDraft;
}

bool TileCache::Begin(std::vector<Place> const& wanted) {
    auto const place = std::find_if(wanted.begin(), wanted.end(), [this](Place const& p) {
        auto const found = mNow.tiles.find(p);
        return found == mNow.tiles.end() || found->second.isStale;
    });
    if (place == wanted.end()) return false;
    if (!mSpare.bitmap) mSpare = TakeTile();
    if (!mSpare.canvas) return false;
    mDraft = {*place, mPainter.Find(mNow.GetPageArea(*place))};
    mSpare.canvas->ClearAll(static_cast<int>(kPaper));
    return true;
}

// Returns what it took of the budget.
double TileCache::Continue(double budget) {
    double cost = kObject;
    for (; mDraft->next < mDraft->objects.size() && cost < budget; ++mDraft->next) {
        Object const& object = *mDraft->objects[mDraft->next];
        DrawOn(mSpare, mDraft->place, object);
        cost += GetCost(object);
    }
    if (mDraft->next < mDraft->objects.size()) return cost;
    mSpare.isStale = mDraft->isStale;
    mSpare.seen = mFrame;
    std::swap(mNow.tiles[mDraft->place], mSpare);
    mDraft.reset();
    return cost;
}

void TileCache::DrawOn(Tile const& tile, Place const& place, Object const& object) const {
    tile.canvas->Save(IMKCanvasBase::SaveAll);
    tile.canvas->PreTranslate(ToFloat(-place.first * kSide), ToFloat(-place.second * kSide));
    auto const zoom = static_cast<float>(mNow.zoom);
    if (zoom != 1) tile.canvas->PreScale(zoom, zoom);
    mPainter.Draw(*tile.canvas, object);
    tile.canvas->Restore(-1);
}

TileCache::Tile TileCache::TakeTile() {
    Tile tile;
    bool const isFull = CountTiles() >= std::max(mLimit, mNeeded + 1);
    if (isFull && (TakeOldest(mBefore, tile) || TakeOldest(mNow, tile))) return tile;
    tile.bitmap = NewBitmap(mQueue, kSide, kSide);
    tile.canvas = NewCanvas(mQueue, tile.bitmap);
    return tile;
}

bool TileCache::TakeOldest(Level& level, Tile& tile) const {
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
    if (mDraft && Overlaps(mNow.GetPageArea(mDraft->place), area)) mDraft->isStale = true;
}

void TileCache::Add(ObjectPtr const& object) {
    for (auto& [place, tile] : mNow.tiles)
        if (Overlaps(mNow.GetPageArea(place), object->bounds)) DrawOn(tile, place, *object);
    if (mDraft && Overlaps(mNow.GetPageArea(mDraft->place), object->bounds))
        mDraft->objects.push_back(object);
}

void TileCache::Clear() {
    mNow.tiles.clear();
    mDraft.reset();
}

} // namespace Moka::Notebook
