#include "moka/base/codec/ColorTransform.h"

#include <algorithm>
#include <cstdlib>
#include <lcms2.h>

namespace Moka::detail {
namespace {

// The largest profiles in use, for printing presses, have about 3 MiB.
constexpr std::size_t kMaxProfileBytes = std::size_t{16} << 20;

// Steps between the levels of each channel at which a profile is compared with sRGB.
constexpr int kSampleStep = 15;

struct ProfileCloser {
    void operator()(void* profile) const { cmsCloseProfile(profile); }
};
using Profile = std::unique_ptr<void, ProfileCloser>;

struct CurveDeleter {
    void operator()(cmsToneCurve* curve) const { cmsFreeToneCurve(curve); }
};
using Curve = std::unique_ptr<cmsToneCurve, CurveDeleter>;

void OnError(cmsContext context, cmsUInt32Number, char const* text) {
    static_cast<std::string*>(cmsGetContextUserData(context))->assign(text);
}

cmsContext ToContext(void* context) { return static_cast<cmsContext>(context); }

bool Refuse(std::string& reason, std::string const& text) {
    reason = text;
    return false;
}

Profile OpenProfile(cmsContext context, ByteSpan bytes) {
    return Profile(cmsOpenProfileFromMemTHR(context, bytes.data, static_cast<cmsUInt32Number>(bytes.size)));
}

// True for profiles that define the colours of a file's pixels. Device links, abstract and named colour
// profiles do not.
bool IsOfDevice(cmsHPROFILE profile) {
    // Converted to a number, as the colour space below, because a file may contain values that are not in the
    // enumerations.
    switch (static_cast<cmsUInt32Number>(cmsGetDeviceClass(profile))) {
    case cmsSigInputClass:
    case cmsSigDisplayClass:
    case cmsSigOutputClass:
    case cmsSigColorSpaceClass:
        return true;
    default:
        return false;
    }
}

// Returns 0 if the profile is not for pixels of this kind.
cmsUInt32Number ChooseFormat(cmsUInt32Number space, PixelKind kind) {
    constexpr cmsUInt32Number kGreyAndThree =
        COLORSPACE_SH(PT_GRAY) | EXTRA_SH(3) | CHANNELS_SH(1) | BYTES_SH(1);
    switch (kind) {
    case PixelKind::Grey:
        if (space == cmsSigGrayData) return kGreyAndThree;
        [[fallthrough]];
    case PixelKind::Rgb:
        return space == cmsSigRgbData ? TYPE_RGBA_8 : 0;
    case PixelKind::CmykInk:
        return space == cmsSigCmykData ? TYPE_CMYK_8 : 0;
    case PixelKind::CmykLight:
        return space == cmsSigCmykData ? TYPE_CMYK_8_REV : 0;
    }
    return 0;
}

Curve MakeSrgbCurve(cmsContext context) {
    cmsFloat64Number const parameters[] = {2.4, 1 / 1.055, 0.055 / 1.055, 1 / 12.92, 0.04045};
    return Curve(cmsBuildParametricToneCurve(context, 4, parameters));
}

cmsCIExyY ToXyY(double const (&xy)[2]) { return {xy[0], xy[1], 1}; }

} // namespace

ColorTransform::ColorTransform() = default;
ColorTransform::~ColorTransform() = default;

void ColorTransform::ContextDeleter::operator()(void* context) const { cmsDeleteContext(ToContext(context)); }

void ColorTransform::TransformDeleter::operator()(void* transform) const { cmsDeleteTransform(transform); }

bool ColorTransform::OpenContext(std::string& reason) {
    mContext.reset(cmsCreateContext(nullptr, &mError));
    if (!mContext) return Refuse(reason, "not enough memory");
    cmsSetLogErrorHandlerTHR(ToContext(mContext.get()), OnError);
    return true;
}

bool ColorTransform::Open(ByteSpan bytes, PixelKind kind, std::string& reason) {
    if (bytes.size > kMaxProfileBytes) return Refuse(reason, "it is larger than 16 MiB");
    if (!OpenContext(reason)) return false;
    Profile const profile = OpenProfile(ToContext(mContext.get()), bytes);
    if (!profile) return Refuse(reason, "it is damaged");
    if (!IsOfDevice(profile.get())) return Refuse(reason, "it is not a device profile");
    return Create(profile.get(), kind, reason);
}

bool ColorTransform::Open(Chromaticities const& primaries, double gamma, std::string& reason) {
    if (!OpenContext(reason)) return false;
    cmsContext const context = ToContext(mContext.get());
    Curve const curve = gamma > 0 ? Curve(cmsBuildGamma(context, 1 / gamma)) : MakeSrgbCurve(context);
    if (!curve) return Refuse(reason, "not enough memory");
    cmsToneCurve* const curves[] = {curve.get(), curve.get(), curve.get()};
    cmsCIExyY const white = ToXyY(primaries.white);
    cmsCIExyYTRIPLE const triple = {ToXyY(primaries.red), ToXyY(primaries.green), ToXyY(primaries.blue)};
    Profile const profile(cmsCreateRGBProfileTHR(context, &white, &triple, curves));
    return profile ? Create(profile.get(), PixelKind::Rgb, reason)
                   : Refuse(reason, "its primaries span no colours");
}

bool ColorTransform::Create(void* profile, PixelKind kind, std::string& reason) {
    cmsContext const context = ToContext(mContext.get());
    cmsUInt32Number const format =
        ChooseFormat(static_cast<cmsUInt32Number>(cmsGetColorSpace(profile)), kind);
    if (format == 0) return Refuse(reason, "it is for another kind of colours than the pixels");
    mIsCmyk = kind == PixelKind::CmykInk || kind == PixelKind::CmykLight;
    Profile const target(cmsCreate_sRGBProfileTHR(context));
    mError.clear();
    if (target)
        mTransform.reset(
            cmsCreateTransformTHR(context, profile, format, target.get(), TYPE_RGBA_8, INTENT_PERCEPTUAL, 0));
    if (!mTransform) return Refuse(reason, mError.empty() ? "not enough memory" : mError);
    if (!mIsCmyk && IsIdentity(kind)) mTransform.reset();
    return true;
}

bool ColorTransform::IsIdentity(PixelKind kind) const {
    auto const isKept = [this](int red, int green, int blue) {
        int const colors[] = {red, green, blue};
        unsigned char pixel[4] = {};
        std::copy_n(colors, 3, pixel);
        Apply(pixel, 1);
        return std::equal(colors, colors + 3, pixel, [](int a, int b) { return std::abs(a - b) <= 1; });
    };
    for (int grey = 0; grey < 256; ++grey)
        if (!isKept(grey, grey, grey)) return false;
    if (kind == PixelKind::Grey) return true;
    for (int red = 0; red < 256; red += kSampleStep)
        for (int green = 0; green < 256; green += kSampleStep)
            for (int blue = 0; blue < 256; blue += kSampleStep)
                if (!isKept(red, green, blue)) return false;
    return true;
}

// Converts in place, so a fourth byte that is not a colour is not changed.
void ColorTransform::Apply(unsigned char* pixels, std::size_t count) const {
    cmsDoTransform(mTransform.get(), pixels, pixels, static_cast<cmsUInt32Number>(count));
    if (!mIsCmyk) return;
    for (std::size_t i = 0; i < count; ++i) pixels[4 * i + 3] = 255;
}

std::string GetProfileName(ByteSpan bytes) {
    constexpr std::size_t kLongest = 100;
    if (bytes.size > kMaxProfileBytes) return "damaged";
    Profile const profile = OpenProfile(nullptr, bytes);
    if (!profile) return "damaged";
    char name[kLongest] = "";
    cmsGetProfileInfoASCII(profile.get(), cmsInfoDescription, "en", "US", name, sizeof(name));
    name[kLongest - 1] = '\0';
    return name[0] != '\0' ? name : "unnamed";
}

} // namespace Moka::detail
