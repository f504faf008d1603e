// What the scenes compare with nothing, pixel by pixel, against what a function of the pixel's centre says: the custom
// drawables, and bitmaps on the one GPU that has a program of its own.
#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"
#include "moka/graphics/drawable/MKTextMaskBitmapDrawable.h"
#include "moka/graphics/paint/MKPaint.h"
#include "tests/pixel/RenderThreadFixture.h"
#include "tests/support/reference/Blend.h"

#include <GLES3/gl3.h>
#include <dlfcn.h>

#include <algorithm>
#include <cmath>
#include <functional>
#include <optional>

// In this program every driver is called as the GPU whose colours have to be clamped.
extern "C" [[gnu::visibility("default")]] GLubyte const* glGetString(GLenum name) {
    static auto* const get = reinterpret_cast<decltype(&glGetString)>(dlsym(RTLD_NEXT, "glGetString"));
    return name == GL_RENDERER ? reinterpret_cast<GLubyte const*>("Mali-T830") : get(name);
}

namespace Moka::Testing {
namespace {

using BitmapPtr = RefPtr<IMKBitmap>;

constexpr int kWidth = 8;
constexpr int kHeight = 4;
constexpr Color kBackground{10, 20, 30, 40};

Rgba operator*(Rgba const& c, double factor) {
    return {c.r * factor, c.g * factor, c.b * factor, c.a * factor};
}
Rgba operator+(Rgba const& p, Rgba const& q) { return {p.r + q.r, p.g + q.g, p.b + q.b, p.a + q.a}; }
Rgba Premultiplied(Vector4<float> const& c, double alpha) {
    return {double{c.x} * alpha, double{c.y} * alpha, double{c.z} * alpha, alpha};
}

// What an image shows where each of its pixels lies on one of the target.
Rgba At(Picture const& image, double x, double y) {
    return FromBytes(image.GetColor(static_cast<int>(x), static_cast<int>(y)));
}
// Left and right of which it repeats itself.
Rgba AtRepeated(Picture const& image, double x, double y) {
    return At(image, std::fmod(x + 4 * kWidth, kWidth), std::fmod(y + 4 * kHeight, kHeight));
}

// What is drawn at a pixel's centre; nothing where the background stays.
using Reference = std::function<std::optional<Rgba>(double x, double y)>;

// Premultiplied, every alpha from 0 to 255, colours that differ in all channels.
Picture MakeSource(int seed) {
    Picture image(kWidth, kHeight);
    for (int i = 0; i < kWidth * kHeight; ++i) {
        int const alpha = (i * 8 + seed * 40) % 256;
        auto const channel = [&](int step) {
            return static_cast<std::uint8_t>(alpha * ((i * step + seed) % 11) / 10);
        };
        image.SetColor(i % kWidth, i / kWidth,
                       {channel(3), channel(5), channel(7), static_cast<std::uint8_t>(alpha)});
    }
    image.SetColor(2, 1, {});
    return image;
}

class CustomDrawablesPixelTest : public RenderThreadFixture {
protected:
    CustomDrawablesPixelTest() {
        paint.SetXFermode(MKPaint::Src);
        paint.SetColor(0.9f, 0.5f, 0.2f, 0.75f);
        paint.SetTintColor(0.1f, 0.7f, 1.0f, 0.6f);
    }

    // Onto the background.
    Picture Draw(std::function<void(IMKCanvas&)> const& draw) {
        Picture image = MakeChecker(kWidth, kHeight, 1, kBackground, kBackground);
        auto const target = Create(image);
        draw(*NewCanvas(*thread, target));
        target->GetBitmapData(target->GetBitmapRect(), image.pixels.data());
        return image;
    }
    template <class Drawable>
    Picture Draw(RefPtr<Drawable> const& drawable) {
        return Draw([&](IMKCanvas& canvas) { canvas.Draw(drawable.Get(), &paint); });
    }
    template <class Drawable>
    RefPtr<Drawable> Make() {
        return RefPtr<Drawable>::Adopt(new Drawable(thread.get()));
    }

    static void Expect(Picture const& drawn, Reference const& reference) {
        for (int y = 0; y < kHeight; ++y) {
            for (int x = 0; x < kWidth; ++x) {
                std::optional<Rgba> const wanted = reference(x + 0.5, y + 0.5);
                Color const seen = drawn.GetColor(x, y);
                double const off = Distance(FromBytes(seen), wanted.value_or(FromBytes(kBackground)));
                ASSERT_LE(off * 255, wanted ? 1 : 1e-6)
                    << x << ", " << y << " is " << ::testing::PrintToString(seen);
            }
        }
    }

    MKPaint paint;
};

TEST_F(CustomDrawablesPixelTest, ABitmapOnTheGpuThatExceedsAlphaIsClamped) {
    Picture source = MakeSource(2);
    source.SetColor(3, 0, {255, 100, 7, 50});
    source.SetColor(4, 3, {255, 255, 255, 0});
    for (bool const hasTint : {true, false}) {
        if (!hasTint) paint.ClearTintColor();
        BitmapPtr const bitmap = Create(source);
        Picture const drawn = Draw([&](IMKCanvas& canvas) { canvas.DrawBitmap(bitmap.Get(), 0, 0, &paint); });
        Expect(drawn, [&](double x, double y) {
            Rgba const c = At(source, x, y) * double{paint.GetAlpha()};
            if (hasTint) return Premultiplied(paint.GetTintColor(), c.a * double{paint.GetTintColor().w});
            return Rgba{std::min(c.r, c.a), std::min(c.g, c.a), std::min(c.b, c.a), c.a};
        });
    }
}

// The part of both at (6, 1), 1:1 at (3, 1). It reaches over the right border, where the paint repeats the first alone.
TEST_F(CustomDrawablesPixelTest, ABlendMixesByThePaintsAlphaAndIgnoresItsColours) {
    Picture const first = MakeSource(3);
    Picture const second = MakeSource(4);
    auto const blend = RefPtr<MKBlendedBitmapDrawable>::Adopt(new MKBlendedBitmapDrawable(
        thread.get(), nullptr, nullptr, RectF(6, 1, 10, 3), RectF(3, 1, 7, 3), 0, 0));
    blend->SetBitmapFirst(Create(first).Get());
    blend->SetBitmapSecond(Create(second).Get());
    paint.SetTileMode(MKPaint::Repeat);
    for (float const factor : {0.0f, 0.25f, 1.0f}) {
        paint.SetAlpha(factor);
        Expect(Draw(blend), [&](double x, double y) -> std::optional<Rgba> {
            if (x < 3 || x > 7 || y < 1 || y > 3) return {};
            return AtRepeated(first, x + 3, y) * (1 - double{factor}) +
                   At(second, std::min(x + 3, kWidth - 0.5), y) * double{factor};
        });
    }
}

TEST_F(CustomDrawablesPixelTest, ATextMaskDrawsItsColourWhereItIs) {
    Picture const image = MakeSource(0);
    auto const mask = Make<MKTextMaskBitmapDrawable>();
    mask->SetBitmap(Create(image).Get());
    mask->SetDstPosition(2, -1);
    Expect(Draw(mask), [&](double x, double y) -> std::optional<Rgba> {
        double const alpha = x < 2 || y > 3 ? 0 : At(image, x - 2, y + 1).a;
        if (alpha == 0) return {};
        return Premultiplied(paint.GetColor(), alpha); // whose alpha is not read
    });
}

TEST_F(CustomDrawablesPixelTest, OneBitmapOverAnotherIsNotPremultiplied) {
    Picture const source = MakeSource(1);
    Picture const destination = MakeSource(6);
    auto const over = Make<MKNonPremultipliedColorDrawable>();
    over->SetBitmap(Create(source).Get(), Create(destination).Get());
    Picture const drawn = Draw(over);
    Expect(drawn, [&](double x, double y) {
        Rgba const s = At(source, x, y);
        Rgba const f = s + At(destination, x, y) * (1 - s.a);
        // Nothing is promised where both are transparent.
        if (f.a == 0) return At(drawn, x, y);
        return Rgba{f.r / f.a, f.g / f.a, f.b / f.a, f.a};
    });
}

TEST_F(CustomDrawablesPixelTest, ABlurWeighsFourNeighboursOnEachSideOfOneAxis) {
    Picture const source = MakeSource(2);
    auto const blur = Make<MKGaussianBlurDrawable>();
    blur->SetBitmap(Create(source).Get());
    blur->SetOffset(3, -1);
    paint.SetTileMode(MKPaint::Repeat);
    double const weights[] = {0.227027, 0.1945946, 0.1216216, 0.054054, 0.016216};
    for (bool const horizontal : {true, false}) {
        for (int const amount : {1, 0, 2}) {
            SCOPED_TRACE(std::string(horizontal ? "horizontal " : "vertical ") + std::to_string(amount));
            // These are what it begins with.
            if (!horizontal) blur->SetHorizotalDirection(horizontal);
            if (amount != 1) blur->SetBlurAmount(static_cast<float>(amount));
            if (amount == 2) paint.ClearTintColor();
            Expect(Draw(blur), [&](double x, double y) {
                Rgba sum{};
                for (int i = -4; i <= 4; ++i) {
                    double const dx = horizontal ? i * amount : 0;
                    double const dy = horizontal ? 0 : i * amount;
                    sum = sum + AtRepeated(source, x - 3 + dx, y + 1 + dy) * weights[std::abs(i)];
                }
                if (!paint.HasTintColor()) return sum;
                return Premultiplied(paint.GetTintColor(), sum.a * double{paint.GetTintColor().w});
            });
        }
        paint.SetTintColor(0.1f, 0.7f, 1.0f, 0.6f);
        blur->SetBlurAmount(1);
    }
}

} // namespace
} // namespace Moka::Testing
