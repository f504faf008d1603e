// ColorTransform: converts decoded pixels to sRGB by the colour profile of their file, with Little CMS.
// Without a profile, or with one that differs from sRGB by at most one level, it does not change the pixels.
// Units:  four bytes a pixel, straight alpha, 8 bits a channel, perceptual intent.
// Thread: one at a time; different objects may be used on different threads.
// Fails:  if a profile is damaged, has another colour space than the pixels, or is not a device profile, Open
//         returns false and the reason. Apply then does nothing.
#pragma once

#include "moka/base/codec/ImageSource.h"

#include <memory>
#include <string>

namespace Moka::detail {

enum class PixelKind {
    Grey,      // red, green and blue are equal; the profile may be a grey or an RGB profile
    Rgb,       //
    CmykInk,   // 255 is full ink
    CmykLight, // 255 is no ink
};

// CIE x and y coordinates.
struct Chromaticities {
    double white[2];
    double red[2];
    double green[2];
    double blue[2];
};

class ColorTransform : NonAssignable {
public:
    ColorTransform();
    ~ColorTransform();

    // Uses an ICC profile.
    bool Open(ByteSpan profile, PixelKind kind, std::string& reason);
    // Uses primaries and the encoding exponent: 0.45455 for most displays, 0 for the curve of sRGB.
    bool Open(Chromaticities const& primaries, double gamma, std::string& reason);

    // True if Apply changes pixels. Always true for CMYK after a profile was opened.
    explicit operator bool() const { return mTransform != nullptr; }

    // Converts in place. The fourth byte is not changed, except that of CMYK, which becomes 255.
    void Apply(unsigned char* pixels, std::size_t count) const;

private:
    struct ContextDeleter {
        void operator()(void* context) const;
    };
    struct TransformDeleter {
        void operator()(void* transform) const;
    };

    bool OpenContext(std::string& reason);
    bool Create(void* profile, PixelKind kind, std::string& reason);
    bool IsIdentity(PixelKind kind) const;

    std::string mError; // the last message of Little CMS
    std::unique_ptr<void, ContextDeleter> mContext;
    std::unique_ptr<void, TransformDeleter> mTransform;
    bool mIsCmyk = false;
};

// Returns the description of an ICC profile; "unnamed" or "damaged" if there is none.
std::string GetProfileName(ByteSpan profile);

} // namespace Moka::detail
