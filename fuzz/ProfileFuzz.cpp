// Opens bytes as a colour profile, converts pixels with it where that succeeds, and asks for its name. The first
// byte chooses the kind of pixels. Alpha must stay, and inks must become opaque.
#include "fuzz/FuzzInput.h"
#include "moka/base/codec/ColorTransform.h"

#include <cstring>

using Moka::detail::ColorTransform;
using Moka::detail::PixelKind;
using Moka::Fuzz::Require;

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    if (size == 0) return 0;
    constexpr PixelKind kKinds[] = {PixelKind::Rgb, PixelKind::Grey, PixelKind::CmykInk,
                                    PixelKind::CmykLight};
    PixelKind const kind = kKinds[data[0] % 4];
    bool const isCmyk = kind == PixelKind::CmykInk || kind == PixelKind::CmykLight;
    Moka::detail::ByteSpan const profile{data + 1, size - 1};
    ColorTransform colors;
    std::string reason;
    bool const isOpen = colors.Open(profile, kind, reason);
    Require(isOpen == reason.empty(), "a refusal without its reason, or a reason without a refusal");
    Require(isOpen || !colors, "a refused profile converts");
    if (colors) {
        unsigned char pixels[256 * 4];
        for (int i = 0; i < 256 * 4; ++i) pixels[i] = static_cast<unsigned char>(i * 37);
        colors.Apply(pixels, 256);
        for (int i = 3; i < 256 * 4; i += 4)
            Require(pixels[i] == (isCmyk ? 255 : static_cast<unsigned char>(i * 37)), "alpha is lost");
    }
    Require(!GetProfileName(profile).empty(), "a profile without a name");
    return 0;
}
