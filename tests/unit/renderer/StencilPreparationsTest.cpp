// Which preparations of the stencil reach the device, and when one that is kept is drawn again.
#include "moka/renderer/IBlendStateObject.h"
#include "moka/renderer/IDepthStencilBuffer.h"
#include "moka/renderer/IDepthStencilState.h"
#include "tests/unit/renderer/RecorderFixture.h"

namespace Moka::Testing {
namespace {

class StencilPreparationsTest : public RecorderFixture {
protected:
    StencilPreparationsTest() {
        TakeStrip(*target);
        RendererFactory::Flush();
    }
    ~StencilPreparationsTest() override { active->DetachDepthStencil(); }

    void TakeStrip(IRenderTarget& strip) {
        active = &strip;
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
        SetVertices({number, 1, 2});
        graphics->Draw(0, -1, 1);
    }
    void Prepare(float value, float vertex) const {
        active->ClearDepthStencil(false, 1, true, 0);
        program->MakeCurrent();
        SetWidth(value);
        ApplyStates(false, StencilReplace, 0xFF);
        DrawTriangle(vertex);
    }
    void Draw(DrawBounds const& bounds) const {
        callers->MakeCurrent();
        ApplyStates(true, StencilKeep, 0);
        SetVertices({0, 1, 2});
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
            callers->MakeCurrent();
            ApplyStates(true, StencilIncrementSaturate, 0xFF);
            return DrawTriangle(5);
        case 'c':
            return active->ClearDepthStencil(true, 1, true, 0);
        case 'z':
            return active->ClearDepthStencil(true, 1, false, 0);
        case 'k': // the program that prepares goes
            width.reset();
            program = MakeProgram();
            width.reset(program->GetParameter("width"));
            return;
        case 'f':
            return RendererFactory::Flush();
        case 'x':
            active->Deactivate(false, true);
            return active->Activate();
        case 's':
            return TakeStrip(*otherTarget);
        case 'e':
            RendererFactory::Commit();
            return RendererFactory::InvalidateState();
        case 'i':
            return RendererFactory::SetDeferred(false);
        case 'I':
            return RendererFactory::SetDeferred(true);
        }
    }

    std::unique_ptr<ITextureObject> otherTexture = MakeTexture();
    RendererPtr<IRenderTarget> otherTarget{RendererFactory::CreateOffscreenRenderTarget(otherTexture.get())};
    RendererPtr<IDepthStencilBuffer> buffer{RendererFactory::CreateDepthStencilBuffer(kSize, kSize)};
    IRenderTarget* active = nullptr;
    RendererPtr<IShaderProgram> callers = MakeProgram();
    RendererPtr<IBlendStateObject> blend{RendererFactory::CreateBlendStateObject(BlendStateDescriptor(true))};
    RendererPtr<IDepthStencilState> state{RendererFactory::CreateDepthStencilState({false, false})};
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
        TakeStrip(*target);
        RendererFactory::SetDeferred(true);
        std::uint64_t const before = Count().clears;
        for (char const* step = steps; *step != 0; ++step) Do(*step);
        RendererFactory::Flush();
        EXPECT_EQ(Count().clears - before, clears) << steps;
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
