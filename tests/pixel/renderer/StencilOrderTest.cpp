// The stencil as a clip, prepared again and again, and around draws, clears and foreign GL that change it: deferred,
// where equal preparations are drawn once and only where they are needed, and immediate, where each is drawn.
#include "tests/pixel/renderer/DrawFixture.h"

#include <random>

namespace Moka::Testing {
namespace {

constexpr int kSide = 32;

class Scene {
public:
    explicit Scene(unsigned seed) : mRandom(seed) {
        for (OffscreenImage& image : mImages) {
            TextureDescriptor const descriptor(kSide, kSide, 0, 2, 6, 1, false, nullptr);
            image.texture.reset(RendererFactory::CreateTextureObject(descriptor, nullptr, 0, {}));
            image.target.reset(RendererFactory::CreateOffscreenRenderTarget(image.texture.get()));
        }
        mBuffer.reset(RendererFactory::CreateDepthStencilBuffer(kSide, kSide));
        VertexDescriptor layout;
        layout.addAttribute(VertexAttributeType::Float, 2, -1, 0);
        mQuad.reset(RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleList, &layout, 0, 0));
        mBlend.reset(RendererFactory::CreateBlendStateObject(BlendStateDescriptor(true)));
        mState.reset(RendererFactory::CreateDepthStencilState(DepthStencilStateDescriptor(false, false)));
        mBrush = std::make_unique<Brush>(kColored, "color");
        mMask = std::make_unique<Brush>(kColored, "color");
        TakeTarget(0);
        mTarget->ClearDepthStencil(true, 1, true, 0);
    }
    ~Scene() { mTarget->DetachDepthStencil(); }
    Scene(Scene const&) = delete;
    Scene& operator=(Scene const&) = delete;

    void Draw(int steps) {
        for (int i = 0; i < steps; ++i) Step();
        mTarget->Deactivate(false, false);
    }
    Picture Read(std::size_t image) const {
        Picture picture = MakeImage(kSide, kSide);
        mImages[image].target->ReadPixels(0, 0, kSide, kSide, {picture.pixels.data(), kSide, 0, 0});
        return picture;
    }

private:
    int Below(int end) { return std::uniform_int_distribution<int>(0, end - 1)(mRandom); }

    void Step() {
        switch (Below(16)) {
        case 0:
        case 1:
        case 2:
        case 3:
            return Prepare(Below(3));
        case 4:
            return Paint(StencilAlways, Below(2) == 0 ? StencilIncrementSaturate : StencilZero);
        case 5:
            return Paint(StencilEqual, StencilIncrementSaturate);
        case 6:
            RendererFactory::GetRasterizerState()->SetScissorEnabled(true);
            RendererFactory::GetRasterizerState()->SetScissorRect({Below(20), Below(20), 9, 9});
            mTarget->ClearDepthStencil(Below(2) == 0, 1, true, Below(2));
            return RendererFactory::GetRasterizerState()->SetScissorEnabled(false);
        case 7:
            return mTarget->ClearDepthStencil(true, 1, Below(2) == 0, 1);
        case 8:
            return RendererFactory::Flush();
        case 9:
            RendererFactory::Commit();
            return RendererFactory::InvalidateState();
        case 10:
            return TakeTarget(static_cast<std::size_t>(Below(2)));
        case 11:
            mMask = std::make_unique<Brush>(kColored, "color");
            return;
        default:
            return Paint(StencilEqual, StencilKeep);
        }
    }

    void TakeTarget(std::size_t image) {
        mTarget = mImages[image].target.get();
        mTarget->Activate();
        mTarget->AttachDepthStencil(mBuffer.get());
    }

    // One of few, so that the same ones come again.
    void Prepare(int kind) {
        mTarget->ClearDepthStencil(false, 1, true, kind == 2 ? 1 : 0);
        Apply(StencilAlways, StencilReplace, false);
        auto const at = static_cast<float>(kind);
        Fill(*mMask, {at, at, at + 4, at + 4}, 1);
        if (kind == 1) Fill(*mMask, {5, 1, 7, 7}, 1);
    }
    void Paint(StencilComparison comparison, StencilOperation pass) {
        Apply(comparison, pass, true);
        auto const l = static_cast<float>(Below(6));
        auto const b = static_cast<float>(Below(6));
        auto const size = static_cast<float>(1 + Below(6));
        Fill(*mBrush, {l, b, l + size, b + size}, static_cast<float>(++mPaints % 16) / 15);
    }

    void Apply(StencilComparison comparison, StencilOperation pass, bool writesColor) const {
        BlendStateDescriptor blend(true);
        blend.SetEnabled(false, writesColor);
        mBlend->SetDescriptor(blend);
        mBlend->Apply();
        DepthStencilStateDescriptor state(false, true);
        state.SetStencilFunction(comparison, 1, 0xFF, pass == StencilKeep ? 0u : 0xFFu);
        state.SetStencilOperation(StencilKeep, StencilKeep, pass);
        mState->SetDescriptor(state);
        mState->Apply();
        RendererFactory::GetRasterizerState()->SetScissorEnabled(false);
    }
    // box: as the programs have it, 0 to kSize over the target.
    void Fill(Brush const& brush, DrawBounds const& box, float red) const {
        float const color[] = {red, 0.5f, 1 - red, 1};
        brush.program->MakeCurrent();
        brush.parameter->Set(color);
        float const corners[] = {box.left, box.bottom, box.right, box.bottom, box.left,  box.top,
                                 box.left, box.top,    box.right, box.bottom, box.right, box.top};
        mQuad->SetVertices(0, corners, 6);
        auto const scale = [](float at) { return at / kSize * 2 - 1; };
        mQuad->SetBounds({scale(box.left), scale(box.bottom), scale(box.right), scale(box.top)});
        EXPECT_TRUE(mQuad->Draw(0, -1, 1));
    }

    std::mt19937 mRandom;
    OffscreenImage mImages[2];
    DepthStencilPtr mBuffer;
    GraphicsPtr mQuad;
    BlendPtr mBlend;
    StatePtr mState;
    std::unique_ptr<Brush> mBrush;
    std::unique_ptr<Brush> mMask;
    IRenderTarget* mTarget = nullptr;
    int mPaints = 0;
};

using StencilOrderTest = RendererFixture;

TEST_F(StencilOrderTest, DeferredAndImmediateGiveTheSamePictures) {
    std::uint64_t clears[2] = {};
    for (unsigned seed = 0; seed < 40; ++seed) {
        Picture pictures[2][2];
        for (bool const isDeferred : {false, true}) {
            RendererFactory::SetDeferred(isDeferred);
            std::uint64_t const before = RendererFactory::GetStatistics().clears;
            Scene scene(seed);
            scene.Draw(30);
            for (std::size_t i : {0u, 1u}) pictures[isDeferred][i] = scene.Read(i);
            clears[isDeferred] += RendererFactory::GetStatistics().clears - before;
        }
        for (int i : {0, 1}) EXPECT_EQ(pictures[0][i], pictures[1][i]) << "seed " << seed << ", image " << i;
    }
    EXPECT_LT(clears[1], clears[0] * 9 / 10);
}

} // namespace
} // namespace Moka::Testing
