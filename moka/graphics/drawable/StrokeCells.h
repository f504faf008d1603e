// StrokeCells: divides the plane under a stroke into square cells. Each cell contains all segments that can
// cover one of its pixels: at most five segments with six points. Cells do not overlap, so each pixel is
// drawn once, with the maximum coverage of the segments of its cell.
// A quadtree holds the segments. A leaf with too many segments for one cell is drawn as several cells.
// Thread: render thread.
// Units:  canvas pixels.
// Fails:  throws bad_alloc; the object must then be discarded.
// Cost:   a segment lies in a bounded number of leaves. Where many segments overlap, leaves are divided until
//         one segment covers a leaf completely; the leaf then keeps only that one.
#pragma once

#include "moka/graphics/drawable/StrokeSegment.h"

#include <vector>

namespace Moka::detail {

struct StrokeCell {
    static constexpr int kPoints = 6;
    // Bits of segments: the triangles that contain a segment.
    static constexpr int kUpperLeft = 32;
    static constexpr int kLowerRight = 64;

    float x; // of the upper left corner
    float y;
    float side;                // 0: not in use
    float segments;            // bit i: the points i and i + 1 are joined
    float points[3 * kPoints]; // x and y relative to the corner, and the radius
};

class StrokeCells {
public:
    explicit StrokeCells(StrokeScale const& scale) : mScale(scale) {}

    // Adds a segment; the first one has number 0. TakeBackLast removes the last one if mayBeTakenBack was
    // true.
    void Add(StrokeSegment const& segment, bool mayBeTakenBack);
    void TakeBackLast();
    // Removes all segments and keeps their memory.
    void Clear();

    // Updates and returns the cells.
    std::vector<StrokeCell> const& Make();

private:
    static constexpr int kNone = -1;

    struct Node {
        int children = kNone; // the first of four
        int entries = kNone;
        int cells = kNone;
        int entryCount = 0;
        bool isFull = false; // completely covered by its only segment
        bool isChanged = false;
    };
    struct Entry {
        int segment;
        int next;
    };
    // The area of a node.
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
        double least; // lower bound of the distance from the segment's edge to the square; negative inside
        double most;  // upper bound
    };

    struct Point {
        StrokeNode node;
        bool isJoined; // a segment joins it to the point before
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
    std::vector<int> mNextCell; // the next cell of the same node, or the next free one
    int mFreeCell = kNone;
    std::vector<Candidate> mCandidates; // used while cells are created or entries are limited
    std::vector<Point> mPoints;         // of the cell that is being created
};

} // namespace Moka::detail
