#include "moka/renderer/record/Fill.h"

#include "moka/renderer/record/ProgramState.h"
#include "moka/renderer/record/Recorder.h"

namespace Moka::detail {
namespace {

constexpr char kVertex[] = "#version 100\n"
                           "attribute vec2 corner;\n"
                           "void main() { gl_Position = vec4(corner, 0.0, 1.0); }\n";
constexpr char kFragment[] = "#version 100\n"
                             "precision highp float;\n"
                             "uniform vec4 color;\n"
                             "void main() { gl_FragColor = color; }\n";
constexpr float kCorners[] = {-1, -1, 1, -1, -1, 1, 1, 1};

} // namespace

void Fill::Add(Recorder& recorder, TargetRef const& target, std::array<float, 4> const& color) {
    if (!mProgram) Make(recorder);
    if (!mProgram->CanDraw()) return;
    mProgram->Set(mColor, color.data());
    RunState state;
    state.target = target;
    state.scissor = recorder.requested->GetScissor();
    state.depthStencil = recorder.requested->GetDepthStencil();
    state.program = mProgram->GetName();
    state.format = mFormat;
    state.primitive = PrimitiveType::TriangleStrip;
    recorder.BeforeDraw(state, {});
    ListVertices corners;
    recorder.list.AddVertices(kCorners, 4, 2, corners);
    recorder.list.AddDraw(state, false, *mProgram, {corners, 0, 4, {}});
    recorder.requested->SetChanged(true);
}

void Fill::Make(Recorder& recorder) {
    mProgram = std::make_shared<ProgramState>(recorder.shared_from_this(), kVertex, kFragment, "moka fill");
    --recorder.counters.programs; // the statistics count the programs of callers only
    mColor = mProgram->AddHandle("color");
    VertexDescriptor format;
    format.addAttribute(VertexAttributeType::Float, 2, -1, 0);
    mFormat = recorder.GetDevice().AddVertexFormat(format);
}

void Fill::Clear(Recorder& recorder) {
    if (!mProgram) return;
    ++recorder.counters.programs;
    mProgram->Release();
    mProgram.reset();
}

} // namespace Moka::detail
