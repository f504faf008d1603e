#include "moka/graphics/jni/Display.h"

#include <algorithm>

namespace Moka {
namespace {

constexpr float kTabletSide = 512.0f;

} // namespace

Display::Display(int widthPixels, int heightPixels, float systemDensity, int localWidthPixels,
                 int localHeightPixels, float density, float scaledDensity, int densityDpi, float xdpi,
                 float ydpi, LayoutDirection layoutDirection, Orientation orientation,
                 ScreenOrientation screenOrientation, bool isTablet, bool isUWP,
                 long long appVsyncOffsetNanos)
    : mWidthPixels(widthPixels),
      mHeightPixels(heightPixels),
      mSystemDensity(systemDensity),
      mLocalWidthPixels(localWidthPixels),
      mLocalHeightPixels(localHeightPixels),
      mDensity(density),
      mScaledDensity(scaledDensity),
      mDensityDpi(densityDpi),
      mXdpi(xdpi),
      mYdpi(ydpi),
      mLayoutDirection(layoutDirection),
      mOrientation(orientation),
      mScreenOrientation(screenOrientation),
      mIsTablet(isTablet),
      mIsUWP(isUWP),
      mAppVsyncOffsetNanos(appVsyncOffsetNanos),
      mIsTabletUX(ComputeIsTabletUX()) {}

Display::~Display() = default;

void Display::Copy(Display const* source) {
    if (!source) return;
    // Calls the virtual getters, in this order, because a derived class may compute the values.
    mWidthPixels = source->GetWidthPixels();
    mHeightPixels = source->GetHeightPixels();
    mSystemDensity = source->GetSystemDensity();
    mLocalWidthPixels = source->GetLocalWidthPixels();
    mLocalHeightPixels = source->GetLocalHeightPixels();
    mDensity = source->GetDensity();
    mScaledDensity = source->GetScaledDensity();
    mXdpi = source->GetXdpi();
    mYdpi = source->GetYdpi();
    mLayoutDirection = source->GetLayoutDirection();
    mOrientation = source->GetOrientation();
    mScreenOrientation = source->GetScreenOrientation();
    mIsTabletUX = ComputeIsTabletUX();
    mIsUWP = source->IsUWP();
    mDebugLevel = source->GetDebugLevel();
    mAppVsyncOffsetNanos = source->GetAppVsyncOffsetNanos();
}

// Compat: tablet-density
bool Display::ComputeIsTabletUX() const {
    return static_cast<float>(std::min(mLocalWidthPixels, mLocalHeightPixels)) / mSystemDensity >=
           kTabletSide;
}

} // namespace Moka
