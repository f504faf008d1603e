// Draws: what reaches GL, in which order, under which state, and how few calls it takes. Immediate and
// deferred, because the pixels are the same.
#include "tests/pixel/renderer/RendererFixture.h"

#include "moka/renderer/IBlendStateObject.h"
#include "moka/renderer/IDepthStencilState.h"
#include "moka/renderer/IGraphicsObject.h"
#include "moka/renderer/IParameterBinding.h"
#include "moka/renderer/IRasterizerState.h"
#include "moka/renderer/IShaderProgram.h"

#include <array>

namespace Moka::Testing {
namespace {

using ProgramPtr = std::unique_ptr<IShaderProgram, Releaser>;
using ParameterPtr = std::unique_ptr<IParameterBinding>;
using GraphicsPtr = std::unique_ptr<IGraphicsObject, Releaser>;
using BlendPtr = std::unique_ptr<IBlendStateObject, Releaser>;
using StatePtr = std::unique_ptr<IDepthStencilState, Releaser>;

constexpr int kSize = 8;

// Positions are pixels of a target of kSize; texture coordinates follow them.
constexpr char kVertex[] = "attribute vec2 corner; varying highp vec2 at;\n"
                           "void main() { at = corner / 8.0;\n"
                           "  gl_Position = vec4(at * 2.0 - 1.0, 0.0, 1.0); }";
constexpr char kColored[] = "precision highp float; uniform vec4 color;\n"
                            "void main() { gl_FragColor = color; }";
constexpr char kTextured[] = "precision highp float; uniform sampler2D texel; varying vec2 at;\n"
                             "void main() { gl_FragColor = texture2D(texel, at); }";

// A program with its one parameter.
struct Brush {
    Brush(char const* fragment, char const* parameterName)
        : program(RendererFactory::CreateShaderProgram(kVertex, fragment, "brush")),
          parameter(program->GetParameter(parameterName)) {}

    ProgramPtr program;
    ParameterPtr parameter;
};

class DrawTest : public RendererFixture, public ::testing::WithParamInterface<bool> {
protected:
    void SetUp() override {
        RendererFixture::SetUp();
        Begin();
    }
    void TearDown() override {
        End();
        RendererFixture::TearDown();
    }

    void Begin() {
        RendererFactory::SetDeferred(GetParam());
        texture = MakeTexture(kSize, kSize);
        target = MakeTarget(*texture);
        colored = std::make_unique<Brush>(kColored, "color");
        textured = std::make_unique<Brush>(kTextured, "texel");
        VertexDescriptor layout;
        layout.addAttribute(VertexAttributeType::Float, 2, -1, 0);
        quad.reset(RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleList, &layout, 0, 0));
        blend.reset(RendererFactory::CreateBlendStateObject(BlendStateDescriptor(true)));
        stencil.reset(RendererFactory::CreateDepthStencilState(DepthStencilStateDescriptor(false, false)));
        blend->Apply();
        stencil->Apply();
    }

    void End() {
        quad.reset();
        blend.reset();
        stencil.reset();
        colored.reset();
        textured.reset();
        target.reset();
        texture.reset();
    }

    void SetQuad(float l, float t, float r, float b) const {
        float const corners[] = {l, t, l, b, r, t, r, t, l, b, r, b};
        quad->SetVertices(0, corners, 6);
    }
    void Fill(Pixel color, float l, float t, float r, float b) const {
        std::array<float, 4> const value{static_cast<float>(color.r) / 255, static_cast<float>(color.g) / 255,
                                         static_cast<float>(color.b) / 255,
                                         static_cast<float>(color.a) / 255};
        colored->program->MakeCurrent();
        colored->parameter->Set(value.data());
        SetQuad(l, t, r, b);
        EXPECT_TRUE(quad->Draw(0, -1, 1));
    }
    void Paint(ITextureObject& source, float l, float t, float r, float b) const {
        int const unit = 1;
        source.Bind(unit);
        textured->program->MakeCurrent();
        textured->parameter->Set(&unit);
        SetQuad(l, t, r, b);
        EXPECT_TRUE(quad->Draw(0, -1, 1));
    }
    void SetStencil(StencilComparison comparison, int reference, StencilOperation pass) const {
        DepthStencilStateDescriptor descriptor(false, true);
        descriptor.SetStencilFunction(comparison, reference, 0xFF, 0xFF);
        descriptor.SetStencilOperation(StencilKeep, StencilKeep, pass);
        stencil->SetDescriptor(descriptor);
        stencil->Apply();
    }
    Image Read() { return RendererFixture::Read(*target, kSize, kSize); }
    static Image Filled(Pixel color) { return Image(kSize, kSize, color); }
    static Image With(Image image, Pixel color, int x, int y, int w, int h) {
        return image.With(x, y, Image(w, h, color), 0, 0, w, h);
    }
    static RendererStatistics Count() { return RendererFactory::GetStatistics(); }
    static bool IsDeferred() { return GetParam(); }

    TexturePtr texture;
    TargetPtr target;
    std::unique_ptr<Brush> colored;
    std::unique_ptr<Brush> textured;
    GraphicsPtr quad;
    BlendPtr blend;
    StatePtr stencil;
};

TEST_P(DrawTest, DrawsKeepTheirOrderTheirVerticesAndTheirValues) {
    target->Activate();
    target->ClearColor(0, 0, 1, 1);
    Fill(kRed, 0, 0, 8, 4);
    Fill(kGreen, 2, 2, 4, 8);
    // The values and vertices of the next one do not reach the ones before.
    Fill(kRed, 3, 3, 4, 4);
    target->Deactivate(false, false);
    Image const expected =
        With(With(With(Filled(kBlue), kRed, 0, 0, 8, 4), kGreen, 2, 2, 2, 6), kRed, 3, 3, 1, 1);
    EXPECT_EQ(Read(), expected);
}

TEST_P(DrawTest, AdjacentDrawsThatShareEverythingAreOneCall) {
    target->Activate();
    blend->Apply();
    stencil->Apply();
    Fill(kRed, 0, 0, 1, 1);
    std::uint64_t const before = Count().draws;
    for (int i = 1; i < 8; ++i) {
        // What is set again to what it is changes nothing.
        target->Activate();
        blend->Apply();
        stencil->Apply();
        Fill(kRed, static_cast<float>(i), 0, static_cast<float>(i + 1), 1);
    }
    Fill(kGreen, 0, 1, 8, 2);
    target->Deactivate(false, false);
    EXPECT_EQ(Read(), With(With(Filled(kClear), kRed, 0, 0, 8, 1), kGreen, 0, 1, 8, 1));
    EXPECT_EQ(Count().draws, before + 2);
    EXPECT_EQ(Count().drawRequests, 9u);
}

TEST_P(DrawTest, CountsAndFirstAreCutToWhatIsThere) {
    target->Activate();
    colored->program->MakeCurrent();
    std::array<float, 4> const red{1, 0, 0, 1};
    colored->parameter->Set(red.data());
    float const two[] = {0, 0, 0, 4, 8, 0, 0, 8, 0, 4, 8, 8, 8, 8};
    quad->SetVertices(0, two, 7);
    EXPECT_TRUE(quad->Draw(3, 3, 1));
    EXPECT_TRUE(quad->Draw(9, -1, 1));
    EXPECT_TRUE(quad->Draw(0, 0, 1));
    EXPECT_EQ(Read().At(1, 1), kClear);
    EXPECT_EQ(Read().At(0, 6), kRed);
    quad->SetVertices(0, nullptr, 0);
    target->ClearColor(0, 0, 0, 0);
    EXPECT_TRUE(quad->Draw(0, -1, 1));
    EXPECT_EQ(Read(), Filled(kClear));

    quad->SetVertices(1, two, 3);
    quad->SetVertices(0, nullptr, 3);
    quad->SetVertices(0, two, -1);
    EXPECT_TRUE(quad->Draw(0, -1, 1));
    EXPECT_FALSE(quad->Draw(0, -1, 2));
    EXPECT_EQ(TakeErrors().size(), 4u);
    EXPECT_EQ(Read(), Filled(kClear));
    target->Deactivate(false, false);
}

TEST_P(DrawTest, WithoutAProgramThatCompiledNothingIsDrawn) {
    target->Activate();
    SetQuad(0, 0, 8, 8);
    EXPECT_FALSE(quad->Draw(0, -1, 1));
    ProgramPtr const broken(RendererFactory::CreateShaderProgram("misspelt", kColored, "broken"));
    EXPECT_EQ(TakeErrors().size(), 1u);
    ForgetDriverErrors();
    broken->MakeCurrent();
    EXPECT_FALSE(quad->Draw(0, -1, 1));
    Fill(kRed, 0, 0, 8, 8);
    colored.reset(); // while it is in the list
    EXPECT_FALSE(quad->Draw(0, -1, 1));
    EXPECT_EQ(Read(), Filled(kRed));
    target->Deactivate(false, false);
}

TEST_P(DrawTest, TransfersComeBetweenTheDrawsWhereTheyWereAskedFor) {
    TexturePtr const source = MakeTexture(Filled(kRed));
    target->Activate();
    Paint(*source, 0, 0, 4, 4);
    source->Replace(Filled(kGreen).pixels.data(), 0);
    Paint(*source, 4, 0, 8, 4);
    // Into what is drawn to, and out of it.
    texture->Replace(Rect(0, 4, 8, 6), Filled(kBlue).pixels.data(), 0);
    TexturePtr const copy = MakeTexture(kSize, kSize);
    copy->CopyFromRenderTarget();
    Fill(kRed, 0, 6, 8, 8);
    Paint(*copy, 0, 6, 8, 7);
    target->Deactivate(false, false);
    Image const half =
        With(With(With(Filled(kClear), kRed, 0, 0, 4, 4), kGreen, 4, 0, 4, 4), kBlue, 0, 4, 8, 2);
    EXPECT_EQ(RendererFixture::Read(*copy), half);
    EXPECT_EQ(Read(), With(half, kRed, 0, 7, 8, 1));
}

TEST_P(DrawTest, TexturesThatAreDeletedOrReboundAreStillThereForTheDrawsBefore) {
    target->Activate();
    for (int i = 0; i < 3; ++i) {
        // The GL names of the last one may come back here.
        Pixel const color = i == 0 ? kRed : i == 1 ? kGreen : kBlue;
        TexturePtr const source = MakeTexture(Image(2, 2, color));
        source->SetParameter(TextureParamWrappingS, i == 1 ? TextureWrapRepeat : TextureWrapClampToEdge);
        Paint(*source, static_cast<float>(i), 0, static_cast<float>(i + 1), 8);
    }
    // One that is bound and gone is not drawn with.
    texture->SetLabel("target");
    target->Deactivate(false, false);
    EXPECT_EQ(Read(),
              With(With(With(Filled(kClear), kRed, 0, 0, 1, 8), kGreen, 1, 0, 1, 8), kBlue, 2, 0, 1, 8));
    RendererFactory::Flush();
    EXPECT_EQ(Count().textures, 1);
}

TEST_P(DrawTest, ATargetThatSamplesItselfSeesWhatItWasJustBefore) {
    TexturePtr const view = MakeView(*texture);
    view->SetParameter(TextureParamFilteringMag, TextureFilterNearest);
    target->Activate();
    target->ClearColor(0, 1, 0, 1);
    Fill(kRed, 0, 0, 4, 8);
    Paint(*view, 0, 0, 8, 4);
    Fill(kBlue, 0, 0, 1, 8);
    Paint(*view, 0, 4, 8, 8);
    target->Deactivate(false, false);
    EXPECT_EQ(Read(), With(With(Filled(kGreen), kRed, 0, 0, 4, 8), kBlue, 0, 0, 1, 8));
    RendererFactory::Flush();
    EXPECT_EQ(Count().textures, 1);
}

TEST_P(DrawTest, TheScissorHoldsForTheDrawsAndClearsItWasSetFor) {
    IRasterizerState* const rasterizer = RendererFactory::GetRasterizerState();
    target->Activate();
    EXPECT_FALSE(rasterizer->IsScissorEnabled());
    rasterizer->SetScissorRect({1, 2, 3, 4});
    rasterizer->SetScissorEnabled(true);
    Fill(kRed, 0, 0, 8, 8);
    rasterizer->SetScissorRect({5, 0, 2, -1});
    EXPECT_EQ(rasterizer->GetScissorRect(), (ScissorRect{5, 0, 2, 0}));
    Fill(kGreen, 0, 0, 8, 8);
    rasterizer->SetScissorRect({6, 6, 2, 2});
    target->ClearColor(0, 0, 1, 1);
    rasterizer->SetScissorEnabled(false);
    Fill(kGreen, 0, 0, 1, 1);
    target->Deactivate(false, false);
    EXPECT_EQ(Read(),
              With(With(With(Filled(kClear), kRed, 1, 2, 3, 4), kBlue, 6, 6, 2, 2), kGreen, 0, 0, 1, 1));
}

TEST_P(DrawTest, EveryFactorBlends) {
    struct Row {
        BlendingFactor source, destination;
        Pixel expected;
    };
    // Source (200, 100, 0, 128) over (100, 200, 50, 64), in bytes.
    Row const rows[] = {
        {BlendingFactor::One, BlendingFactor::Zero, {200, 100, 0, 128}},
        {BlendingFactor::Zero, BlendingFactor::One, {100, 200, 50, 64}},
        {BlendingFactor::Zero, BlendingFactor::SrcColor, {78, 78, 0, 32}},
        {BlendingFactor::SrcAlpha, BlendingFactor::Zero, {100, 50, 0, 64}},
        {BlendingFactor::OneMinusSrcAlpha, BlendingFactor::Zero, {100, 50, 0, 64}},
        {BlendingFactor::Zero, BlendingFactor::DstAlpha, {25, 50, 13, 16}},
        {BlendingFactor::Zero, BlendingFactor::OneMinusDstAlpha, {75, 150, 37, 48}},
        {BlendingFactor::One, BlendingFactor::One, {255, 255, 50, 192}},
    };
    target->Activate();
    int x = 0;
    for (Row const& row : rows) {
        BlendStateDescriptor descriptor(true);
        blend->SetDescriptor(descriptor);
        blend->Apply();
        auto const left = static_cast<float>(x++);
        Fill(Pixel{100, 200, 50, 64}, left, 0, left + 1, 8);
        descriptor.SetColorEquation(BlendingFunction::Add, row.source, row.destination);
        // The lower half blends alpha another way.
        descriptor.SetAlphaEquation(BlendingFunction::Add, row.source, row.destination);
        blend->SetDescriptor(descriptor);
        blend->Apply();
        Fill(Pixel{200, 100, 0, 128}, left, 0, left + 1, 4);
        descriptor.SetAlphaEquation(BlendingFunction::Add, BlendingFactor::One, BlendingFactor::Zero);
        blend->SetDescriptor(descriptor);
        blend->Apply();
        Fill(Pixel{200, 100, 0, 128}, left, 4, left + 1, 8);
    }
    target->Deactivate(false, false);
    Image const image = Read();
    for (x = 0; x < 8; ++x) {
        Pixel const upper = image.At(x, 1);
        Pixel const expected = rows[x].expected;
        EXPECT_NEAR(upper.r, expected.r, 1) << x;
        EXPECT_NEAR(upper.g, expected.g, 1) << x;
        EXPECT_NEAR(upper.b, expected.b, 1) << x;
        EXPECT_NEAR(upper.a, expected.a, 1) << x;
        EXPECT_NEAR(image.At(x, 6).r, expected.r, 1) << x;
        EXPECT_EQ(image.At(x, 6).a, 128) << x;
    }
}

TEST_P(DrawTest, BothFlagsOffMaskColourAndClearsDoNotCare) {
    target->Activate();
    blend->SetDescriptor(BlendStateDescriptor(false));
    blend->Apply();
    Fill(kRed, 0, 0, 8, 8);
    EXPECT_EQ(Read(), Filled(kClear));
    target->ClearColor(0, 1, 0, 1);
    Fill(kRed, 0, 0, 8, 8);
    target->Deactivate(false, false);
    EXPECT_EQ(Read(), Filled(kGreen));
}

TEST_P(DrawTest, AStencilClipHoldsForDrawsAndClearsUntilItIsLifted) {
    DepthStencilPtr const buffer = MakeDepthStencil(kSize, kSize);
    target->AttachDepthStencil(buffer.get());
    target->Activate();
    target->ClearDepthStencil(false, 1, true, 0);
    SetStencil(StencilAlways, 1, StencilIncrementSaturate);
    blend->SetDescriptor(BlendStateDescriptor(false));
    blend->Apply();
    Fill(kRed, 2, 2, 6, 6);
    SetStencil(StencilEqual, 1, StencilKeep);
    RendererFactory::SetStencilClip(true);
    blend->SetDescriptor(BlendStateDescriptor(true));
    blend->Apply();
    StatePtr const plain(RendererFactory::CreateDepthStencilState(DepthStencilStateDescriptor(false, false)));
    plain->Apply(); // as every drawable does
    target->ClearColor(0, 1, 0, 1);
    Fill(kRed, 0, 0, 4, 8);
    RendererFactory::SetStencilClip(false);
    plain->Apply();
    Fill(kBlue, 7, 7, 8, 8);
    target->DetachDepthStencil();
    target->Deactivate(false, false);
    EXPECT_EQ(Read(),
              With(With(With(Filled(kClear), kGreen, 2, 2, 4, 4), kRed, 2, 2, 2, 4), kBlue, 7, 7, 1, 1));
}

TEST_P(DrawTest, EachTargetTestsTheStencilThatItHadThen) {
    TexturePtr const otherTexture = MakeTexture(kSize, kSize);
    TargetPtr const other = MakeTarget(*otherTexture);
    // Given back and taken again: the same render buffer serves both.
    for (IRenderTarget* const one : {target.get(), other.get(), target.get()}) {
        DepthStencilPtr const buffer = MakeDepthStencil(kSize, kSize);
        one->AttachDepthStencil(buffer.get());
        one->Activate();
        one->ClearDepthStencil(false, 1, true, one == target.get() ? 3 : 4);
        SetStencil(StencilEqual, 3, StencilKeep);
        Fill(kRed, 0, 0, 8, 8);
        SetStencil(StencilNotEqual, 3, StencilKeep);
        Fill(kGreen, 0, 0, 4, 8);
        one->Deactivate(false, true);
        one->DetachDepthStencil();
    }
    EXPECT_EQ(Read(), Filled(kRed));
    EXPECT_EQ(RendererFixture::Read(*other, kSize, kSize), With(Filled(kClear), kGreen, 0, 0, 4, 8));
    EXPECT_EQ(Count().renderBuffers, 0);
    EXPECT_EQ(Count().pooledRenderBuffers, 1);
}

TEST_P(DrawTest, WithoutAnActiveTargetTheHostsFrameBufferIsDrawnInto) {
    RendererFactory::Flush();
    HostFrameBuffer const host(kSize, kSize);
    glViewport(0, 0, kSize, kSize);
    RendererFactory::InvalidateState();
    Clear(*target, kBlue);
    Fill(kRed, 0, 0, 8, 4);
    RendererFactory::Flush();
    EXPECT_EQ(host.Read().At(1, 1), kRed);
    EXPECT_EQ(Read(), Filled(kBlue));
}

TEST_P(DrawTest, ForeignGlDrawsUnderWhatIsInForceAfterACommit) {
    RawQuad const foreign("color = vec4(0, 1, 0, 1);");
    RendererFactory::InvalidateState();
    IRasterizerState* const rasterizer = RendererFactory::GetRasterizerState();
    rasterizer->SetScissorRect({0, 0, 4, 8});
    rasterizer->SetScissorEnabled(true);
    target->Activate();
    Fill(kRed, 0, 0, 8, 8);
    RendererFactory::Commit();
    target->Activate();
    foreign.Draw();
    glViewport(0, 0, 1, 1);
    glDisable(GL_SCISSOR_TEST);
    RendererFactory::InvalidateState();
    rasterizer->SetScissorEnabled(false);
    Fill(kBlue, 7, 0, 8, 8);
    target->Deactivate(false, false);
    EXPECT_EQ(Read(), With(With(Filled(kClear), kGreen, 0, 0, 4, 8), kBlue, 7, 0, 1, 8));
}

TEST_P(DrawTest, TheHostsVertexArrayAndBufferComeBack) {
    GLuint array = 0;
    GLuint buffer = 0;
    glGenVertexArrays(1, &array);
    glGenBuffers(1, &buffer);
    glBindVertexArray(array);
    glBindBuffer(GL_ARRAY_BUFFER, buffer);
    RendererFactory::InvalidateState();
    target->Activate();
    Fill(kRed, 0, 0, 8, 8);
    target->Deactivate(false, false);
    RendererFactory::Flush();
    EXPECT_EQ(GetInteger(GL_VERTEX_ARRAY_BINDING), static_cast<GLint>(array));
    EXPECT_EQ(GetInteger(GL_ARRAY_BUFFER_BINDING), static_cast<GLint>(buffer));
    EXPECT_EQ(Read(), Filled(kRed));
    glDeleteBuffers(1, &buffer);
    glDeleteVertexArrays(1, &array);
    RendererFactory::InvalidateState();
}

TEST_P(DrawTest, AFullListIsPlayedAndALaterFrameAsksNothingAndGrowsNothing) {
    constexpr int kDraws = 50000; // several times what a list holds
    auto const drawFrame = [this] {
        target->Activate();
        for (int i = 0; i < kDraws; ++i) {
            auto const x = static_cast<float>(i % kSize);
            Fill(i % 3 == 0 ? kRed : kGreen, x, 0, x + 1, 8);
        }
        target->Deactivate(false, false);
        RendererFactory::Flush();
    };
    drawFrame();
    RendererStatistics const before = Count();
    drawFrame();
    RendererStatistics const after = Count();
    EXPECT_EQ(Read().At((kDraws - 1) % kSize, 3), (kDraws - 1) % 3 == 0 ? kRed : kGreen);
    EXPECT_EQ(after.listBytes, before.listBytes);
    EXPECT_LT(after.listBytes, 8u << 20);
    EXPECT_EQ(after.buffers, before.buffers);
    EXPECT_GT(after.plays, before.plays + 1);
    // The host's frame buffer, viewport, vertex input and obstacles, once a frame at most.
    EXPECT_LE(after.queries - before.queries, IsDeferred() ? 0u : 8u);
    EXPECT_EQ(after.frameBufferSwitches - before.frameBufferSwitches, 2u);
}

TEST_P(DrawTest, WhatOutlivesItsContextDrawsNothing) {
    target->Activate();
    Fill(kRed, 0, 0, 8, 8);
    RendererFactory::DetachContext();
    EXPECT_EQ(Count().buffers, 0);
    EXPECT_FALSE(quad->Draw(0, -1, 1));
    blend->Apply();
    EXPECT_FALSE(RendererFactory::GetRasterizerState()->IsScissorEnabled());
    VertexDescriptor const none;
    EXPECT_FALSE(RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleList, &none, 0, 0));
    ASSERT_TRUE(Attach());
    EXPECT_FALSE(RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleList, &none, 0, 0));
    EXPECT_EQ(TakeErrors().size(), 2u);
    End();
    Begin();
    target->Activate();
    Fill(kGreen, 0, 0, 8, 8);
    EXPECT_EQ(Read(), Filled(kGreen));
    target->Deactivate(false, false);
}

INSTANTIATE_TEST_SUITE_P(ImmediateAndDeferred, DrawTest, ::testing::Bool(),
                         [](auto const& parameter) { return parameter.param ? "Deferred" : "Immediate"; });

} // namespace
} // namespace Moka::Testing
