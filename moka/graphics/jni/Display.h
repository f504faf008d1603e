/// Display: the native part of a Java MokaDisplay, which holds this object's address as its handle.
/// Owner:  the creator; a Java MokaDisplay owns the one that it created.
/// Thread: not synchronised.
#pragma once

#include "moka/base/Export.h"
#include "moka/graphics/jni/IDisplay.h"

namespace Moka {

class MOKA_API Display : public IDisplay {
public:
    /// Stores the values; see IDisplay.
    Display(int widthPixels, int heightPixels, float systemDensity, int localWidthPixels,
            int localHeightPixels, float density, float scaledDensity, int densityDpi, float xdpi, float ydpi,
            LayoutDirection layoutDirection, Orientation orientation, ScreenOrientation screenOrientation,
            bool isTablet, bool isUWP, long long appVsyncOffsetNanos);
    ~Display() override;

    /// See IDisplay.
    int GetDebugLevel() const override { return mDebugLevel; }
    int GetWidthPixels() const override { return mWidthPixels; }
    int GetHeightPixels() const override { return mHeightPixels; }
    int GetLocalWidthPixels() const override { return mLocalWidthPixels; }
    int GetLocalHeightPixels() const override { return mLocalHeightPixels; }
    float GetSystemDensity() const override { return mSystemDensity; }
    float GetDensity() const override { return mDensity; }
    float GetScaledDensity() const override { return mScaledDensity; }
    int GetDensityDpi() const override { return mDensityDpi; }
    float GetXdpi() const override { return mXdpi; }
    float GetYdpi() const override { return mYdpi; }
    LayoutDirection GetLayoutDirection() const override { return mLayoutDirection; }
    Orientation GetOrientation() const override { return mOrientation; }
    ScreenOrientation GetScreenOrientation() const override { return mScreenOrientation; }
    bool IsTabletUX() const override { return mIsTabletUX; }
    bool IsTablet() const override { return mIsTablet; }
    bool IsUWP() const override { return mIsUWP; }
    long long GetAppVsyncOffsetNanos() const override { return mAppVsyncOffsetNanos; }

    /// Copies the values that source's getters return, except the dots per inch and IsTablet. A null source
    /// changes nothing.
    // Compat: display-copy
    void Copy(Display const* source);
    void UpdateScreenOrientation(ScreenOrientation orientation) { mScreenOrientation = orientation; }
    void SetDebugLevel(int level) { mDebugLevel = level; }

private:
    bool ComputeIsTabletUX() const;

    int mWidthPixels;
    int mHeightPixels;
    float mSystemDensity;
    int mLocalWidthPixels;
    int mLocalHeightPixels;
    float mDensity;
    float mScaledDensity;
    int mDensityDpi;
    float mXdpi;
    float mYdpi;
    LayoutDirection mLayoutDirection;
    Orientation mOrientation;
    ScreenOrientation mScreenOrientation;
    bool mIsTablet;
    bool mIsUWP;
    long long mAppVsyncOffsetNanos;
    bool mIsTabletUX;
    int mDebugLevel = 0;
};

} // namespace Moka
