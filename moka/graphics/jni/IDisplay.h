/// IDisplay: gives native code the properties of the screen that Java has set. Sizes are in pixels. Densities
/// are factors, except those named dpi. The vtable order is ABI.
#pragma once

namespace Moka {

class IDisplay {
public:
    /// Numbers from Java. Java defines their meaning.
    enum class LayoutDirection : int {};
    enum class Orientation : int {};
    enum class ScreenOrientation : int {};

    virtual ~IDisplay() = default;

    /// The debug level, and the screen's size.
    virtual int GetDebugLevel() const = 0;
    virtual int GetWidthPixels() const = 0;
    virtual int GetHeightPixels() const = 0;
    /// The application's own area.
    virtual int GetLocalWidthPixels() const = 0;
    virtual int GetLocalHeightPixels() const = 0;
    virtual float GetSystemDensity() const = 0;
    virtual float GetDensity() const = 0;
    virtual float GetScaledDensity() const = 0; ///< for fonts
    virtual int GetDensityDpi() const = 0;
    virtual float GetXdpi() const = 0;
    virtual float GetYdpi() const = 0;
    virtual LayoutDirection GetLayoutDirection() const = 0;
    virtual Orientation GetOrientation() const = 0;
    virtual ScreenOrientation GetScreenOrientation() const = 0;
    /// True if the shorter side of the application's area, divided by the system density, is at least 512.
    virtual bool IsTabletUX() const = 0;
    virtual bool IsTablet() const = 0;
    virtual bool IsUWP() const = 0;
    virtual long long GetAppVsyncOffsetNanos() const = 0;
};

} // namespace Moka
