// PenPath: converts the reported positions of a pen to a stroke: a centripetal Catmull-Rom curve, which has no loops and
// no cusps between two positions, in steps of about 2.5 pixels. Pressure or speed determines the width.
// A segment is settled when the position after it is known; until then it belongs to the tail.
// Units: page pixels; milliseconds.
#pragma once

#include "apps/notebook/Ink.h"

#include <cstdint>

namespace Moka::Notebook {

class PenPath {
public:
    // A plain path has a constant width.
    PenPath(float width, bool isPlain) : mBase(width), mIsPlain(isPlain) {}

    // Pressure is 0 to 1, or negative if it is unknown.
    void Add(float x, float y, std::uint32_t time, float pressure);

    // Later calls of Add only append points.
    InkPoints const& GetSettled() const { return mSettled; }
    // Returns the curve from the last settled point to the last position, and on to the position predicted `ahead`
    // milliseconds later from the pen's speed.
    InkPoints GetTail(float ahead) const;
    // Returns the whole stroke. Call this when the pen is up.
    InkPoints Finish() const;

private:
    struct Position {
        float x;
        float y;
        float width;
        std::uint32_t time;
    };

    float GetWidth(float distance, std::uint32_t milliseconds, float pressure) const;
    static void AddCurve(Position const (&p)[4], InkPoints& to);

    float const mBase;
    bool const mIsPlain;
    Position mLast[3]{}; // the newest last
    int mCount = 0;
    float mSpeedX = 0; // pixels a millisecond, smoothed
    float mSpeedY = 0;
    InkPoints mSettled;
};

} // namespace Moka::Notebook
