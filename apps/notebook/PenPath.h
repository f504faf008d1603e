// PenPath: makes a stroke of a pen's reported positions: a centripetal Catmull-Rom curve through them, which has
// no loops and no cusps between two positions, in steps of about 2.5 pixels, with a width from pressure or speed.
// A segment is settled once the position after it is known; until then the tail stands for it.
// Units: page pixels; milliseconds.
#pragma once

#include "apps/notebook/Ink.h"

#include <cstdint>

namespace Moka::Notebook {

class PenPath {
public:
    // A plain path has the same width everywhere.
    PenPath(float width, bool isPlain) : mBase(width), mIsPlain(isPlain) {}

    // Pressure is 0 ... 1, or negative where nothing is known of it.
    void Add(float x, float y, std::uint32_t time, float pressure);

    // Only ever appended to.
    InkPoints const& GetSettled() const { return mSettled; }
    // From the last settled point to the last position, and on to where the pen will be `ahead` milliseconds
    // later if it goes on as it went.
    InkPoints GetTail(float ahead) const;
    // The whole stroke, once the pen is up.
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
