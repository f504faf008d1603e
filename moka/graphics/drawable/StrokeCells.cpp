#include "moka/graphics/drawable/StrokeCells.h"

#include <algorithm>
#include <array>
#include <limits>

namespace Moka::detail {
namespace {

// The side of the leaves for a segment is the greatest of these three: in device pixels, relative to the
// segment's radius, and relative to its length.
constexpr double kLeafPixels = 8;
constexpr double kLeafOfRadius = 0.25;
constexpr double kLeafOfLength = 1.0 / 64;
// A leaf with more segments is split, down to this side in device pixels. Beyond that, the nearest
// kMostEntries are kept.
constexpr int kManyEntries = 24;
constexpr double kLeastLeafPixels = 0.25;
constexpr std::size_t kMostEntries = 64; // a leaf that may be split has fewer
constexpr std::size_t kKeptEntries = 32;
// The smallest side of a cell, in device pixels.
constexpr double kLeastCellPixels = 0.25;
// Segments thinner than a device pixel fade. One that is at least this fraction as wide as another counts as
// equal.
constexpr double kAsWide = 0.95;

// A cell with too many points drops those that deviate from the line between their neighbours by less than
// this, in device pixels. The tolerance grows for thin strokes, which fade.
constexpr double kLoose = 1.0 / 24;

constexpr std::size_t kCellPoints = StrokeCell::kPoints;

std::size_t At(int index) { return static_cast<std::size_t>(index); }

double GetReach(StrokeSegment const& segment, StrokeScale const& scale) {
    return std::max(segment.GetGreatestRadius() + scale.coarse * 0.5, scale.coarse);
}

} // namespace

void StrokeCells::Add(StrokeSegment const& segment, bool mayBeTakenBack) {
    mSegments.push_back(segment);
    mMayTakeBack = mayBeTakenBack;
    GrowRoot(segment);
    double const target = std::max({kLeafPixels * mScale.coarse, kLeafOfRadius * segment.GetGreatestRadius(),
                                    kLeafOfLength * segment.GetLength()});
    Insert(0, mRoot, static_cast<int>(mSegments.size()) - 1, target);
}

void StrokeCells::TakeBackLast() {
    Remove(0, mRoot, static_cast<int>(mSegments.size()) - 1);
    mSegments.pop_back();
    mMayTakeBack = false;
}

void StrokeCells::Clear() {
    mSegments.clear();
    mNodes.clear();
    mEntries.clear();
    mCells.clear();
    mNextCell.clear();
    mFreeCell = kNone;
    mMayTakeBack = false;
}

std::vector<StrokeCell> const& StrokeCells::Make() {
    if (!mNodes.empty()) MakeNode(0, mRoot);
    return mCells;
}

StrokeCells::Candidate StrokeCells::Judge(int segment, Square const& square) const {
    StrokeSegment const& judged = mSegments[At(segment)];
    double const half = square.side * 0.5;
    double const reach = half * 1.41422;
    double const edge = judged.GetEdge(square.x + half, square.y + half);
    double const gap = judged.GetGap(square.x + half, square.y + half, half) - judged.GetGreatestRadius();
    return {segment, std::max(edge - reach, gap), edge + reach};
}

bool StrokeCells::IsOutside(Candidate const& candidate) const {
    double const half = mScale.coarse * 0.5;
    bool const mayFade = mSegments[At(candidate.segment)].GetLeastRadius() < half;
    return candidate.least >= (mayFade ? mScale.coarse : half);
}

bool StrokeCells::IsFull(Candidate const& candidate) const {
    double const half = mScale.coarse * 0.5;
    return candidate.most <= -half && mSegments[At(candidate.segment)].GetLeastRadius() >= half;
}

// The distance to a convex shape is a convex function, so its maximum over the square is at a corner.
double StrokeCells::FindMost(Candidate const& candidate, Square const& square) const {
    StrokeSegment const& segment = mSegments[At(candidate.segment)];
    double const right = square.x + square.side;
    double const bottom = square.y + square.side;
    return std::max({segment.GetEdge(square.x, square.y), segment.GetEdge(right, square.y),
                     segment.GetEdge(square.x, bottom), segment.GetEdge(right, bottom)});
}

// True if best covers each pixel of the square at least as much as the candidate.
bool StrokeCells::IsBeaten(Candidate const& candidate, Candidate const& best) const {
    if (!mScale.isEven || best.most > candidate.least) return false;
    StrokeSegment const& winner = mSegments[At(best.segment)];
    double const half = mScale.coarse * 0.5;
    StrokeSegment const& loser = mSegments[At(candidate.segment)];
    // Both are at least one device pixel wide, so neither fades.
    if (winner.GetLeastRadius() >= half && loser.GetLeastRadius() >= half) return true;
    double const most = best.most + winner.GetGreatestRadius();
    return most <= candidate.least + loser.GetLeastRadius() &&
           winner.GetLeastRadius() >= kAsWide * loser.GetGreatestRadius();
}

void StrokeCells::GrowRoot(StrokeSegment const& segment) {
    double const reach = GetReach(segment, mScale);
    double const left = std::min(segment.a.x, segment.b.x) - reach;
    double const top = std::min(segment.a.y, segment.b.y) - reach;
    double const right = std::max(segment.a.x, segment.b.x) + reach;
    double const bottom = std::max(segment.a.y, segment.b.y) + reach;
    if (mNodes.empty()) {
        double const side = kLeafPixels * mScale.coarse;
        mRoot = {std::floor(left / side) * side, std::floor(top / side) * side, side};
        mNodes.emplace_back();
    }
    while (left < mRoot.x || top < mRoot.y || right > mRoot.x + mRoot.side || bottom > mRoot.y + mRoot.side) {
        bool const toLeft = left < mRoot.x;
        bool const toTop = top < mRoot.y;
        int const children = static_cast<int>(mNodes.size());
        mNodes.resize(mNodes.size() + 4);
        mNodes[At(children + (toLeft ? 1 : 0) + (toTop ? 2 : 0))] = mNodes[0];
        Node root;
        root.children = children;
        root.isChanged = mNodes[0].isChanged;
        mNodes[0] = root;
        mRoot = {mRoot.x - (toLeft ? mRoot.side : 0), mRoot.y - (toTop ? mRoot.side : 0), mRoot.side * 2};
    }
}

void StrokeCells::Insert(int node, Square const& square, int segment, double target) {
    if (mNodes[At(node)].isFull) return;
    Candidate const candidate = Judge(segment, square);
    if (IsOutside(candidate)) return;
    mNodes[At(node)].isChanged = true;
    bool const isLast = At(segment) + 1 == mSegments.size();
    if (!(isLast && mMayTakeBack) && IsFull(candidate)) {
        Fill(node, segment);
        return;
    }
    bool const isLeaf = mNodes[At(node)].children == kNone;
    if (isLeaf && square.side <= target) {
        AddEntry(node, segment);
        if (mNodes[At(node)].entryCount <= kManyEntries) return;
        if (square.side > kLeastLeafPixels * mScale.coarse) {
            Split(node, square, square.side * 0.5);
        } else {
            LimitEntries(node, square);
        }
        return;
    }
    if (isLeaf) Split(node, square, target);
    int const children = mNodes[At(node)].children;
    for (int i = 0; i < 4; ++i) Insert(children + i, square.GetQuarter(i), segment, target);
}

void StrokeCells::AddEntry(int node, int segment) {
    mEntries.push_back({segment, mNodes[At(node)].entries});
    mNodes[At(node)].entries = static_cast<int>(mEntries.size()) - 1;
    ++mNodes[At(node)].entryCount;
}

void StrokeCells::Split(int node, Square const& square, double target) {
    FreeCells(node);
    std::array<int, kMostEntries> segments; // the latest first
    auto end = segments.begin();
    for (int i = mNodes[At(node)].entries; i != kNone && end != segments.end(); i = mEntries[At(i)].next) {
        *end++ = mEntries[At(i)].segment;
    }
    int const children = static_cast<int>(mNodes.size());
    mNodes.resize(mNodes.size() + 4);
    mNodes[At(node)].children = children;
    mNodes[At(node)].entries = kNone;
    mNodes[At(node)].entryCount = 0;
    // Keeps the order in which the segments were added.
    while (end != segments.begin()) {
        --end;
        for (int i = 0; i < 4; ++i) Insert(children + i, square.GetQuarter(i), *end, target);
    }
}

void StrokeCells::Fill(int node, int segment) {
    FreeCellsBelow(node);
    Node filled;
    filled.isChanged = true;
    filled.isFull = true;
    mNodes[At(node)] = filled;
    AddEntry(node, segment);
}

void StrokeCells::Remove(int node, Square const& square, int segment) {
    if (mNodes[At(node)].isFull || IsOutside(Judge(segment, square))) return;
    mNodes[At(node)].isChanged = true;
    int const children = mNodes[At(node)].children;
    if (children != kNone) {
        for (int i = 0; i < 4; ++i) Remove(children + i, square.GetQuarter(i), segment);
        return;
    }
    int const first = mNodes[At(node)].entries;
    if (first == kNone || mEntries[At(first)].segment != segment) return;
    mNodes[At(node)].entries = mEntries[At(first)].next;
    --mNodes[At(node)].entryCount;
}

void StrokeCells::FreeCells(int node) {
    int& cells = mNodes[At(node)].cells;
    while (cells != kNone) {
        int const freed = cells;
        cells = mNextCell[At(freed)];
        mCells[At(freed)].side = 0;
        mNextCell[At(freed)] = mFreeCell;
        mFreeCell = freed;
    }
}

void StrokeCells::FreeCellsBelow(int node) {
    FreeCells(node);
    int const children = mNodes[At(node)].children;
    if (children == kNone) return;
    for (int i = 0; i < 4; ++i) FreeCellsBelow(children + i);
}

void StrokeCells::LimitEntries(int node, Square const& square) {
    if (At(mNodes[At(node)].entryCount) < kMostEntries) return;
    std::vector<Candidate>& candidates = mCandidates;
    candidates.clear();
    for (int i = mNodes[At(node)].entries; i != kNone; i = mEntries[At(i)].next) {
        candidates.push_back(Judge(mEntries[At(i)].segment, square));
    }
    auto const isNearer = [](Candidate const& a, Candidate const& b) { return a.most < b.most; };
    std::sort(candidates.begin(), candidates.end(), isNearer);
    candidates.resize(kKeptEntries);
    auto const isEarlier = [](Candidate const& a, Candidate const& b) { return a.segment < b.segment; };
    std::sort(candidates.begin(), candidates.end(), isEarlier);
    int entry = mNodes[At(node)].entries;
    for (auto kept = candidates.rbegin(); kept != candidates.rend(); ++kept) {
        mEntries[At(entry)].segment = kept->segment;
        if (kept + 1 == candidates.rend()) mEntries[At(entry)].next = kNone;
        entry = mEntries[At(entry)].next;
    }
    mNodes[At(node)].entryCount = static_cast<int>(kKeptEntries);
}

void StrokeCells::MakeNode(int node, Square const& square) {
    if (!mNodes[At(node)].isChanged) return;
    mNodes[At(node)].isChanged = false;
    int const children = mNodes[At(node)].children;
    if (children != kNone) {
        for (int i = 0; i < 4; ++i) MakeNode(children + i, square.GetQuarter(i));
        return;
    }
    FreeCells(node);
    mCandidates.clear();
    for (int i = mNodes[At(node)].entries; i != kNone; i = mEntries[At(i)].next) {
        mCandidates.push_back({mEntries[At(i)].segment, 0, 0});
    }
    std::reverse(mCandidates.begin(), mCandidates.end());
    MakePart(node, square, 0);
}

// Appends those candidates from begin on that are relevant in the square to mCandidates.
void StrokeCells::MakePart(int node, Square const& square, std::size_t begin) {
    std::size_t const end = mCandidates.size();
    std::size_t best = end;
    for (std::size_t i = begin; i < end; ++i) {
        Candidate candidate = Judge(mCandidates[i].segment, square);
        if (IsOutside(candidate)) continue;
        candidate.most = FindMost(candidate, square);
        if (IsFull(candidate)) {
            mCandidates.resize(end);
            mCandidates.push_back(candidate);
            best = end;
            break;
        }
        mCandidates.push_back(candidate);
        if (candidate.most < mCandidates[best].most) best = mCandidates.size() - 1;
    }
    if (mCandidates.size() == end) return;
    Candidate const winner = mCandidates[best];
    auto const from = mCandidates.begin() + static_cast<std::ptrdiff_t>(end);
    mCandidates.erase(std::remove_if(from, mCandidates.end(),
                                     [&](Candidate const& candidate) {
                                         return candidate.segment != winner.segment &&
                                                IsBeaten(candidate, winner);
                                     }),
                      mCandidates.end());
    Collect(end);
    if (Thin() || square.side <= kLeastCellPixels * mScale.fine) {
        MakeCell(node, square);
    } else {
        for (int i = 0; i < 4; ++i) MakePart(node, square.GetQuarter(i), end);
    }
    mCandidates.resize(end);
}

// Collects the points of the candidates from begin on, which are sorted by number. Consecutive segments share
// a point.
void StrokeCells::Collect(std::size_t begin) {
    mPoints.clear();
    int last = -2;
    for (std::size_t i = begin; i < mCandidates.size(); ++i) {
        int const number = mCandidates[i].segment;
        StrokeSegment const& segment = mSegments[At(number)];
        if (mPoints.empty() || number != last + 1) mPoints.push_back({segment.a, false});
        mPoints.push_back({segment.b, true});
        last = number;
    }
}

// Drops points between others until the rest fits into a cell. Returns false if that is not possible.
bool StrokeCells::Thin() {
    while (mPoints.size() > kCellPoints) {
        std::size_t found = 0;
        double least = kLoose * mScale.fine;
        for (std::size_t i = 1; i + 1 < mPoints.size(); ++i) {
            if (!mPoints[i].isJoined || !mPoints[i + 1].isJoined) continue;
            StrokeNode const& node = mPoints[i].node;
            StrokeSegment const way{mPoints[i - 1].node, mPoints[i + 1].node};
            auto const [distance, radius] = way.FindCenter(node.x, node.y);
            double const width = 2 * way.GetGreatestRadius() / mScale.fine;
            double const off =
                std::max(distance, std::fabs(node.radius - radius)) * std::clamp(width, kThinnestStroke, 1.0);
            if (off >= least) continue;
            least = off;
            found = i;
        }
        if (found == 0) return false;
        mPoints.erase(mPoints.begin() + static_cast<std::ptrdiff_t>(found));
    }
    return true;
}

// Drops the farthest segments of a cell that has too many points and cannot be divided further.
void StrokeCells::KeepNearest(Square const& square) {
    double const x = square.x + square.side * 0.5;
    double const y = square.y + square.side * 0.5;
    while (mPoints.size() > kCellPoints) {
        std::size_t farthest = 0;
        double most = -std::numeric_limits<double>::infinity();
        for (std::size_t i = 1; i < mPoints.size(); ++i) {
            if (!mPoints[i].isJoined) continue;
            double const edge = StrokeSegment{mPoints[i - 1].node, mPoints[i].node}.GetEdge(x, y);
            if (edge <= most) continue;
            most = edge;
            farthest = i;
        }
        mPoints[farthest].isJoined = false;
        DropSinglePoints();
    }
}

// Drops points that no segment uses.
void StrokeCells::DropSinglePoints() {
    std::size_t kept = 0;
    for (std::size_t i = 0; i < mPoints.size(); ++i) {
        bool const leads = i + 1 < mPoints.size() && mPoints[i + 1].isJoined;
        if (mPoints[i].isJoined || leads) mPoints[kept++] = mPoints[i];
    }
    mPoints.resize(kept);
}

void StrokeCells::MakeCell(int node, Square const& square) {
    KeepNearest(square);
    StrokeCell& cell = mCells[At(TakeCell(node))];
    cell = {};
    cell.x = static_cast<float>(square.x);
    cell.y = static_cast<float>(square.y);
    cell.side = static_cast<float>(square.side);
    int bits = 0;
    for (std::size_t i = 0; i < mPoints.size(); ++i) {
        StrokeNode const& point = mPoints[i].node;
        cell.points[3 * i] = static_cast<float>(point.x - square.x);
        cell.points[3 * i + 1] = static_cast<float>(point.y - square.y);
        cell.points[3 * i + 2] = static_cast<float>(point.radius);
        if (!mPoints[i].isJoined) continue;
        bits |= (1 << i >> 1) | FindHalves(square, {mPoints[i - 1].node, point});
    }
    cell.segments = static_cast<float>(bits);
}

// Returns the triangles of the square that the segment, with its radius and fringe, may touch.
int StrokeCells::FindHalves(Square const& square, StrokeSegment const& segment) const {
    double const middle = square.x + square.y + square.side;
    double const a = segment.a.x + segment.a.y - middle;
    double const b = segment.b.x + segment.b.y - middle;
    double const reach = GetReach(segment, mScale) * 1.41422;
    return (std::min(a, b) < reach ? StrokeCell::kUpperLeft : 0) |
           (std::max(a, b) > -reach ? StrokeCell::kLowerRight : 0);
}

int StrokeCells::TakeCell(int node) {
    int taken = mFreeCell;
    if (taken == kNone) {
        mCells.emplace_back();
        mNextCell.push_back(kNone);
        taken = static_cast<int>(mCells.size()) - 1;
    } else {
        mFreeCell = mNextCell[At(taken)];
    }
    mNextCell[At(taken)] = mNodes[At(node)].cells;
    mNodes[At(node)].cells = taken;
    return taken;
}

} // namespace Moka::detail
