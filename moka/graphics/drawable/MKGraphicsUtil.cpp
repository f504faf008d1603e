#include "moka/graphics/drawable/MKGraphicsUtil.h"

#include "moka/graphics/bitmap/IMKBitmapReadable.h"

#include <array>
#include <iterator>
#include <utility>

namespace Moka {
namespace {

using F = BlendingFactor;

struct Factors {
    F source;
    F destination;
    F sourceAlpha;
    F destinationAlpha;
};

constexpr Factors kSrcOver = {F::One, F::OneMinusSrcAlpha, F::One, F::OneMinusSrcAlpha};

// The factors of colour source and destination, and of alpha source and destination, for each transfer mode
// that blends.
constexpr Factors kFactors[] = {
    {F::One, F::One, F::One, F::One},                             // Add
    {F::Zero, F::Zero, F::Zero, F::Zero},                         // Clear
    {F::Zero, F::One, F::Zero, F::One},                           // Dst
    {F::OneMinusDstAlpha, F::SrcAlpha, F::One, F::Zero},          // DstAtop
    {F::Zero, F::SrcAlpha, F::Zero, F::SrcAlpha},                 // DstIn
    {F::Zero, F::OneMinusSrcAlpha, F::Zero, F::OneMinusSrcAlpha}, // DstOut
    // DstOver: the alpha factors differ from the colour factors. // Compat: dst-over-alpha
    {F::OneMinusDstAlpha, F::One, F::OneMinusSrcAlpha, F::One},
    {F::Zero, F::SrcColor, F::Zero, F::SrcAlpha},                    // Modulate
    {F::One, F::Zero, F::One, F::Zero},                              // Src
    {F::DstAlpha, F::OneMinusSrcAlpha, F::Zero, F::One},             // SrcAtop
    {F::DstAlpha, F::Zero, F::DstAlpha, F::Zero},                    // SrcIn
    {F::OneMinusDstAlpha, F::Zero, F::OneMinusDstAlpha, F::Zero},    // SrcOut
    kSrcOver,                                                        // SrcOver
    {F::One, F::Zero, F::Zero, F::One},                              // SrcKeepDstAlpha
    {F::SrcAlpha, F::Zero, F::One, F::Zero},                         // SrcNonPremultiplied
    {F::SrcAlpha, F::OneMinusSrcAlpha, F::One, F::OneMinusSrcAlpha}, // SrcOverNonPremultiplied
    {F::One, F::Zero, F::One, F::Zero},                              // Darken
    {F::One, F::Zero, F::One, F::Zero},                              // Lighten
};
static_assert(std::size(kFactors) == MKPaint::BlendingOff);

void SetWrap(IMKBitmapReadable* bitmap, TextureParamWrapping axis, MKPaint::TileMode mode) {
    switch (mode) {
    case MKPaint::Default:
    case MKPaint::Clamp:
        return bitmap->SetTextureWrapRT(axis, TextureWrapClampToEdge, false);
    case MKPaint::Mirror:
        return bitmap->SetTextureWrapRT(axis, TextureWrapMirroredRepeat, false);
    case MKPaint::Repeat:
        return bitmap->SetTextureWrapRT(axis, TextureWrapRepeat, false);
    }
}

constexpr int kModes = MKPaint::BlendingOff + 1;

constexpr BlendStateDescriptor MakeDescriptor(Factors const& factors) {
    BlendStateDescriptor descriptor(true);
    descriptor.SetColorEquation(BlendingFunction::Add, factors.source, factors.destination);
    descriptor.SetAlphaEquation(BlendingFunction::Add, factors.sourceAlpha, factors.destinationAlpha);
    return descriptor;
}

// The descriptors are constants, because every draw needs one.
template <std::size_t... kMode>
constexpr std::array<BlendStateDescriptor, kModes> MakeDescriptors(std::index_sequence<kMode...>) {
    BlendStateDescriptor off(true);
    off.SetEnabled(false, true);
    return {MakeDescriptor(kFactors[kMode])..., off};
}

constexpr std::array<BlendStateDescriptor, kModes> kDescriptors =
    MakeDescriptors(std::make_index_sequence<MKPaint::BlendingOff>());

} // namespace

BlendStateDescriptor MKGraphicsUtil::GetBlendingStateDescriptor(MKPaint::XFermode mode) {
    bool const isKnown = mode >= 0 && mode < kModes;
    return kDescriptors[static_cast<std::size_t>(isKnown ? mode : MKPaint::SrcOver)];
}

void MKGraphicsUtil::SetTileModeRT(IMKBitmapReadable* bitmap, MKPaint const& paint) {
    SetWrap(bitmap, TextureParamWrappingS, paint.GetTileModeX());
    SetWrap(bitmap, TextureParamWrappingT, paint.GetTileModeY());
}

} // namespace Moka
