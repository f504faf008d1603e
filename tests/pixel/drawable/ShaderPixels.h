// ShaderPixels: draws one quad with a library program and compares every pixel with what a function of the
// pixel's centre says it must be.
#pragma once

#include "moka/graphics/drawable/ShaderManager.h"
#include "moka/graphics/drawable/Shaders.h"
#include "tests/pixel/renderer/RawStrip.h"
#include "tests/pixel/renderer/RendererFixture.h"

#include <cmath>
#include <functional>
#include <optional>

namespace Moka::Testing {

// Premultiplied, 0 ... 1.
struct Rgba {
    double r, g, b, a;
};
// What is drawn at a point, in pixels; nothing where the fragment is discarded.
using Reference = std::function<std::optional<Rgba>(double x, double y)>;

// In steps of 255: a driver may compute mediump in 16 bits, and a coordinate between 32 and 64 is then off by
// up to 1/64 of a pixel.
constexpr double kMediumPrecision = 4;

constexpr Pixel kBackground{10, 20, 30, 40};

// The class's shader for a scope.
template <class T>
class SharedShader {
public:
    SharedShader() : mShader(ShaderManager::GetInstance()->GetShader<T>()) {
        mShader->program->MakeCurrent();
    }
    ~SharedShader() { ShaderManager::GetInstance()->ReleaseShader(mShader); }
    SharedShader(SharedShader const&) = delete;
    SharedShader& operator=(SharedShader const&) = delete;
    T* operator->() const { return mShader; }

private:
    T* const mShader;
};

class ShaderPixels : public RendererFixture {
protected:
    // The target, from its corner; y down, as the library draws off-screen.
    void SetSize(int width, int height) {
        mTarget.reset();
        mWidth = width;
        mHeight = height;
        mTexture = MakeTexture(width, height);
        mTarget = MakeTarget(*mTexture);
        mTarget->Activate();
    }

    void TearDown() override {
        mTarget.reset();
        mTexture.reset();
        RendererFixture::TearDown();
    }

    Matrix4<float> GetProjection() const {
        auto const width = static_cast<float>(mWidth);
        auto const height = static_cast<float>(mHeight);
        return Matrix4<float>::orthoMatrix(0, width, 0, height, -1, 1);
    }

    // An attribute of the four corners: what value(x, y) gives there.
    template <class Function>
    RawAttribute AtCorners(Function value) const {
        RawAttribute attribute{};
        for (int corner = 0; corner < 4; ++corner) {
            auto const x = static_cast<float>(corner % 2 * mWidth);
            auto const y = static_cast<float>(corner / 2 * mHeight);
            auto const values = value(x, y);
            attribute.components = static_cast<int>(values.size());
            attribute.values.insert(attribute.values.end(), values.begin(), values.end());
        }
        return attribute;
    }

    Image Draw(std::initializer_list<RawAttribute> attributes) {
        Clear(*mTarget, kBackground);
        DrawRawStrip(attributes);
        return Read(*mTarget, mWidth, mHeight);
    }

    // tolerance: steps of 255; one is for rounding.
    static void Expect(Image const& drawn, Reference const& reference, std::string const& what,
                       double tolerance = 1) {
        int wrong = 0;
        for (int y = 0; y < drawn.height; ++y) {
            for (int x = 0; x < drawn.width; ++x) {
                std::optional<Rgba> const wanted = reference(x + 0.5, y + 0.5);
                Pixel const pixel = drawn.At(x, y);
                if (IsRight(pixel, wanted, tolerance) || ++wrong > 3) continue;
                ADD_FAILURE() << what << ": at " << x << ", " << y << " is " << pixel << ", wanted "
                              << (wanted ? Print(*wanted) : std::string("nothing"));
            }
        }
        EXPECT_EQ(wrong, 0) << what;
    }

private:
    static bool IsRight(Pixel const& pixel, std::optional<Rgba> const& wanted, double tolerance) {
        if (wanted ? IsNear(pixel, *wanted, tolerance) : pixel == kBackground) return true;
        // On the outermost edge coarse arithmetic may find itself on either side.
        Pixel const drawn = pixel == kBackground ? kClear : pixel;
        return tolerance > 1 && IsNear(drawn, Rgba{}, tolerance) &&
               IsNear(kClear, wanted.value_or(Rgba{}), tolerance);
    }
    static bool IsNear(Pixel const& pixel, Rgba const& wanted, double tolerance) {
        auto const near = [tolerance](std::uint8_t drawn, double value) {
            return std::abs(drawn - std::min(std::max(value, 0.0), 1.0) * 255) <= tolerance;
        };
        return near(pixel.r, wanted.r) && near(pixel.g, wanted.g) && near(pixel.b, wanted.b) &&
               near(pixel.a, wanted.a);
    }
    static std::string Print(Rgba const& c) {
        std::ostringstream text;
        text << '(' << c.r * 255 << ' ' << c.g * 255 << ' ' << c.b * 255 << ' ' << c.a * 255 << ')';
        return text.str();
    }

    int mWidth = 0;
    int mHeight = 0;
    TexturePtr mTexture;
    TargetPtr mTarget;
};

} // namespace Moka::Testing
