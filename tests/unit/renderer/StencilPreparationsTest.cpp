// Which preparations of the stencil reach the device, and when one that is kept is drawn again.
#include "moka/renderer/IBlendStateObject.h"
#include "moka/renderer/IDepthStencilBuffer.h"
#include "moka/renderer/IDepthStencilState.h"
#include "moka/renderer/IParameterBinding.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IShaderProgram.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/RendererFactory.h"
#include "moka/renderer/record/Recorder.h"
#include "tests/support/RendererTrace.h"

#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

constexpr int kSize = 100;

template <class T>
struct ReleaseIt {
    void operator()(T* object) const { object->Release(); }
};
template <class T>
using Released = std::unique_ptr<T, ReleaseIt<T>>;

class StencilPreparationsTest : public ::testing::Test {
protected:
    StencilPreparationsTest() {
        RendererTrace::Reset();
        RendererFactory::AttachContext();
        RendererFactory::SetDeferred(true);
        VertexDescriptor layout;
        layout.addAttribute(VertexAttributeType::Float, 1, -1, 0);
        graphics.reset(RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleList, &layout, 0, 0));
        maskProgram.reset(RendererFactory::CreateShaderProgram("", "uniform float width;", "mask"));
        width.reset(maskProgram->GetParameter("width"));
        program.reset(RendererFactory::CreateShaderProgram("", "uniform float width;", "program"));
        blend.reset(RendererFactory::CreateBlendStateObject(BlendStateDescriptor(true)));
        state.reset(RendererFactory::CreateDepthStencilState({false, false}));
        for (Strip& strip : strips) {
            strip.texture.reset(RendererFactory::CreateTextureObject(
                TextureDescriptor(kSize, kSize, 0, 2, 6, 1, false, nullptr), nullptr, 0, {}));
            strip.target.reset(RendererFactory::CreateOffscreenRenderTarget(strip.texture.get()));
        }
        buffer.reset(RendererFactory::CreateDepthStencilBuffer(kSize, kSize));
        TakeStrip(0);
        RendererFactory::Flush();
    }
    ~StencilPreparationsTest() override {
        active->DetachDepthStencil();
        buffer.reset();
        for (Strip& strip : strips) strip = {};
        graphics.reset();
        width.reset();
        maskProgram.reset();
        program.reset();
        blend.reset();
        state.reset();
        RendererTrace::Reset();
    }

    void TakeStrip(std::size_t index) {
        active = strips[index].target.get();
        active->Activate();
        active->AttachDepthStencil(buffer.get());
    }

    void ApplyStates(bool writesColor, StencilOperation pass, unsigned writeMask) const {
        BlendStateDescriptor blending(true);
        blending.SetEnabled(false, writesColor);
        blend->SetDescriptor(blending);
        blend->Apply();
        DepthStencilStateDescriptor stencil(false, true);
        stencil.SetStencilFunction(StencilAlways, 1, 0xFF, writeMask);
        stencil.SetStencilOperation(StencilKeep, StencilKeep, pass);
        state->SetDescriptor(stencil);
        state->Apply();
    }

    void DrawTriangle(float number) const {
        float const vertices[] = {number, 1, 2};
        graphics->SetVertices(0, vertices, 3);
        graphics->Draw(0, -1, 1);
    }
    void Prepare(float value, float vertex) const {
        active->ClearDepthStencil(false, 1, true, 0);
        maskProgram->MakeCurrent();
        width->Set(&value);
        ApplyStates(false, StencilReplace, 0xFF);
        DrawTriangle(vertex);
    }
    void Draw(DrawBounds const& bounds) const {
        program->MakeCurrent();
        ApplyStates(true, StencilKeep, 0);
        float const vertices[] = {0, 1, 2};
        graphics->SetVertices(0, vertices, 3);
        graphics->SetBounds(bounds);
        graphics->Draw(0, -1, 1);
    }

    void Do(char step) {
        switch (step) {
        case 'p': // three preparations: the usual one, one of another value, one of other vertices
            return Prepare(1, 1);
        case 'q':
            return Prepare(2, 1);
        case 'r':
            return Prepare(1, 2);
        case 'd':
            return Draw({0, 0, 0.1f, 0.1f});
        case 'D':
            return Draw({-1, -1, 1, 1});
        case 'w': // a draw of the caller's that writes the stencil
            program->MakeCurrent();
            ApplyStates(true, StencilIncrementSaturate, 0xFF);
            return DrawTriangle(5);
        case 'c':
            return active->ClearDepthStencil(true, 1, true, 0);
        case 'z':
            return active->ClearDepthStencil(true, 1, false, 0);
        case 'k': // the program that prepares goes
            width.reset();
            maskProgram.reset(RendererFactory::CreateShaderProgram("", "uniform float width;", "mask"));
            width.reset(maskProgram->GetParameter("width"));
            return;
        case 'f':
            return RendererFactory::Flush();
        case 'x':
            active->Deactivate(false, true);
            return active->Activate();
        case 's':
            return TakeStrip(1);
        case 'e':
            RendererFactory::Commit();
            return RendererFactory::InvalidateState();
        case 'i':
            return RendererFactory::SetDeferred(false);
        case 'I':
            return RendererFactory::SetDeferred(true);
        }
    }

    struct Strip {
        std::unique_ptr<ITextureObject> texture;
        Released<IRenderTarget> target;
    };
    Strip strips[2];
    Released<IDepthStencilBuffer> buffer;
    IRenderTarget* active = nullptr;
    Released<IGraphicsObject> graphics;
    Released<IShaderProgram> maskProgram;
    std::unique_ptr<IParameterBinding> width;
    Released<IShaderProgram> program;
    Released<IBlendStateObject> blend;
    Released<IDepthStencilState> state;
};

TEST_F(StencilPreparationsTest, OneIsDrawnAgainOnlyWhenTheBufferMayHoldSomethingElse) {
    struct {
        char const* steps;
        unsigned clears; // that the device gets
    } const cases[] = {
        {"pdpdpd", 1},                  // equal ones
        {"pdqd", 2},     {"pdrd", 2},   // another value, another vertex
        {"pdqdpd", 3},                  // and back
        {"pdfpdfpd", 1},                // over flushes
        {"pdD", 1},                     // a larger part in the same list
        {"pDfd", 1},     {"pdfD", 2},   // a smaller one and a larger one after a flush
        {"pdfDd", 2},    {"pdfDfD", 2}, // which then holds
        {"pqrd", 1},                    // nobody needed the first two
        {"pdfkD", 2},    {"pkd", 1},    // its program goes
        {"pdwpd", 2},    {"pdfwpd", 3}, // a draw that writes, for which the rest is drawn before
        {"pdcpd", 3},    {"pdzpd", 3},  // a clear with depth
        {"pdxpd", 2},                   // a discard
        {"pdsqdpd", 3},                 // another strip's preparation in the same buffer
        {"pdepd", 2},    {"pe", 1},     // foreign GL may write it, and may read it
        {"pdipd", 2},    {"ipdpd", 2},  {"ipdIpd", 2},
    };
    for (auto const& [steps, clears] : cases) {
        TakeStrip(0);
        RendererFactory::SetDeferred(true);
        std::uint64_t const before = RendererFactory::GetStatistics().clears;
        for (char const* step = steps; *step != 0; ++step) Do(*step);
        RendererFactory::Flush();
        EXPECT_EQ(RendererFactory::GetStatistics().clears - before, clears) << steps;
    }
}

TEST_F(StencilPreparationsTest, ADrawAfterOneThatIsDrawnAnewKeepsItsOwnState) {
    Do('p');
    Do('d');
    Do('f');
    // The same vertices elsewhere: nothing of the state was asked for again.
    graphics->SetBounds({-1, -1, 1, 1});
    graphics->Draw(0, -1, 1);
    detail::DrawList const& list = detail::GetAttachedRecorder()->list.GetList();
    ASSERT_EQ(list.commands.size(), 3u);
    std::size_t const index = std::get<detail::Run>(list.commands[2]).state;
    ASSERT_LT(index, list.states.size());
    EXPECT_TRUE(list.states[index].blend.IsColorWrite());
    EXPECT_FALSE(list.states[index].scissor.on);
}

} // namespace
} // namespace Moka::Testing
