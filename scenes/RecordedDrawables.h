// RecordedDrawables.h: custom drawables of the library as operations of a scene.
#pragma once

#include "scenes/RecordedBitmaps.h"
#include "scenes/SceneLine.h"

#include <optional>

namespace Moka {

class IMKCustomDrawable;

} // namespace Moka

namespace Moka::Scenes {

// A line whose fields name the bitmaps as bitmaps has them. Nothing for a drawable that no scene can say.
class DrawableLine {
public:
    explicit DrawableLine(RecordedBitmaps& bitmaps) : mBitmaps(bitmaps) {}

    std::optional<SceneLine> Describe(IMKCustomDrawable& drawable);
    // Of the last one described: a bitmap is missing that it cannot do without.
    bool DrawsNothing() const { return mDrawsNothing; }
    // Why a bitmap could not be recorded; empty if all could.
    std::string const& GetReason() const { return mReason; }

private:
    void AddBitmap(SceneLine& line, char const* key, IMKBitmap* bitmap);

    RecordedBitmaps& mBitmaps;
    bool mDrawsNothing = false;
    std::string mReason;
};

} // namespace Moka::Scenes
