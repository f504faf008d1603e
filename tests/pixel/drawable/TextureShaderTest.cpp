// The programs that draw textures, pixel by pixel, and the parameters of all twelve as the driver reports
// them.
#include "tests/pixel/drawable/ShaderPixels.h"

#include "moka/renderer/IParameterBinding.h"

namespace Moka::Testing {
namespace {

constexpr int kWidth = 8;
constexpr int kHeight = 4;
Vector4<float> const kColor(0.9f, 0.5f, 0.2f, 0.8f);
Vector4<float> const kTint(0.1f, 0.7f, 1.0f, 0.6f);

Rgba operator*(Rgba const& c, double factor) {
    return {c.r * factor, c.g * factor, c.b * factor, c.a * factor};
}
Rgba operator+(Rgba const& p, Rgba const& q) { return {p.r + q.r, p.g + q.g, p.b + q.b, p.a + q.a}; }

Rgba ToRgba(Pixel const& p) { return Rgba{double(p.r), double(p.g), double(p.b), double(p.a)} * (1 / 255.0); }

// What a texture shows where each of its pixels lies on one of the target.
Rgba At(Image const& image, double x, double y) {
    return ToRgba(image.At(static_cast<int>(x), static_cast<int>(y)));
}

Rgba Tinted(double alpha) {
    return {double{kTint.x} * alpha, double{kTint.y} * alpha, double{kTint.z} * alpha, alpha};
}

// Premultiplied, every alpha from 0 to 255, colours that differ in all channels.
Image MakeSource(int seed) {
    Image image(kWidth, kHeight);
    for (int i = 0; i < kWidth * kHeight; ++i) {
        int const alpha = (i * 8 + seed * 40) % 256;
        auto const channel = [&](int step) {
            return static_cast<std::uint8_t>(alpha * ((i * step + seed) % 11) / 10);
        };
        image.pixels[static_cast<std::size_t>(i)] = {channel(3), channel(5), channel(7),
                                                     static_cast<std::uint8_t>(alpha)};
    }
    image.At(2, 1) = {};
    return image;
}

class TextureShaderTest : public ShaderPixels {
protected:
    void SetUp() override {
        ShaderPixels::SetUp();
        SetSize(kWidth, kHeight);
    }
    void TearDown() override {
        mTextures.clear();
        ShaderPixels::TearDown();
    }

    // On units 0, 1, ...
    void Bind(std::initializer_list<Image> images) {
        mTextures.clear();
        for (Image const& image : images) {
            mTextures.push_back(MakeTexture(image));
            mTextures.back()->Bind(static_cast<int>(mTextures.size()) - 1);
        }
    }

    static double Coverage(double x) { return 0.25 + x / 16; }
    Image DrawCovered() {
        return Draw({AtCorners([](float x, float y) {
                         return std::vector<float>{x, y, 0.25f + x / 16};
                     }),
                     AtCorners([](float x, float y) {
                         return std::vector<float>{x / kWidth, y / kHeight};
                     })});
    }
    Image DrawWhole() {
        return Draw({AtCorners([](float x, float y) {
            return std::vector<float>{x, y, x / kWidth, y / kHeight};
        })});
    }

    template <class T>
    void SetColors(SharedShader<T> const& shader, int hasTint) {
        shader->uProjectionMatrix = GetProjection();
        shader->uColor = kColor;
        shader->uTintColor = kTint;
        shader->uHasTintColor = hasTint;
    }

    // The colour of the bitmap programs.
    static Rgba Shade(Image const& image, double x, double y, int hasTint) {
        Rgba const texel = At(image, x, y);
        double const a = Coverage(x) * double{kColor.w};
        return hasTint == 1 ? Tinted(a * double{kTint.w} * texel.a) : texel * a;
    }

private:
    std::vector<TexturePtr> mTextures;
};

TEST_F(TextureShaderTest, BitmapsTakeCoverageAlphaAndTint) {
    Image const source = MakeSource(1);
    Bind({source});
    SharedShader<MKBitmapShader> const shader;
    shader->uSrcTexture = 0;
    for (int hasTint : {0, 1}) {
        SetColors(shader, hasTint);
        Expect(
            DrawCovered(), [&](double x, double y) { return Shade(source, x, y, hasTint); }, "bitmap");
    }
}

TEST_F(TextureShaderTest, TheClampKeepsColoursBelowAlphaAndTouchesNothingElse) {
    Image source = MakeSource(2);
    source.At(3, 0) = {255, 100, 7, 50};
    source.At(4, 3) = {255, 255, 255, 0};
    Bind({source});
    SharedShader<MKBitmapShaderColorClamp> const shader;
    shader->uSrcTexture = 0;
    for (int hasTint : {0, 1}) {
        SetColors(shader, hasTint);
        Reference const reference = [&](double x, double y) {
            Rgba const c = Shade(source, x, y, hasTint);
            if (hasTint == 1) return c;
            return Rgba{std::min(c.r, c.a), std::min(c.g, c.a), std::min(c.b, c.a), c.a};
        };
        Expect(DrawCovered(), reference, "clamped");
    }
}

TEST_F(TextureShaderTest, DarkenAndLightenComposeWithTheDestination) {
    Image const source = MakeSource(3);
    Image const destination = MakeSource(5);
    Bind({source, destination});
    SharedShader<MKBitmapAdvancedBlendingShader> const shader;
    shader->uSrcTexture = 0;
    shader->uDstTexture = 1;
    shader->uDstTextureSize = Vector2<float>(kWidth, kHeight);
    auto const straight = [](Rgba const& c) {
        return c.a == 0 ? Rgba{} : Rgba{c.r / c.a, c.g / c.a, c.b / c.a, c.a};
    };
    for (int mode : {1, 2}) {
        for (int hasTint : {0, 1}) {
            SetColors(shader, hasTint);
            shader->uBlendingMode = mode;
            Reference const reference = [&](double x, double y) {
                Rgba const s = straight(Shade(source, x, y, hasTint));
                Rgba const d = straight(At(destination, x, y));
                double const both = s.a * d.a, onlyS = s.a * (1 - d.a), onlyD = d.a * (1 - s.a);
                auto const mix = [&](double sc, double dc) {
                    return (mode == 1 ? std::min(sc, dc) : std::max(sc, dc)) * both + sc * onlyS + dc * onlyD;
                };
                return Rgba{mix(s.r, d.r), mix(s.g, d.g), mix(s.b, d.b), both + onlyS + onlyD};
            };
            Expect(DrawCovered(), reference,
                   "mode " + std::to_string(mode) + ", tint " + std::to_string(hasTint));
        }
    }
}

TEST_F(TextureShaderTest, TheBlenderMixesAndIgnoresCoverageAndColours) {
    Image const first = MakeSource(3);
    Image const second = MakeSource(4);
    Bind({first, second});
    SharedShader<MKBlenderBitmapsShader> const shader;
    SetColors(shader, 1);
    shader->uSrcTexture1 = 0;
    shader->uSrcTexture2 = 1;
    for (float factor : {0.0f, 0.25f, 1.0f}) {
        shader->uFactor = factor;
        Reference const reference = [&](double x, double y) {
            return At(first, x, y) * (1 - double{factor}) + At(second, x, y) * double{factor};
        };
        Expect(DrawCovered(), reference, "factor " + std::to_string(factor));
    }
}

TEST_F(TextureShaderTest, TheTextMaskDrawsItsColourWhereTheMaskIs) {
    Image const mask = MakeSource(0);
    Bind({mask});
    SharedShader<MKTextMaskBitmapShader> const shader;
    shader->uProjectionMatrix = GetProjection();
    shader->uSrcTexture = 0;
    shader->uMaskColor = kColor; // its alpha is not read
    Reference const reference = [&](double x, double y) -> std::optional<Rgba> {
        double const m = At(mask, x, y).a;
        if (m == 0) return std::nullopt;
        return Rgba{double{kColor.x} * m, double{kColor.y} * m, double{kColor.z} * m, m};
    };
    Expect(DrawWhole(), reference, "mask");
}

TEST_F(TextureShaderTest, OneBitmapOverAnotherLeavesNotPremultiplied) {
    Image const source = MakeSource(1);
    Image const destination = MakeSource(6);
    Bind({source, destination});
    SharedShader<MKNonPremultipliedColorShader> const shader;
    shader->projectionMatrix = GetProjection();
    shader->srcTexture = 0;
    shader->dstTexture = 1;
    Image const drawn = DrawWhole();
    Reference const reference = [&](double x, double y) {
        Rgba const s = At(source, x, y);
        Rgba const f = s + At(destination, x, y) * (1 - s.a);
        // Nothing is promised where both are transparent.
        if (f.a == 0) return ToRgba(drawn.At(static_cast<int>(x), static_cast<int>(y)));
        return Rgba{f.r / f.a, f.g / f.a, f.b / f.a, f.a};
    };
    Expect(drawn, reference, "non-premultiplied");
}

TEST_F(TextureShaderTest, TheBlurWeighsFourNeighboursOnEachSideOfOneAxis) {
    Image const source = MakeSource(2);
    Bind({source});
    SharedShader<MKGaussianBlurShader> const shader;
    shader->projectionMatrix = GetProjection();
    shader->srcTexture = 0;
    shader->uTintColor = kTint;
    double const weights[] = {0.227027, 0.1945946, 0.1216216, 0.054054, 0.016216};
    for (bool horizontal : {true, false}) {
        for (int amount : {0, 1, 2}) {
            int const hasTint = amount == 2 ? 1 : 0;
            shader->isHorizontal = horizontal;
            shader->blurAmount = static_cast<float>(amount);
            shader->uHasTintColor = hasTint;
            Reference const reference = [&](double x, double y) {
                Rgba sum{};
                for (int i = -4; i <= 4; ++i) {
                    double const tx =
                        std::min(std::max(x + (horizontal ? i * amount : 0), 0.0), kWidth - 0.5);
                    double const ty =
                        std::min(std::max(y + (horizontal ? 0 : i * amount), 0.0), kHeight - 0.5);
                    sum = sum + At(source, tx, ty) * weights[std::abs(i)];
                }
                return hasTint == 1 ? Tinted(sum.a * double{kTint.w}) : sum;
            };
            Expect(DrawWhole(), reference,
                   std::string(horizontal ? "horizontal " : "vertical ") + std::to_string(amount));
        }
    }
}

struct Parameter {
    char const* name;
    int type;
    bool mayBeRemoved = false;
};

template <class T>
void ExpectParameters(std::vector<Parameter> const& parameters) {
    SharedShader<T> const shader;
    for (Parameter const& expected : parameters) {
        std::unique_ptr<IParameterBinding> const found(shader->program->GetParameter(expected.name));
        if (expected.mayBeRemoved && found->GetType() == BindingTypeUnknown) continue;
        EXPECT_EQ(found->GetType(), expected.type) << typeid(T).name() << ' ' << expected.name;
    }
}

TEST_F(TextureShaderTest, EveryProgramLinksAndItsParametersAreOfTheTypesItsClassBinds) {
    std::vector<Parameter> const color = {
        {"uProjectionMatrix", 2}, {"uColor", 5}, {"uTintColor", 5}, {"uHasTintColor", 7}};
    std::vector<Parameter> const bitmap = {
        {"uProjectionMatrix", 2}, {"uSrcTexture", 8}, {"uColor", 5}, {"uTintColor", 5}, {"uHasTintColor", 7}};
    for (auto const& expect : {ExpectParameters<MKRectShader>, ExpectParameters<MKRoundRectShader>,
                               ExpectParameters<MKRoundRectRoundShader>, ExpectParameters<MKCircleShader>,
                               ExpectParameters<MKLineShader>}) {
        expect(color);
    }
    ExpectParameters<MKRoundRectRoundShader>({{"uIsFill", 7}, {"uStrokeWidth", 6}, {"uRxry", 3}});
    ExpectParameters<MKCircleShader>({{"uIsFill", 7}, {"uStrokeWidth", 6}, {"uCenter", 3}, {"uRadius", 6}});
    ExpectParameters<MKLineShader>({{"uLineInfo", 3},
                                    {"uIsDashedLine", 7},
                                    {"uDashedLinePattern", 5},
                                    {"uDashedLinePatternLength", 6},
                                    {"uLineCapType", 7}});
    ExpectParameters<MKBitmapShader>(bitmap);
    ExpectParameters<MKBitmapShaderColorClamp>(bitmap);
    ExpectParameters<MKBitmapAdvancedBlendingShader>(bitmap);
    ExpectParameters<MKBitmapAdvancedBlendingShader>(
        {{"uDstTexture", 8}, {"uDstTextureSize", 3}, {"uBlendingMode", 7}});
    ExpectParameters<MKBlenderBitmapsShader>({{"uProjectionMatrix", 2},
                                              {"uSrcTexture1", 8},
                                              {"uSrcTexture2", 8},
                                              {"uFactor", 6},
                                              {"uColor", 5, true},
                                              {"uTintColor", 5, true},
                                              {"uHasTintColor", 7, true}});
    ExpectParameters<MKTextMaskBitmapShader>(
        {{"uProjectionMatrix", 2}, {"uSrcTexture", 8}, {"uMaskColor", 5}});
    ExpectParameters<MKNonPremultipliedColorShader>(
        {{"projectionMatrix", 2}, {"srcTexture", 8}, {"dstTexture", 8}});
    ExpectParameters<MKGaussianBlurShader>({{"projectionMatrix", 2},
                                            {"srcTexture", 8},
                                            {"uTintColor", 5},
                                            {"uHasTintColor", 7},
                                            {"isHorizontal", 1},
                                            {"blurAmount", 6}});
}

} // namespace
} // namespace Moka::Testing
