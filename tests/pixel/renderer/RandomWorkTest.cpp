// Everything that the renderer does, in random order and with the host's GL in between, deferred and immediate: the
// pixels are those of a model in memory, and after each flush the host finds its own state.
#include "tests/pixel/renderer/DrawFixture.h"

#include "moka/base/Rect.h"

#include <cstring>
#include <random>
#include <thread>

namespace Moka::Testing {
namespace {

constexpr std::size_t kImages = 3;
constexpr std::size_t kNone = kImages;
constexpr int kWidths[kImages] = {kSize, kSize, 6};
constexpr int kHeights[kImages] = {kSize, kSize, 11};
constexpr GLenum kObstacles[] = {GL_CULL_FACE, GL_DEPTH_TEST, GL_RASTERIZER_DISCARD};
constexpr GLenum kTransfers[] = {GL_UNPACK_ROW_LENGTH, GL_UNPACK_SKIP_ROWS, GL_UNPACK_SKIP_PIXELS,
                                 GL_PACK_ROW_LENGTH,   GL_PACK_SKIP_ROWS,   GL_PACK_SKIP_PIXELS};
constexpr GLint kHostsTransfer = 5;
constexpr Color kColors[] = {kClear, kRed, kGreen, kBlue, {255, 255, 255, 255}};

struct Box {
    int x, y, w, h;

    bool Has(int px, int py) const { return px >= x && px < x + w && py >= y && py < y + h; }
};
constexpr Box kAll{0, 0, 100, 100};

class RandomWorkTest : public DrawFixture {
protected:
    struct Image {
        OffscreenImage real;
        Picture model;
    };

    RandomWorkTest() {
        // From here on the driver gives deleted names away again.
        glBindFramebuffer(GL_FRAMEBUFFER, kLastName);
        glBindTexture(GL_TEXTURE_2D, kLastName);
        glGenVertexArrays(1, &mHostsArray);
        glGenBuffers(1, &mHostsBuffer);
    }
    ~RandomWorkTest() override {
        for (GLenum const obstacle : kObstacles) glDisable(obstacle);
        glBindVertexArray(0);
        glDeleteVertexArrays(1, &mHostsArray);
        glDeleteBuffers(1, &mHostsBuffer);
        glDeleteFramebuffers(1, &kLastName);
        glDeleteTextures(1, &kLastName);
        RendererFactory::InvalidateState();
    }

    void Work(unsigned seed) {
        mRandom.seed(seed);
        mMask = std::make_unique<Brush>(kColored, "color");
        mBuffer = MakeDepthStencil(kSize, kSize);
        mStencil.clear();
        mHolder = kNone;
        for (std::size_t i = 0; i < kImages; ++i) Renew(i);
        TakeHostsTurn();
        for (int i = 0; i < 120; ++i) Step();
        for (std::size_t i = 0; i < kImages; ++i) ExpectPart(i, {0, 0, kWidths[i], kHeights[i]});
        EndTurn();
        EXPECT_EQ(mHost.Read(), mHostModel);
        mHostsState.clear();
        RendererFactory::InvalidateState();
    }

private:
    int Below(int end) { return std::uniform_int_distribution<int>(0, end - 1)(mRandom); }
    bool Flip() { return Below(2) == 0; }
    std::size_t AnyImage() { return static_cast<std::size_t>(Below(kImages)); }
    Box AnyBox() { return {Below(10) - 2, Below(10) - 2, Below(9) - 1, Below(9)}; }
    Image& Active() { return mImages[mActive]; }

    void Step() {
        std::size_t const any = AnyImage();
        switch (Below(24)) {
        case 0:
            return Activate(any);
        case 1:
            return Renew(any);
        case 2:
            return TakeHostsTurn();
        case 3:
            return RendererFactory::Flush();
        case 4:
            return Upload(any);
        case 5:
            return Copy(any, mActive);
        case 6:
            return Copy(mActive, any);
        case 7:
            return ClearColor(any);
        case 8:
            mScissor = Flip() ? kAll : AnyBox();
            return;
        case 9:
            mAdds = !mAdds;
            return;
        case 10:
            return ExpectPart(any, AnyBox());
        case 11:
            mMask = std::make_unique<Brush>(kColored, "color");
            return;
        case 12:
        case 13:
        case 14:
            return PrepareStencil(Below(3));
        case 15:
            return ClearStencil(Flip(), Below(2));
        case 16:
            mComparison = Flip() ? StencilAlways : StencilEqual;
            mPass = Below(3) > 0 ? StencilKeep : Flip() ? StencilIncrementSaturate : StencilZero;
            return;
        case 17:
            return mImages[any].real.texture->SetParameter(
                TextureParamWrappingS, Flip() ? TextureWrapRepeat : TextureWrapClampToEdge);
        case 18:
        case 19:
            return PaintImage(any);
        default:
            return FillBox(colored, {Below(7), Below(7), 1 + Below(6), 1 + Below(6)}, kColors[Below(5)],
                           true);
        }
    }

    void Activate(std::size_t image) {
        mActive = image;
        Active().real.target->Activate();
        if (Flip() && image != 2) TakeBuffer();
    }

    // Of its objects, any goes first; the texture sometimes on another thread.
    void Renew(std::size_t number) {
        Image& image = mImages[number];
        if (mHolder == number) mHolder = kNone;
        bool const targetFirst = Flip();
        if (targetFirst) image.real.target.reset();
        if (Flip()) {
            std::thread([&] { image.real.texture.reset(); }).join();
        } else {
            image.real.texture.reset();
        }
        image.real.target.reset();
        int const w = kWidths[number];
        int const h = kHeights[number];
        image.model = Flip() ? MakePattern(w, h) : MakeImage(w, h, kClear);
        image.real.texture = image.model.GetColor(0, 0)[3] > 0 ? MakeTexture(image.model) : MakeTexture(w, h);
        image.real.target = MakeTarget(*image.real.texture);
        if (mActive == number || mActive == kNone) Activate(number);
    }

    void EndTurn() {
        if (mActive != kNone) {
            bool const discards = mActive == mHolder && Flip();
            Active().real.target->Deactivate(false, discards);
            if (discards) {
                Active().real.target->DetachDepthStencil();
                mHolder = kNone;
                mStencil.clear();
            }
        }
        mActive = kNone;
        RendererFactory::Flush();
        ExpectHostsState();
    }
    void TakeHostsTurn() {
        EndTurn();
        glBindFramebuffer(GL_READ_FRAMEBUFFER, 0);
        glBindFramebuffer(GL_DRAW_FRAMEBUFFER, mHost.GetName());
        glDisable(GL_RASTERIZER_DISCARD);
        glColorMask(1, 1, 1, 1);
        Box const box{Below(7), Below(7), 2, 2};
        glEnable(GL_SCISSOR_TEST);
        glScissor(box.x, box.y, box.w, box.h);
        GLfloat const red[] = {1, 0, 0, 1};
        glClearBufferfv(GL_COLOR, 0, red);
        ChangeModel(mHostModel, box, [](int, int, Color) { return kRed; });
        LeaveHostsState();
        RendererFactory::InvalidateState();
        glDisable(GL_SCISSOR_TEST);
        // Without an active target, the host's frame buffer is the current one.
        std::size_t const any = AnyImage();
        Fill(kBlue, 1, 2, 3, 5);
        ChangeModel(mHostModel, {1, 2, 2, 3}, [](int, int, Color) { return kBlue; });
        Copy(kNone, any);
        Copy(AnyImage(), kNone);
        EndTurn();
        RendererFactory::InvalidateState();
        Activate(AnyImage());
    }

    void LeaveHostsState() {
        glViewport(0, 0, kSize, kSize);
        for (GLenum const obstacle : kObstacles) Flip() ? glEnable(obstacle) : glDisable(obstacle);
        glCullFace(GL_FRONT_AND_BACK);
        glDepthFunc(GL_NEVER);
        glEnable(GL_BLEND);
        glBlendFunc(GL_ZERO, GL_ZERO);
        glEnable(GL_STENCIL_TEST);
        glStencilFunc(GL_NEVER, 0, 0xFF);
        glStencilMask(0x11);
        glDepthMask(GL_FALSE);
        glColorMask(GL_FALSE, GL_FALSE, GL_TRUE, GL_FALSE);
        glBindVertexArray(Flip() ? mHostsArray : 0);
        glBindBuffer(GL_ARRAY_BUFFER, Flip() ? mHostsBuffer : 0);
        glBindBuffer(GL_UNIFORM_BUFFER, mHostsBuffer);
        glActiveTexture(GL_TEXTURE1);
        glBindTexture(GL_TEXTURE_2D, kLastName);
        for (GLenum const transfer : kTransfers) glPixelStorei(transfer, kHostsTransfer);
        glPixelStorei(GL_UNPACK_ALIGNMENT, 1);
        glPixelStorei(GL_PACK_ALIGNMENT, 8);
        glBindBuffer(GL_PIXEL_UNPACK_BUFFER, mHostsBuffer);
        glBindBuffer(GL_PIXEL_PACK_BUFFER, mHostsBuffer);
        mHostsState = ReadHostsState();
    }
    static std::vector<GLint> ReadHostsState() {
        std::vector<GLint> state(4);
        glGetIntegerv(GL_VIEWPORT, state.data());
        for (int const name : {GL_DRAW_FRAMEBUFFER_BINDING, GL_READ_FRAMEBUFFER_BINDING,
                               GL_VERTEX_ARRAY_BINDING, GL_ARRAY_BUFFER_BINDING, GL_UNIFORM_BUFFER_BINDING,
                               GL_CULL_FACE, GL_RASTERIZER_DISCARD, GL_ACTIVE_TEXTURE}) {
            state.push_back(GetInteger(static_cast<GLenum>(name)));
        }
        return state;
    }
    void ExpectHostsState() const {
        if (mHostsState.empty()) return;
        EXPECT_EQ(ReadHostsState(), mHostsState);
        // Not restored, but back at the default once it was changed.
        for (GLenum const transfer : kTransfers) EXPECT_EQ(GetInteger(transfer) % kHostsTransfer, 0);
        for (int const unit : {GL_TEXTURE2, GL_TEXTURE1}) {
            glActiveTexture(static_cast<GLenum>(unit));
            EXPECT_EQ(GetInteger(GL_SAMPLER_BINDING), 0);
        }
    }

    // Rows of any distance, partly outside.
    void Upload(std::size_t number) {
        Box const box = AnyBox();
        Picture const source = MakePattern(8, 8);
        auto const stride = static_cast<std::size_t>(32 + Below(9));
        std::vector<unsigned char> rows(stride * 8);
        for (std::size_t y = 0; y < 8; ++y) std::memcpy(&rows[y * stride], &source.pixels[y * 32], 32);
        mImages[number].real.texture->Replace(Rect(box.x, box.y, box.x + box.w, box.y + box.h), rows.data(),
                                              static_cast<int>(stride));
        ChangeModel(mImages[number].model, box,
                    [&](int x, int y, Color) { return source.GetColor(x - box.x, y - box.y); });
    }

    // The smaller of both sizes, whatever the state; nothing of what is drawn into.
    void Copy(std::size_t to, std::size_t from) {
        if (to == mActive) {
            mImages[from].real.texture->DrawToCurrent();
        } else {
            mImages[to].real.texture->CopyFromRenderTarget();
        }
        if (to == from) return;
        Picture const source = ModelOf(from);
        ChangeModel(ModelOf(to), {0, 0, source.width, source.height},
                    [&](int x, int y, Color) { return source.GetColor(x, y); });
    }
    Picture& ModelOf(std::size_t image) { return image == kNone ? mHostModel : mImages[image].model; }

    void ClearColor(std::size_t number) {
        ApplyStates(false, true);
        Clear(*mImages[number].real.target, kGreen);
        ChangeModel(mImages[number].model, mScissor, [](int, int, Color) { return kGreen; });
    }

    void ExpectPart(std::size_t number, Box const& box) {
        Picture seen = MakeImage(20, 20);
        mImages[number].real.target->ReadPixels(box.x, box.y, box.w, box.h, {seen.pixels.data(), 20, 3, 2});
        Picture expected = MakeImage(20, 20);
        Picture const& model = mImages[number].model;
        for (int y = std::max(box.y, 0); y < std::min(box.y + box.h, model.height); ++y) {
            for (int x = std::max(box.x, 0); x < std::min(box.x + box.w, model.width); ++x)
                expected.SetColor(x - box.x + 2, y - box.y + 3, model.GetColor(x, y));
        }
        EXPECT_EQ(seen, expected) << "image " << number;
    }

    void TakeBuffer() {
        Active().real.target->AttachDepthStencil(mBuffer.get());
        mHolder = mActive;
        if (!mStencil.empty()) return;
        mStencil.resize(kSize * kSize);
        Box const scissor = std::exchange(mScissor, kAll);
        ClearStencil(true, 0);
        mScissor = scissor;
    }
    void ClearStencil(bool depth, int value) {
        if (mHolder != mActive) return;
        ApplyStates(false, true);
        Active().real.target->ClearDepthStencil(depth, 1, true, value);
        for (int i = 0; i < kSize * kSize; ++i) {
            if (mScissor.Has(i % kSize, i / kSize)) mStencil[static_cast<std::size_t>(i)] = value;
        }
    }
    // One of few, so that the same ones come again.
    void PrepareStencil(int kind) {
        if (mHolder != mActive) return;
        Box const scissor = std::exchange(mScissor, kAll);
        StencilComparison const comparison = std::exchange(mComparison, StencilAlways);
        StencilOperation const pass = std::exchange(mPass, StencilReplace);
        ClearStencil(false, kind == 2 ? 1 : 0);
        FillBox(*mMask, {kind, kind, 4, 4}, kRed, false);
        if (kind == 1) FillBox(*mMask, {5, 1, 2, 6}, kRed, false);
        mScissor = scissor;
        mComparison = kind == 0 ? comparison : StencilEqual;
        mPass = kind == 0 ? pass : StencilKeep;
    }

    void ApplyStates(bool tests, bool writesColor) {
        BlendStateDescriptor descriptor(true);
        descriptor.SetEnabled(mAdds, writesColor);
        descriptor.SetColorEquation(BlendingFunction::Add, BlendingFactor::One, BlendingFactor::One);
        descriptor.SetAlphaEquation(BlendingFunction::Add, BlendingFactor::One, BlendingFactor::One);
        blend->SetDescriptor(descriptor);
        blend->Apply();
        if (tests && mHolder == mActive) {
            SetStencil(mComparison, 1, mPass);
        } else {
            stencil->SetDescriptor(DepthStencilStateDescriptor(false, false));
            stencil->Apply();
        }
        IRasterizerState* const rasterizer = RendererFactory::GetRasterizerState();
        rasterizer->SetScissorEnabled(mScissor.w < kAll.w);
        rasterizer->SetScissorRect({mScissor.x, mScissor.y, mScissor.w, mScissor.h});
    }
    // In eighths of the target.
    void FillBox(Brush const& brush, Box const& box, Color const& color, bool writesColor) {
        ApplyStates(true, writesColor);
        // A quarter of a pixel covers the same centres.
        float const shift = mActive == 2 ? 0.0f : static_cast<float>(Below(3) - 1) / 4;
        auto const x = static_cast<float>(box.x) + shift;
        auto const y = static_cast<float>(box.y) + shift;
        Fill(brush, color, x, y, x + static_cast<float>(box.w), y + static_cast<float>(box.h));
        Draw(box, writesColor, [&](int, int) { return color; });
    }
    // Texel on pixel, so that an image may be drawn onto itself.
    void PaintImage(std::size_t number) {
        if (number == 2 || mActive == 2) return;
        ApplyStates(true, true);
        Box const box{Below(6), Below(6), 3, 3};
        Paint(*mImages[number].real.texture, static_cast<float>(box.x), static_cast<float>(box.y),
              static_cast<float>(box.x + 3), static_cast<float>(box.y + 3));
        Draw(box, true, [&](int x, int y) { return mImages[number].model.GetColor(x, y); });
    }

    template <class Source>
    void Draw(Box const& box, bool writesColor, Source const& source) {
        Picture& model = Active().model;
        ChangeModel(model, kAll, [&](int x, int y, Color const& old) {
            bool const isInside = x * kSize + kSize / 2 >= box.x * model.width &&
                                  x * kSize + kSize / 2 < (box.x + box.w) * model.width &&
                                  y * kSize + kSize / 2 >= box.y * model.height &&
                                  y * kSize + kSize / 2 < (box.y + box.h) * model.height;
            if (!isInside || !mScissor.Has(x, y) || !PassesStencil(x, y) || !writesColor) return old;
            Color color = source(x, y);
            for (std::size_t i = 0; i < 4 && mAdds; ++i)
                color[i] = static_cast<std::uint8_t>(std::min(255, color[i] + old[i]));
            return color;
        });
    }
    bool PassesStencil(int x, int y) {
        if (mHolder != mActive) return true;
        int& value = mStencil[static_cast<std::size_t>(y * kSize + x)];
        if (mComparison == StencilEqual && value != 1) return false;
        if (mPass == StencilReplace) value = 1;
        if (mPass == StencilZero) value = 0;
        if (mPass == StencilIncrementSaturate) ++value;
        return true;
    }
    template <class Change>
    static void ChangeModel(Picture& model, Box const& box, Change const& change) {
        for (int y = 0; y < model.height; ++y) {
            for (int x = 0; x < model.width; ++x)
                if (box.Has(x, y)) model.SetColor(x, y, change(x, y, model.GetColor(x, y)));
        }
    }

    std::mt19937 mRandom;
    std::array<Image, kImages> mImages;
    std::size_t mActive = kNone;
    Box mScissor = kAll;
    bool mAdds = false;
    std::unique_ptr<Brush> mMask;

    DepthStencilPtr mBuffer;
    std::vector<int> mStencil; // empty until it was cleared
    std::size_t mHolder = kNone;
    StencilComparison mComparison = StencilAlways;
    StencilOperation mPass = StencilKeep;

    HostFrameBuffer const mHost{kSize, kSize};
    Picture mHostModel = Filled(kUntouched);
    GLuint mHostsArray = 0;
    GLuint mHostsBuffer = 0;
    std::vector<GLint> mHostsState; // empty until the host had its first turn
};

TEST_P(RandomWorkTest, DrawsTheModelsPixelsAndLeavesTheHostsState) {
    for (unsigned seed = 0; seed < 30 && !HasFailure(); ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        Work(seed);
    }
    RendererStatistics const now = Count();
    if (IsDeferred()) {
        EXPECT_LT(now.draws, now.drawRequests);
        EXPECT_GT(now.variants, 0);
    }
}

INSTANTIATE_TEST_SUITE_P(ImmediateAndDeferred, RandomWorkTest, ::testing::Bool(), GetDrawMode);

} // namespace
} // namespace Moka::Testing
