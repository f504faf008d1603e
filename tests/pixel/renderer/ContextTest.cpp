// The renderer's life in a context: attaching, limits, foreign GL in between, deferral, and what is left
// when the context goes first.
#include "tests/pixel/renderer/RendererFixture.h"

#include "moka/renderer/IRendererDeviceCaps.h"

#include <thread>

namespace Moka::Testing {
namespace {

class ContextTest : public RendererFixture {
protected:
    static void Reattach(RendererLimits const& limits) {
        RendererFactory::DetachContext();
        ASSERT_TRUE(Attach(limits));
    }
};

TEST_F(ContextTest, CapabilitiesAreTheDriversAndAskedForAnywhere) {
    IRendererDeviceCaps const* const caps = RendererFactory::GetRendererDeviceCaps();
    int const largest = GetInteger(GL_MAX_TEXTURE_SIZE);
    std::string const renderer = reinterpret_cast<char const*>(glGetString(GL_RENDERER));
    std::thread([&] {
        EXPECT_EQ(caps->GetMaxTextureSize(), largest);
        EXPECT_EQ(caps->GetRenderer(), renderer);
        EXPECT_TRUE(RendererFactory::IsGPUNameEqualTo(renderer.c_str()));
        EXPECT_FALSE(RendererFactory::IsGPUNameEqualTo(nullptr));
    }).join();
    EXPECT_STREQ(caps->GetVendor(), reinterpret_cast<char const*>(glGetString(GL_VENDOR)));
    EXPECT_EQ(std::string(caps->GetVersion()).rfind("OpenGL ES 3", 0), 0u);
}

TEST_F(ContextTest, LimitsLowerTheDeviceButNeverRaiseIt) {
    int const device = GetInteger(GL_MAX_TEXTURE_SIZE);
    IRendererDeviceCaps const* const caps = RendererFactory::GetRendererDeviceCaps();
    Reattach({16});
    EXPECT_EQ(caps->GetMaxTextureSize(), 16);
    EXPECT_TRUE(MakeTexture(16, 16));
    EXPECT_FALSE(MakeTexture(17, 1));
    EXPECT_EQ(TakeErrors().size(), 1u);
    EXPECT_FALSE(Attach()); // a second time
    EXPECT_EQ(TakeErrors().size(), 1u);
    EXPECT_EQ(caps->GetMaxTextureSize(), 16);
    Reattach({device * 2});
    EXPECT_EQ(caps->GetMaxTextureSize(), device);
}

TEST_F(ContextTest, ObjectsThatOutliveTheirContextAreInertInTheNextOne) {
    TexturePtr texture = MakeTexture(MakeImage(4, 4, kRed));
    TexturePtr elsewhere = MakeTexture(MakeImage(4, 4, kRed));
    TargetPtr target = MakeTarget(*texture);
    DepthStencilPtr buffer = MakeDepthStencil(4, 4);
    target->AttachDepthStencil(buffer.get());
    target->Activate();
    RendererFactory::DetachContext();
    StartEgl();
    ASSERT_TRUE(Attach());

    // The new context hands out the same small names again.
    TexturePtr const stranger = MakeTexture(MakeImage(4, 4, kGreen));
    TexturePtr const another = MakeTexture(MakeImage(4, 4, kGreen));
    TargetPtr const strangersTarget = MakeTarget(*stranger);

    texture->SetLabel("old");
    texture->Bind(0);
    texture->Replace(MakeImage(4, 4, kBlue).pixels.data(), 0);
    texture->DrawToCurrent();
    texture->CopyFromRenderTarget();
    target->Activate();
    target->ClearColor(0, 0, 1, 1);
    target->ClearDepthStencil(true, 1, true, 1);
    EXPECT_EQ(Read(*target, 4, 4), MakeImage(4, 4));
    target->Deactivate(true, true);
    EXPECT_FALSE(RendererFactory::CreateTextureObject(TextureDescriptor(texture.get()), nullptr, 0, {}));
    EXPECT_FALSE(MakeTarget(*texture));
    EXPECT_EQ(TakeErrors().size(), 2u);
    std::thread([&] { elsewhere.reset(); }).join();
    buffer.reset();
    target.reset();
    texture.reset();
    RendererFactory::Flush();

    EXPECT_EQ(Read(*stranger), MakeImage(4, 4, kGreen));
    EXPECT_EQ(Read(*another), MakeImage(4, 4, kGreen));
    EXPECT_EQ(Count().textures, 2);
}

#if defined(MOKA_CHECKS) && MOKA_CHECKS
using ContextDeathTest = ContextTest;

TEST_F(ContextDeathTest, UseOnAnotherThreadIsABrokenContract) {
    ::testing::FLAGS_gtest_death_test_style = "threadsafe";
    TexturePtr const texture = MakeTexture(2, 2);
    EXPECT_DEATH(std::thread([&] { texture->Bind(0); }).join(), "");
}
#endif

} // namespace
} // namespace Moka::Testing
