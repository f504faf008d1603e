// Textures: labels, and what is refused. Uploads, copies and lifetimes are in RandomWorkTest, sampling is in the scenes.
#include "tests/pixel/renderer/RendererFixture.h"

#include "moka/base/Rect.h"
#include "moka/renderer/IRendererDeviceCaps.h"

#include <GLES2/gl2ext.h>

#include <limits>

namespace Moka::Testing {
namespace {

using TextureTest = RendererFixture;

TEST_F(TextureTest, LabelsAreCopiedAtOnceAndReachTheDriver) {
    TexturePtr const texture = MakeTexture(2, 2);
    EXPECT_STREQ(texture->GetLabel(), "");
    texture->SetLabel(std::string("strip 3").c_str());
    EXPECT_STREQ(texture->GetLabel(), "strip 3");
    auto const getLabel =
        reinterpret_cast<PFNGLGETOBJECTLABELKHRPROC>(eglGetProcAddress("glGetObjectLabelKHR"));
    texture->Bind(2);
    glActiveTexture(GL_TEXTURE2);
    char seen[64] = {};
    getLabel(GL_TEXTURE, static_cast<GLuint>(GetInteger(GL_TEXTURE_BINDING_2D)), sizeof seen, nullptr, seen);
    EXPECT_STREQ(seen, "strip 3");
    texture->SetLabel(nullptr);
    EXPECT_STREQ(texture->GetLabel(), "");
}

TEST_F(TextureTest, WhatTheDeviceCannotHoldOrDoesNotKnowIsRefusedWithOneLine) {
    int const largest = RendererFactory::GetRendererDeviceCaps()->GetMaxTextureSize();
    EXPECT_TRUE(MakeTexture(largest, 1));
    constexpr int kHuge = 1 << 30;
    for (auto const& [width, height] :
         {std::pair{largest + 1, 4}, {4, largest + 1}, {0, 4}, {4, 0}, {-4, 4}, {kHuge, kHuge}}) {
        EXPECT_FALSE(MakeTexture(width, height));
        std::vector<std::string> const errors = TakeErrors();
        ASSERT_EQ(errors.size(), 1u);
        EXPECT_NE(errors[0].find(std::to_string(width) + " x " + std::to_string(height)), std::string::npos);
        EXPECT_NE(errors[0].find(std::to_string(largest)), std::string::npos);
    }
    Picture const image = MakeImage(4, 4);
    for (TextureDescriptor const& unknown :
         {TextureDescriptor(4, 4, 1, 2, 6, 1, false, nullptr),
          TextureDescriptor(4, 4, 0, 3, 6, 1, false, nullptr),
          TextureDescriptor(4, 4, 0, 2, 7, 1, false, nullptr),
          TextureDescriptor(4, 4, 0, 2, 6, 0, false, nullptr), TextureDescriptor(nullptr)})
        EXPECT_FALSE(RendererFactory::CreateTextureObject(unknown, nullptr, 0, {}));
    EXPECT_FALSE(RendererFactory::CreateTextureObject({4, 4, 0, 2, 6, 1, false, nullptr}, nullptr, 0,
                                                      {image.pixels.data(), 0, 0, 3}));
    EXPECT_FALSE(RendererFactory::CreateOffscreenRenderTarget(nullptr));
    EXPECT_EQ(TakeErrors().size(), 7u);
    TexturePtr const texture = MakeTexture(2, 2);
    constexpr int kRefused[][2] = {{TextureParamWrappingS, 2},
                                   {TextureParamWrappingT, 4},
                                   {TextureParamFilteringMin, -1},
                                   {TextureParamFilteringMag, 3},
                                   {2, 0},
                                   {-1, 0}};
    for (auto const& [id, value] : kRefused) texture->SetParameter(id, value);
    EXPECT_EQ(TakeErrors().size(), std::size(kRefused));
    int const units = GetInteger(GL_MAX_COMBINED_TEXTURE_IMAGE_UNITS);
    for (int const unit : {-1, units - 1, units}) texture->Bind(unit); // the last one is kept for uploads
    EXPECT_EQ(TakeErrors().size(), 3u);
}

TEST_F(TextureTest, RowsThatWouldOverlapAndRectanglesThatAreNoneTransferNothing) {
    auto const [texture, target] = MakeOffscreen(MakeImage(7, 5, kRed));
    std::vector<Color> const pixels(35, kBlue);
    constexpr int kMin = std::numeric_limits<int>::min();
    constexpr int kMax = std::numeric_limits<int>::max();
    texture->Replace(nullptr, 0);
    for (Rect const& rect :
         {Rect(kMax, kMax, kMin, kMin), Rect(kMin, kMin, kMin + 4, kMin + 4), Rect(kMax - 4, 0, kMax, 4)})
        texture->Replace(rect, pixels.data(), 0);
    EXPECT_EQ(TakeErrors().size(), 0u);
    texture->Replace(pixels.data(), 7);
    EXPECT_EQ(Read(*texture), MakeImage(7, 5, kRed));
    Picture destination = MakeImage(7, 5);
    target->ReadPixels(0, 0, 7, 5, {destination.pixels.data(), 6, 0, 0});
    target->ReadPixels(0, 0, 1, 1, {destination.pixels.data(), 7, -1, 0});
    target->ReadPixels(0, 0, 7, 5, {nullptr, 7, 0, 0}); // quietly
    EXPECT_EQ(destination, MakeImage(7, 5));
    std::vector<std::string> const errors = TakeErrors();
    ASSERT_EQ(errors.size(), 3u);
    EXPECT_NE(errors[0].find("28 bytes lie 7 bytes apart"), std::string::npos) << errors[0];
}

TEST_F(TextureTest, ANewTextureIsTransparentWhateverTheHostsScissorAndMask) {
    glEnable(GL_SCISSOR_TEST);
    glScissor(2, 2, 1, 1);
    glColorMask(GL_FALSE, GL_TRUE, GL_FALSE, GL_TRUE);
    TexturePtr const texture = MakeTexture(64, 64);
    EXPECT_EQ(Read(*texture), MakeImage(64, 64, kClear));
    EXPECT_TRUE(glIsEnabled(GL_SCISSOR_TEST));
    GLboolean mask[4];
    glGetBooleanv(GL_COLOR_WRITEMASK, mask);
    EXPECT_EQ(mask[0] + 2 * mask[1] + 4 * mask[2] + 8 * mask[3], 10);
}

} // namespace
} // namespace Moka::Testing
