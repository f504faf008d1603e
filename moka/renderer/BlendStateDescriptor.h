/// BlendStateDescriptor: the blend state and the colour mask, as a value.
/// The default equations have the factors One and Zero: the source replaces the destination.
#pragma once

#include "moka/base/SameBits.h"

namespace Moka {

/// One byte each: a descriptor is compared and copied for every draw.
enum class BlendingFactor : unsigned char {
    Zero,
    One,
    SrcColor,
    SrcAlpha,
    OneMinusSrcAlpha,
    DstAlpha,
    OneMinusDstAlpha,
};

/// How the products are combined.
enum class BlendingFunction : unsigned char { Add };

class BlendStateDescriptor {
public:
    /// source * sourceFactor (function) destination * destinationFactor
    struct Equation {
        /// The function and its factors.
        BlendingFunction function = BlendingFunction::Add;
        BlendingFactor source = BlendingFactor::One;
        BlendingFactor destination = BlendingFactor::Zero;

        /// Compares all values.
        friend bool operator==(Equation const& a, Equation const& b) {
            return a.function == b.function && a.source == b.source && a.destination == b.destination;
        }
    };

    /// True: blends and writes colour. False: does neither.
    explicit constexpr BlendStateDescriptor(bool enabled) : mBlending(enabled), mColorWrite(enabled) {}

    /// Switches blending and colour writes separately.
    constexpr void SetEnabled(bool blending, bool colorWrite) {
        mBlending = blending;
        mColorWrite = colorWrite;
    }
    /// The blend equations of colour, and of alpha.
    constexpr void SetColorEquation(BlendingFunction function, BlendingFactor source,
                                    BlendingFactor destination) {
        mColor = {function, source, destination};
    }
    constexpr void SetAlphaEquation(BlendingFunction function, BlendingFactor source,
                                    BlendingFactor destination) {
        mAlpha = {function, source, destination};
    }

    /// The values set.
    bool IsBlending() const { return mBlending; }
    bool IsColorWrite() const { return mColorWrite; }
    Equation const& GetColorEquation() const { return mColor; }
    Equation const& GetAlphaEquation() const { return mAlpha; }

    /// Compares all values.
    friend bool operator==(BlendStateDescriptor const& a, BlendStateDescriptor const& b) {
        static_assert(sizeof(BlendStateDescriptor) == 8, "no padding is compared");
        return detail::HasSameBits<sizeof(BlendStateDescriptor)>(&a, &b);
    }

private:
    bool mBlending;
    bool mColorWrite;
    Equation mColor;
    Equation mAlpha;
};

} // namespace Moka
