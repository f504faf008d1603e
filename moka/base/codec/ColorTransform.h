// ColorTransform: converts decoded pixels to sRGB, with Little CMS, as the colour profile of their file says.
// Without a profile, and with one whose colours are sRGB's to within one level, it changes no byte.
// Units:  four bytes a pixel, alpha straight. 8 bits a channel, perceptual intent.
// Thread: one at a time; two objects may work side by side.
// Fails:  a profile that is damaged, of another colour space than the pixels, or no profile of a device: false
//         and the reason; pixels then stay as they are.
#pragma once

#include "moka/base/codec/ImageSource.h"

#include <memory>
#include <string>

namespace Moka::detail {

enum class PixelKind {
    Grey,      // red, green and blue are equal; takes a grey profile as well as one of RGB
    Rgb,       //
    CmykInk,   // 255 is full ink
    CmykLight, // 255 is no ink
};

// CIE x and y.
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

    // From an ICC profile.
    bool Open(ByteSpan profile, PixelKind kind, std::string& reason);
    // From primaries, and from the exponent that encodes light: 0.45455 for most displays, 0 for sRGB's curve.
    bool Open(Chromaticities const& primaries, double gamma, std::string& reason);

    // Whether Apply does anything. Always so for CMYK once a profile was opened.
    explicit operator bool() const { return mTransform != nullptr; }

    // In place. The fourth byte stays, that of CMYK becomes 255.
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

    std::string mError; // Little CMS's last
    std::unique_ptr<void, ContextDeleter> mContext;
    std::unique_ptr<void, TransformDeleter> mTransform;
    bool mIsCmyk = false;
};

// The name that an ICC profile has for people; "unnamed" or "damaged" where there is none.
std::string GetProfileName(ByteSpan profile);

} // namespace Moka::detail
