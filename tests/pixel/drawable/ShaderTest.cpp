// The programs that no canvas draws with, pixel by pixel, against what a function of the pixel's centre says.
// The others are in tests/pixel/canvas.
#include "moka/graphics/drawable/ShaderManager.h"
#include "moka/graphics/drawable/Shaders.h"
#include "tests/pixel/renderer/RendererFixture.h"

#include <cmath>
#include <functional>
#include <optional>

namespace Moka::Testing {
namespace {

constexpr int kWidth = 8;
constexpr int kHeight = 4;
constexpr float kCorners[][2] = {{0, 0}, {1, 0}, {0, 1}, {1, 1}};
constexpr Color kBackground{10, 20, 30, 40};
Vector4<float> const kColor(0.9f, 0.5f, 0.2f, 0.8f);
Vector4<float> const kTint(0.1f, 0.7f, 1.0f, 0.6f);

// Premultiplied, 0 ... 1.
struct Rgba {
    double r, g, b, a;
};
Rgba operator*(Rgba const& c, double factor) {
    return {c.r * factor, c.g * factor, c.b * factor, c.a * factor};
}
Rgba operator+(Rgba const& p, Rgba const& q) { return {p.r + q.r, p.g + q.g, p.b + q.b, p.a + q.a}; }
Rgba Tinted(double alpha) {
    return {double{kTint.x} * alpha, double{kTint.y} * alpha, double{kTint.z} * alpha, alpha};
}

// What a texture shows where each of its pixels lies on one of the target.
Rgba At(Picture const& image, double x, double y) {
    Color const p = image.GetColor(static_cast<int>(x), static_cast<int>(y));
    return Rgba{double(p[0]), double(p[1]), double(p[2]), double(p[3])} * (1 / 255.0);
}

// What is drawn at a point, in pixels; nothing where the fragment is discarded.
using Reference = std::function<std::optional<Rgba>(double x, double y)>;

struct ReleaseShader {
    template <class T>
    void operator()(T* shader) const {
        ShaderManager::GetInstance()->ReleaseShader(shader);
    }
};

// The class's shader, current.
template <class T>
std::unique_ptr<T, ReleaseShader> Use() {
    std::unique_ptr<T, ReleaseShader> shader(ShaderManager::GetInstance()->GetShader<T>());
    shader->program->MakeCurrent();
    return shader;
}

// Premultiplied, every alpha from 0 to 255, colours that differ in all channels.
Picture MakeSource(int seed) {
    Picture image = MakeImage(kWidth, kHeight);
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

class ShaderTest : public RendererFixture {
protected:
    ShaderTest() { mTarget->Activate(); }

    // On units 0, 1, ...
    void Bind(std::initializer_list<Picture> images) {
        for (Picture const& image : images) {
            mSources.push_back(MakeTexture(image));
            mSources.back()->Bind(static_cast<int>(mSources.size()) - 1);
        }
    }

    // y down, as the library draws off-screen.
    static Matrix4<float> GetProjection() {
        return Matrix4<float>::orthoMatrix(0, kWidth, 0, kHeight, -1, 1);
    }

    // Over the whole target; the attributes are place and coverage, and texture coordinates.
    Picture DrawCovered() {
        RawAttribute covered{3, {}};
        RawAttribute texture{2, {}};
        for (auto const& [u, v] : kCorners) {
            covered.values.insert(covered.values.end(), {u * kWidth, v * kHeight, 0.25f + u / 2});
            texture.values.insert(texture.values.end(), {u, v});
        }
        return Draw({covered, texture});
    }
    static double Coverage(double x) { return 0.25 + x / 16; }
    // The attribute is place and texture coordinates.
    Picture DrawWhole() {
        RawAttribute whole{4, {}};
        for (auto const& [u, v] : kCorners)
            whole.values.insert(whole.values.end(), {u * kWidth, v * kHeight, u, v});
        return Draw({whole});
    }
    Picture Draw(std::initializer_list<RawAttribute> attributes) {
        Clear(*mTarget, kBackground);
        DrawRawStrip(attributes);
        return Read(*mTarget, kWidth, kHeight);
    }

    static void Expect(Picture const& drawn, Reference const& reference) {
        for (int y = 0; y < kHeight; ++y) {
            for (int x = 0; x < kWidth; ++x) {
                std::optional<Rgba> const wanted = reference(x + 0.5, y + 0.5);
                Rgba const c =
                    wanted ? *wanted * 255 : At(MakeImage(kWidth, kHeight, kBackground), x, y) * 255;
                Color const p = drawn.GetColor(x, y);
                double const off = std::max(
                    {std::abs(p[0] - c.r), std::abs(p[1] - c.g), std::abs(p[2] - c.b), std::abs(p[3] - c.a)});
                ASSERT_LE(off, wanted ? 1 : 0) << x << ", " << y << " is " << ::testing::PrintToString(p);
            }
        }
    }

private:
    TexturePtr mTexture = MakeTexture(kWidth, kHeight);
    TargetPtr mTarget = MakeTarget(*mTexture);
    std::vector<TexturePtr> mSources;
};

TEST_F(ShaderTest, TheClampKeepsColoursBelowAlphaAndTouchesNothingElse) {
    Picture source = MakeSource(2);
    source.SetColor(3, 0, {255, 100, 7, 50});
    source.SetColor(4, 3, {255, 255, 255, 0});
    Bind({source});
    auto const shader = Use<MKBitmapShaderColorClamp>();
    shader->uProjectionMatrix = GetProjection();
    shader->uColor = kColor;
    shader->uTintColor = kTint;
    shader->uSrcTexture = 0;
    for (bool hasTint : {false, true}) {
        shader->uHasTintColor = hasTint ? 1 : 0;
        Expect(DrawCovered(), [&](double x, double y) {
            Rgba const texel = At(source, x, y);
            double const a = Coverage(x) * double{kColor.w};
            if (hasTint) return Tinted(a * double{kTint.w} * texel.a);
            Rgba const c = texel * a;
            return Rgba{std::min(c.r, c.a), std::min(c.g, c.a), std::min(c.b, c.a), c.a};
        });
    }
}

TEST_F(ShaderTest, TheBlenderMixesAndIgnoresCoverageAndColours) {
    Picture const first = MakeSource(3);
    Picture const second = MakeSource(4);
    Bind({first, second});
    auto const shader = Use<MKBlenderBitmapsShader>();
    shader->uProjectionMatrix = GetProjection();
    shader->uColor = kColor;
    shader->uTintColor = kTint;
    shader->uHasTintColor = 1;
    shader->uSrcTexture1 = 0;
    shader->uSrcTexture2 = 1;
    for (float factor : {0.0f, 0.25f, 1.0f}) {
        shader->uFactor = factor;
        Expect(DrawCovered(), [&](double x, double y) {
            return At(first, x, y) * (1 - double{factor}) + At(second, x, y) * double{factor};
        });
    }
}

TEST_F(ShaderTest, TheTextMaskDrawsItsColourWhereTheMaskIs) {
    Picture const mask = MakeSource(0);
    Bind({mask});
    auto const shader = Use<MKTextMaskBitmapShader>();
    shader->uProjectionMatrix = GetProjection();
    shader->uSrcTexture = 0;
    shader->uMaskColor = kColor; // its alpha is not read
    Expect(DrawWhole(), [&](double x, double y) -> std::optional<Rgba> {
        double const m = At(mask, x, y).a;
        if (m == 0) return std::nullopt;
        return Rgba{double{kColor.x} * m, double{kColor.y} * m, double{kColor.z} * m, m};
    });
}

TEST_F(ShaderTest, OneBitmapOverAnotherLeavesNotPremultiplied) {
    Picture const source = MakeSource(1);
    Picture const destination = MakeSource(6);
    Bind({source, destination});
    auto const shader = Use<MKNonPremultipliedColorShader>();
    shader->projectionMatrix = GetProjection();
    shader->srcTexture = 0;
    shader->dstTexture = 1;
    Picture const drawn = DrawWhole();
    Expect(drawn, [&](double x, double y) {
        Rgba const s = At(source, x, y);
        Rgba const f = s + At(destination, x, y) * (1 - s.a);
        // Nothing is promised where both are transparent.
        if (f.a == 0) return At(drawn, x, y);
        return Rgba{f.r / f.a, f.g / f.a, f.b / f.a, f.a};
    });
}

TEST_F(ShaderTest, TheBlurWeighsFourNeighboursOnEachSideOfOneAxis) {
    Picture const source = MakeSource(2);
    Bind({source});
    auto const shader = Use<MKGaussianBlurShader>();
    shader->projectionMatrix = GetProjection();
    shader->srcTexture = 0;
    shader->uTintColor = kTint;
    double const weights[] = {0.227027, 0.1945946, 0.1216216, 0.054054, 0.016216};
    for (bool horizontal : {true, false}) {
        for (int amount : {0, 1, 2}) {
            SCOPED_TRACE(std::string(horizontal ? "horizontal " : "vertical ") + std::to_string(amount));
            int const hasTint = amount == 2 ? 1 : 0;
            shader->isHorizontal = horizontal;
            shader->blurAmount = static_cast<float>(amount);
            shader->uHasTintColor = hasTint;
            Expect(DrawWhole(), [&](double x, double y) {
                Rgba sum{};
                for (int i = -4; i <= 4; ++i) {
                    double const tx = std::clamp(x + (horizontal ? i * amount : 0), 0.0, kWidth - 0.5);
                    double const ty = std::clamp(y + (horizontal ? 0 : i * amount), 0.0, kHeight - 0.5);
                    sum = sum + At(source, tx, ty) * weights[std::abs(i)];
                }
                return hasTint == 1 ? Tinted(sum.a * double{kTint.w}) : sum;
            });
        }
    }
}

} // namespace
} // namespace Moka::Testing
