// Texture objects: storage that is shared, sampling state that is not, labels, limits, and when GL names go.
#include "tests/pixel/renderer/RendererFixture.h"

#include "moka/base/Rect.h"
#include "moka/renderer/IRendererDeviceCaps.h"

#include <GLES2/gl2ext.h>

#include <thread>

namespace Moka::Testing {
namespace {

class TextureObjectTest : public RendererFixture {
protected:
    // What a texture bound to unit 0 shows at a texture coordinate, through a shader.
    static Color Sample(ITextureObject& texture, float s, float t) {
        HostFrameBuffer const frameBuffer(1, 1);
        std::string const coordinate = std::to_string(s) + ", " + std::to_string(t);
        RawQuad const quad(("color = texture(texel, vec2(" + coordinate + "));").c_str());
        glViewport(0, 0, 1, 1);
        texture.Bind(0);
        quad.Draw();
        return frameBuffer.Read().GetColor(0, 0);
    }

    static GLuint NameBoundBy(ITextureObject& texture) {
        texture.Bind(2);
        glActiveTexture(GL_TEXTURE2);
        return static_cast<GLuint>(GetInteger(GL_TEXTURE_BINDING_2D));
    }
};

// Two columns and two rows, all different.
Picture Corners() {
    Picture const red = MakeImage(1, 1, kRed), green = MakeImage(1, 1, kGreen), blue = MakeImage(1, 1, kBlue);
    return MakeImage(2, 2, kClear).With(0, 0, red).With(1, 0, green).With(0, 1, blue);
}

TEST_F(TextureObjectTest, StorageIsSharedAndLivesUntilItsLastOwnerGoesInAnyOrder) {
    for (int first = 0; first < 3; ++first) {
        TexturePtr model = MakeTexture(MakeImage(2, 2, kGreen));
        TexturePtr view = MakeView(*model);
        TargetPtr target = MakeTarget(*model);
        target->Activate();
        GLuint const name = NameBoundBy(*model);
        EXPECT_EQ(NameBoundBy(*view), name);
        EXPECT_EQ(RendererFactory::GetStatistics().textures, 1);
        EXPECT_EQ(RendererFactory::GetStatistics().textureObjects, 2);
        view->Replace(Corners().pixels.data(), 0);
        if (first == 0) model.reset();
        if (first == 1) view.reset();
        if (first == 2) target.reset();
        EXPECT_EQ(target ? Read(*target, 2, 2) : Read(*model), Corners());
        model.reset();
        if (target) {
            EXPECT_EQ(Read(*target, 2, 2), Corners());
        }
        target.reset();
        view.reset();
        EXPECT_EQ(RendererFactory::GetStatistics().textures, 0);
        RendererFactory::Flush();
        EXPECT_FALSE(glIsTexture(name));
    }
}

TEST_F(TextureObjectTest, ANameIsDeletedOnceSoAStrangersTextureSurvives) {
    TexturePtr model = MakeTexture(Corners());
    TexturePtr view = MakeView(*model);
    model.reset();
    view.reset();
    // A driver hands the freed name out again; nothing of ours may delete it a second time.
    GLuint stranger = 0;
    glGenTextures(1, &stranger);
    glBindTexture(GL_TEXTURE_2D, stranger);
    TexturePtr const another = MakeTexture(Corners());
    EXPECT_NE(NameBoundBy(*another), stranger);
    EXPECT_TRUE(glIsTexture(stranger));
    glDeleteTextures(1, &stranger);
}

TEST_F(TextureObjectTest, ATextureUnderTheNameOfADeletedOneIsBoundAnew) {
    glBindTexture(GL_TEXTURE_2D, kLastName);
    OffscreenImage const image = MakeOffscreen(MakeImage(2, 2));
    image.target->Activate(); // from here on the renderer knows what is bound
    TexturePtr texture = MakeTexture(Corners());
    GLuint const name = NameBoundBy(*texture);
    texture.reset();
    texture = MakeTexture(Corners());
    EXPECT_EQ(NameBoundBy(*texture), name);
    EXPECT_TRUE(glIsTexture(name));
    image.target->Deactivate(false, false);
    glDeleteTextures(1, &kLastName);
}

TEST_F(TextureObjectTest, SamplingIsLinearAndClampedUntilSaidOtherwise) {
    TexturePtr const texture = MakeTexture(Corners());
    EXPECT_EQ(Sample(*texture, -3.0f, 0.25f), kRed);
    EXPECT_EQ(Sample(*texture, 4.0f, 0.25f), kGreen);
    EXPECT_EQ(Sample(*texture, 0.25f, 0.75f), kBlue); // row 0 is at the top of texture space
    Color const middle = Sample(*texture, 0.5f, 0.25f);
    EXPECT_NEAR(middle[0], 128, 1);
    EXPECT_NEAR(middle[1], 128, 1);

    constexpr int kRefused[][2] = {{TextureParamWrappingS, 2},
                                   {TextureParamWrappingT, 4},
                                   {TextureParamWrappingS, -1},
                                   {TextureParamFilteringMin, -1},
                                   {TextureParamFilteringMag, 3},
                                   {2, 0},
                                   {3, 1},
                                   {6, 0},
                                   {-1, 0},
                                   {TextureParamWrappingS, 1 << 30}};
    for (auto const& [id, value] : kRefused) texture->SetParameter(id, value);
    EXPECT_EQ(TakeErrors().size(), std::size(kRefused));
    EXPECT_EQ(Sample(*texture, 2.25f, 0.25f), kGreen);
}

TEST_F(TextureObjectTest, EachViewHasSamplingStateOfItsOwn) {
    TexturePtr const model = MakeTexture(Corners());
    TextureParameter const nearest[] = {{TextureParamFilteringMin, TextureFilterNearest},
                                        {TextureParamFilteringMag, TextureFilterNearest},
                                        {TextureParamWrappingS, TextureWrapRepeat},
                                        {TextureParamWrappingT, TextureWrapMirroredRepeat}};
    TexturePtr const view(
        RendererFactory::CreateTextureObject(TextureDescriptor(model.get()), nearest, 4, {}));
    EXPECT_EQ(Sample(*view, 0.49f, 0.25f), kRed);
    EXPECT_EQ(Sample(*view, 1.25f, 0.25f), kRed);  // repeated across
    EXPECT_EQ(Sample(*view, 0.25f, -0.25f), kRed); // mirrored above
    EXPECT_EQ(Sample(*view, 0.25f, -0.75f), kBlue);
    EXPECT_EQ(Sample(*model, 1.25f, 0.25f), kGreen); // clamped still

    view->SetParameter(TextureParamWrappingS, TextureWrapClampToEdge);
    EXPECT_EQ(Sample(*view, 1.25f, 0.25f), kGreen);
    view->SetParameter(TextureParamWrappingS, TextureWrapRepeat);
    EXPECT_EQ(Sample(*view, 1.25f, 0.25f), kRed);
    EXPECT_EQ(Sample(*model, -0.25f, 0.75f), kBlue);
    EXPECT_LE(RendererFactory::GetStatistics().samplers, 3);
}

TEST_F(TextureObjectTest, NoSamplerOfOursOverrulesForeignTexturesAfterwards) {
    TexturePtr const texture = MakeTexture(Corners());
    TargetPtr const target = MakeTarget(*MakeTexture(2, 2));
    target->Activate();
    texture->Bind(1);
    glActiveTexture(GL_TEXTURE1);
    EXPECT_NE(GetInteger(GL_SAMPLER_BINDING), 0);
    target->Deactivate(false, false);
    EXPECT_EQ(GetInteger(GL_SAMPLER_BINDING), 0);

    texture->Bind(1);
    RendererFactory::Flush();
    EXPECT_EQ(GetInteger(GL_SAMPLER_BINDING), 0);
}

TEST_F(TextureObjectTest, BindingLeavesTheActiveUnitToTheHostAndRefusesUnitsThatDoNotExist) {
    TexturePtr const texture = MakeTexture(Corners());
    glActiveTexture(GL_TEXTURE5);
    texture->Bind(1);
    EXPECT_EQ(GetInteger(GL_ACTIVE_TEXTURE), GL_TEXTURE5);
    texture->Bind(-1);
    int const units = GetInteger(GL_MAX_COMBINED_TEXTURE_IMAGE_UNITS);
    texture->Bind(units - 1); // kept for uploads
    texture->Bind(units);
    EXPECT_EQ(TakeErrors().size(), 3u);
}

TEST_F(TextureObjectTest, LabelsAreCopiedAtOnceAndReachTheDriver) {
    TexturePtr const texture = MakeTexture(2, 2);
    EXPECT_STREQ(texture->GetLabel(), "");
    std::string label = "strip 3";
    texture->SetLabel(label.c_str());
    label.assign("changed");
    EXPECT_STREQ(texture->GetLabel(), "strip 3");

    auto const getLabel =
        reinterpret_cast<PFNGLGETOBJECTLABELKHRPROC>(eglGetProcAddress("glGetObjectLabelKHR"));
    ASSERT_TRUE(getLabel);
    char seen[64] = {};
    getLabel(GL_TEXTURE, NameBoundBy(*texture), sizeof seen, nullptr, seen);
    EXPECT_STREQ(seen, "strip 3");

    texture->SetLabel(std::string(100000, 'x').c_str());
    EXPECT_EQ(std::string(texture->GetLabel()).size(), 100000u);
    texture->SetLabel(nullptr);
    EXPECT_STREQ(texture->GetLabel(), "");
}

TEST_F(TextureObjectTest, WhatTheDeviceCannotHoldOrDoesNotKnowIsRefusedWithOneLine) {
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
    auto const make = [](TextureDescriptor const& descriptor, PixelSource const& source = {}) {
        return TexturePtr(RendererFactory::CreateTextureObject(descriptor, nullptr, 0, source));
    };
    Picture const image = MakeImage(4, 4);
    EXPECT_FALSE(make({4, 4, 1, 2, 6, 1, false, nullptr}));
    EXPECT_FALSE(make({4, 4, 0, 3, 6, 1, false, nullptr}));
    EXPECT_FALSE(make({4, 4, 0, 2, 7, 1, false, nullptr}));
    EXPECT_FALSE(make({4, 4, 0, 2, 6, 0, false, nullptr}));
    EXPECT_FALSE(make(TextureDescriptor(nullptr)));
    EXPECT_FALSE(make({4, 4, 0, 2, 6, 1, false, nullptr}, {image.pixels.data(), 0, 0, 3}));
    EXPECT_FALSE(RendererFactory::CreateOffscreenRenderTarget(nullptr));
    EXPECT_EQ(TakeErrors().size(), 7u);
}

TEST_F(TextureObjectTest, ATextureDeletedElsewhereGoesWhenTheRenderThreadNextRuns) {
    TexturePtr texture = MakeTexture(Corners());
    GLuint const name = NameBoundBy(*texture);
    EXPECT_EQ(Read(*texture), Corners()); // so that it has a frame buffer to go as well
    std::thread([&] { texture.reset(); }).join();
    EXPECT_EQ(RendererFactory::GetStatistics().textureObjects, 0);
    EXPECT_EQ(RendererFactory::GetStatistics().textures, 1);
    EXPECT_TRUE(glIsTexture(name));
    RendererFactory::Flush();
    EXPECT_FALSE(glIsTexture(name));
    RendererStatistics const after = RendererFactory::GetStatistics();
    EXPECT_EQ(after.textures, 0);
    EXPECT_EQ(after.frameBuffers, 0);
    EXPECT_EQ(after.samplers, 0);
}

} // namespace
} // namespace Moka::Testing
