// The pen canvas around real external GL: the ink lies where its matrix and clip say, and whatever the external code
// leaves behind, the library's own draws before and after it are right. With deferral, and without.
#include "apps/moka/PenStroke.h"
#include "moka/graphics/bitmap/IMKBitmapWritable.h"
#include "moka/graphics/paint/MKPaint.h"
#include "scenes/SceneRenderer.h"
#include "tests/pixel/RenderThreadFixture.h"
#include "tests/support/ImageCompare.h"

#include <GLES3/gl3.h>
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

namespace Moka::Testing {
namespace {

using BitmapPtr = RefPtr<IMKBitmap>;
using C = IMKCanvasBase;

constexpr int kWidth = 40;
constexpr int kHeight = 26;
constexpr Color kPaper{10, 20, 30, 255};
constexpr Color kInk{0, 255, 0, 255};
constexpr Color kWhite{255, 255, 255, 255};
constexpr Color kRed{255, 0, 0, 255};

void FillImage(Picture& image, Rect const& r, Color const& color) {
    for (int y = r.top; y < r.bottom; ++y)
        for (int x = r.left; x < r.right; ++x) image.SetColor(x, y, color);
}

// Everything that a draw depends on, so that nothing could be drawn with it, or the wrong thing.
void LeaveAMess(GLuint texture, GLuint sampler) {
    for (int const test : {GL_BLEND, GL_SCISSOR_TEST, GL_STENCIL_TEST, GL_DEPTH_TEST, GL_CULL_FACE})
        glEnable(static_cast<GLenum>(test));
    glBlendEquation(GL_FUNC_REVERSE_SUBTRACT);
    glBlendFunc(GL_ZERO, GL_ZERO);
    glColorMask(GL_FALSE, GL_TRUE, GL_FALSE, GL_FALSE);
    glScissor(1, 1, 2, 2);
    glViewport(3, 3, 5, 4);
    glStencilFunc(GL_NEVER, 0, 255);
    glStencilMask(0);
    glDepthFunc(GL_NEVER);
    glCullFace(GL_FRONT_AND_BACK);
    for (GLenum unit = 0; unit < 3; ++unit) {
        glActiveTexture(GL_TEXTURE0 + unit);
        glBindTexture(GL_TEXTURE_2D, texture); // has no image
        glBindSampler(unit, sampler);
    }
    glPixelStorei(GL_UNPACK_ALIGNMENT, 8);
    glPixelStorei(GL_UNPACK_SKIP_ROWS, 2);
    glPixelStorei(GL_PACK_ROW_LENGTH, 3);
    glBindFramebuffer(GL_FRAMEBUFFER, 0);
    glClearColor(1, 0, 1, 1);
}

class PenCanvasPixel : public RenderThreadFixture, public ::testing::WithParamInterface<bool> {
protected:
    PenCanvasPixel() {
        thread->Call([this] {
            RendererFactory::SetDeferred(GetParam());
            ink = Tool::GlInk::Create();
            glGenTextures(1, &texture);
            glGenSamplers(1, &sampler);
        });
    }
    ~PenCanvasPixel() override {
        thread->Call([this] {
            RendererFactory::Flush();
            glDeleteSamplers(1, &sampler);
            glDeleteTextures(1, &texture);
            ink.reset();
            EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
            RendererFactory::InvalidateState();
        });
    }

    // What the pen engine does on the render thread, behind what was asked for before.
    void DrawInk(RectF const& rect) {
        thread->Call([&] {
            pen->EnableClipRT(0);
            bitmap->GetBitmapWritable()->ActivateFrameBufferRT(false);
            // In the middle of ink that is wide enough to be solid.
            ink->Draw(pen->GetCanvasMatrix(),
                      {{rect.left, rect.top, 0, 1},
                       {rect.left, rect.bottom, 0, 1},
                       {rect.right, rect.top, 0, 1},
                       {rect.right, rect.bottom, 0, 1}},
                      {0, 1, 0, 1});
            LeaveAMess(texture, sampler);
            ink->Bind();
            EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
            pen->DisableClipRT();
            bitmap->GetBitmapWritable()->DeactivateFrameBufferRT(false, DiscardFramebufferNone);
        });
    }
    void DrawInkAt(int x) {
        DrawInk(RectF(static_cast<float>(x), 0, static_cast<float>(x) + 1, 1));
        FillImage(expected, Rect(x, 0, x + 1, 1), kInk);
    }
    void DrawPicture(int x, int y, Picture const& picture) {
        canvas->DrawBitmap(Create(picture).Get(), static_cast<float>(x), static_cast<float>(y), nullptr);
        expected = expected.With(x, y, picture);
    }

    void ExpectPicture(std::string const& what) {
        Picture image(kWidth, kHeight);
        bitmap->GetBitmapData(bitmap->GetBitmapRect(), image.pixels.data());
        ImageDifference const difference = CompareImages(expected, image);
        if (difference.differingPixels > 0)
            ADD_FAILURE() << what << ": " << difference << "; " << KeepDifference(expected, image, what);
    }

    std::unique_ptr<Tool::GlInk> ink; // render thread, like the names
    GLuint texture = 0;
    GLuint sampler = 0;
    Picture expected = MakeChecker(kWidth, kHeight, kWidth + kHeight, kPaper, kPaper);
    BitmapPtr bitmap = Create(expected);
    RefPtr<IMKPenCanvas> pen = NewPenCanvas(*thread, bitmap);
    RefPtr<IMKCanvas> canvas = NewCanvas(*thread, bitmap);
};

// Its three panels: whole, cut by two clips, and turned under a clip that replaced another.
TEST_P(PenCanvasPixel, TheScenesInkFillsItsPanelsAndNothingElse) {
    Tool::PenStroke stroke(*thread);
    Picture const picture = RenderScene(*Scenes::FindScene("pen-stroke"), *thread, &stroke);
    auto const countInk = [&](int left, int top, int right, int bottom) {
        int count = 0;
        for (int y = top; y < bottom; ++y)
            for (int x = left; x < right; ++x) count += picture.GetColor(x, y)[0] < 100 ? 1 : 0;
        return count;
    };
    EXPECT_GT(countInk(10, 10, 150, 130), 1000);
    EXPECT_GT(countInk(190, 40, 290, 90), 300);
    EXPECT_GT(countInk(360, 25, 440, 115), 300);
    EXPECT_EQ(countInk(151, 0, 189, 140) + countInk(291, 0, 359, 140) + countInk(190, 0, 480, 24), 0);
    // External code has ended: draws are joined again.
    thread->Call([this] {
        auto const next = NewCanvas(*thread, bitmap, UseFrom::RenderThread);
        std::uint64_t const before = RendererFactory::GetStatistics().draws;
        for (float const x : {1.0f, 9.0f}) next->DrawRect(x, 1, x + 5, 5, nullptr);
        RendererFactory::Flush();
        EXPECT_EQ(RendererFactory::GetStatistics().draws - before, GetParam() ? 1u : 2u);
    });
}

// Each of these takes another way through the renderer: plain, blended, textured, clipped by the scissor,
// clipped by the stencil, cleared, uploaded.
TEST_P(PenCanvasPixel, OwnDrawsBeforeAndAfterAreRightWhateverIsLeftBehind) {
    MKPaint paint;
    canvas->DrawRect(2, 2, 30, 8, &paint); // still in the renderer's hands when the pen comes
    DrawInk(RectF(10, 4, 16, 20));
    FillImage(expected, Rect(2, 2, 30, 8), kWhite);
    FillImage(expected, Rect(10, 4, 16, 20), kInk);
    paint.SetColor(static_cast<int>(0xFFFF0000));
    canvas->DrawRect(14, 6, 20, 12, &paint);
    FillImage(expected, Rect(14, 6, 20, 12), kRed);
    DrawInkAt(0);
    paint.SetColor(1, 1, 1, 0);
    canvas->DrawRect(0, 0, 40, 26, &paint); // blends to nothing, unless blending is wrong
    DrawInkAt(1);
    DrawPicture(30, 10, MakeGradient(6, 5));
    ExpectPicture("drawn around ink");

    DrawInkAt(2);
    canvas->Save(C::SaveClip);
    canvas->SetClipRect(20, 14, 8, 6, C::Intersect);
    canvas->DrawRect(0, 0, 40, 26, nullptr);
    FillImage(expected, Rect(20, 14, 28, 20), kWhite);
    DrawInkAt(3);
    canvas->SetClipRect(4, 18, 4, 3, C::Union);
    canvas->Clear(1, 0, 0, 1);
    FillImage(expected, Rect(20, 14, 28, 20), kRed);
    FillImage(expected, Rect(4, 18, 8, 21), kRed);
    canvas->Restore(-1);
    ExpectPicture("clipped around ink");
    DrawInkAt(4);
    DrawInkAt(5); // with nothing of the library's in between
    DrawPicture(33, 20, MakeGradient(5, 3));
    ExpectPicture("uploaded after ink");
}

INSTANTIATE_TEST_SUITE_P(Renderer, PenCanvasPixel, ::testing::Values(true, false),
                         [](auto const& test) { return test.param ? "Deferred" : "Immediate"; });

} // namespace
} // namespace Moka::Testing
