/// MKBitmapChecker: a bitmap that forwards every call to another one while it is referenced, and throws
/// "Bitmap was already released!!" afterwards. Owner, Thread, Fails: see Checker.h.
/// The capabilities and clones that it returns belong to the wrapped bitmap and are not checked.
#pragma once

#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/debug/Checker.h"

namespace Moka {

class MOKA_API MKBitmapChecker final : public detail::Checker<IMKBitmap> {
public:
    explicit MKBitmapChecker(IMKBitmap* bitmap); ///< not null, not owned
    ~MKBitmapChecker() override;

    /// Forward while referenced.
    unsigned int GetPixel(Point const& p) override { return Checked().GetPixel(p); }
    void GetPixelAsync(Point const& p, void* userData, PixelCallback callback) override {
        Checked().GetPixelAsync(p, userData, callback);
    }
    void GetBitmapData(Rect const& r, void* destination) override { Checked().GetBitmapData(r, destination); }
    void GetBitmapDataAsync(Rect const& r, void* destination, void* userData,
                            DataCallback callback) override {
        Checked().GetBitmapDataAsync(r, destination, userData, callback);
    }

    /// Forward while referenced.
    int GetX() const override { return Checked().GetX(); }
    int GetY() const override { return Checked().GetY(); }
    int GetWidth() const override { return Checked().GetWidth(); }
    int GetHeight() const override { return Checked().GetHeight(); }
    Rect GetBitmapRect() override { return Checked().GetBitmapRect(); }

    char const* GetTag() override { return Checked().GetTag(); } ///< the bitmap's own tag
    IMKBitmap* Clone() override { return Checked().Clone(); }

    /// Forward while referenced.
    IMKBitmapReadable* GetBitmapReadable() override { return Checked().GetBitmapReadable(); }
    IMKBitmapWritable* GetBitmapWritable() override { return Checked().GetBitmapWritable(); }
    IMKBitmapCanvasAttachable* GetBitmapCanvasAttachable() override {
        return Checked().GetBitmapCanvasAttachable();
    }
    IMKTextureBitmap* GetTextureBitmap() override { return Checked().GetTextureBitmap(); }
};

} // namespace Moka
