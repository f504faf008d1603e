// StrokeCells: divides the plane under a stroke into squares, cells, so that each knows all segments that can
// cover a pixel in it: at most five, of six points. Cells do not overlap; so a pixel is drawn once, and its
// coverage is the maximum over the segments of its cell.
// A quadtree takes the segments; a leaf whose segments are too many for one cell is drawn as several.
// Thread: render thread.
// Units:  canvas pixels.
// Fails:  bad_alloc; the cells are useless then.
// Cost:   a segment lies in a bounded number of leaves. Where many overlap, leaves become smaller, until a
//         segment covers them whole and they keep that one only.
#pragma once

#include "moka/graphics/drawable/StrokeSegment.h"

#include <vector>

namespace Moka::detail {

struct StrokeCell {
    static constexpr int kPoints = 6;
    // Of segments: the triangles that are not empty.
    static constexpr int kUpperLeft = 32;
    static constexpr int kLowerRight = 64;

    float x; // of the left upper corner
    float y;
    float side;                // 0: not in use
    float segments;            // bit i: the points i and i + 1 are joined
    float points[3 * kPoints]; // x and y from the corner on, radius
};

class StrokeCells {
public:
    explicit StrokeCells(StrokeScale const& scale) : mScale(scale) {}

    // Of the segments, which are numbered from 0 on, the last one may be taken back.
    void Add(StrokeSegment const& segment, bool mayBeTakenBack);
    void TakeBackLast();
    // Takes back all; keeps the memory.
    void Clear();

    // Brings the cells up to date with the segments.
    std::vector<StrokeCell> const& Make();

private:
    static constexpr int kNone = -1;

    struct Node {
        int children = kNone; // the first of four
        int entries = kNone;
        int cells = kNone;
        int entryCount = 0;
        bool isFull = false; // covered by the one segment that it has
        bool isChanged = false;
    };
    struct Entry {
        int segment;
        int next;
    };
    // Of a node: where it lies.
    struct Square {
        double x;
        double y;
        double side;

        Square GetQuarter(int index) const {
            double const half = side * 0.5;
            return {x + (index & 1 ? half : 0), y + (index & 2 ? half : 0), half};
        }
    };
    struct Candidate {
        int segment;
        double least; // at least so far all of the square lies outside of the segment's edge
        double most;  // at most; negative inside
    };

    struct Point {
        StrokeNode node;
        bool isJoined; // to the one before
    };

    Candidate Judge(int segment, Square const& square) const;
    double FindMost(Candidate const& candidate, Square const& square) const;
    bool IsOutside(Candidate const& candidate) const;
    bool IsFull(Candidate const& candidate) const;
    bool IsBeaten(Candidate const& candidate, Candidate const& best) const;

    void GrowRoot(StrokeSegment const& segment);
    void Insert(int node, Square const& square, int segment, double target);
    void AddEntry(int node, int segment);
    void Split(int node, Square const& square, double target);
    void Fill(int node, int segment);
    void Remove(int node, Square const& square, int segment);
    void FreeCells(int node);
    void FreeCellsBelow(int node);
    void LimitEntries(int node, Square const& square);

    void MakeNode(int node, Square const& square);
    void MakePart(int node, Square const& square, std::size_t begin);
    void Collect(std::size_t begin);
    bool Thin();
    void KeepNearest(Square const& square);
    void DropSinglePoints();
    void MakeCell(int node, Square const& square);
    int FindHalves(Square const& square, StrokeSegment const& segment) const;
    int TakeCell(int node);

    StrokeScale const mScale;
    std::vector<StrokeSegment> mSegments;
    bool mMayTakeBack = false;
    Square mRoot{0, 0, 0};
    std::vector<Node> mNodes;
    std::vector<Entry> mEntries;
    std::vector<StrokeCell> mCells;
    std::vector<int> mNextCell; // of the same node, or free
    int mFreeCell = kNone;
    std::vector<Candidate> mCandidates; // while cells are made, or entries limited
    std::vector<Point> mPoints;         // of the cell that is made
};

} // namespace Moka::detail
