// RecordedDrawables.h: records custom drawables of the library as operations of a scene.
#pragma once

#include "scenes/RecordedBitmaps.h"
#include "scenes/SceneLine.h"

#include <optional>

namespace Moka {

class IMKCustomDrawable;

} // namespace Moka

namespace Moka::Scenes {

// Describes a drawable as a line of a scene, with the bitmap names of RecordedBitmaps. Returns nothing for a
// drawable that the scene format does not have.
class DrawableLine {
public:
    explicit DrawableLine(RecordedBitmaps& bitmaps) : mBitmaps(bitmaps) {}

    std::optional<SceneLine> Describe(IMKCustomDrawable& drawable);
    // True if the last drawable draws nothing, because a bitmap is missing.
    bool DrawsNothing() const { return mDrawsNothing; }
    // Why a bitmap could not be recorded; empty if all were.
    std::string const& GetReason() const { return mReason; }

private:
    void AddBitmap(SceneLine& line, char const* key, IMKBitmap* bitmap);

    RecordedBitmaps& mBitmaps;
    bool mDrawsNothing = false;
    std::string mReason;
};

} // namespace Moka::Scenes
