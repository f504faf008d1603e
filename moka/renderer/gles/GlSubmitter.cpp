#include "moka/renderer/gles/GlSubmitter.h"

#include "moka/renderer/gles/GlDevice.h"
#include "moka/renderer/gles/GlTables.h"

#include <algorithm>
#include <string>

namespace Moka::detail {

void GlSubmitter::Submit(DrawList const& list) {
    if (mDevice.debug.HasGroups()) {
        GlDebugGroup const group(mDevice.debug, DescribeFlush(list).c_str());
        ExecuteAll(list);
    } else {
        ExecuteAll(list);
    }
}

// Returns the name of the debug group, with the number of draws requested since the last flush.
std::string GlSubmitter::DescribeFlush(DrawList const& list) {
    Counters const& counters = mDevice.counters;
    std::uint64_t const draws = counters.drawRequests - mDescribedRequests;
    mDescribedRequests = counters.drawRequests;
    auto const runs = std::count_if(list.commands.begin(), list.commands.end(), [](Command const& command) {
        return std::holds_alternative<Run>(command);
    });
    return "moka flush " + std::to_string(counters.flushes + 1) + ": " + std::to_string(draws) + " draws, " +
           std::to_string(runs) + " runs";
}

void GlSubmitter::ExecuteAll(DrawList const& list) {
    mList = &list;
    mApplied = nullptr;
    if (!list.vertices.empty()) {
        mDevice.host.SaveVertexInput();
        mDevice.vertexFormats.Upload(list.vertices);
    }
    mDevice.mergedRuns.Prepare(list);
    for (Command const& command : list.commands) {
        std::visit([this](auto const& one) { Execute(one); }, command);
    }
    mDevice.debug.Check("drawing");
}

void GlSubmitter::Execute(Run const& run) {
    RunState const& state = mList->states[run.state];
    if (&state != mApplied) Apply(state);
    if (mDevice.mergedRuns.Draw(*mList, run)) return;
    mDevice.vertexFormats.Bind(state.format);
    for (std::size_t i = 0; i < run.recordCount; ++i) {
        Record const& record = mList->records[run.firstRecord + i];
        mDevice.programs.Apply(state.program, mList->uniforms.data() + record.values);
        Gl::DrawArrays(ToGlPrimitive(state.primitive), record.first, record.count);
        ++mDevice.counters.draws;
    }
}

void GlSubmitter::Apply(RunState const& state) {
    TargetRef const& target = state.target;
    mDevice.host.BindTarget(target.frameBuffer, target.width, target.height);
    // Without a stencil or depth test it does not matter which buffer is attached.
    if (target.texture != 0 && (state.depthStencil.IsStencil() || state.depthStencil.IsDepth())) {
        mDevice.frameBuffers.Attach(target);
    }
    GlState& gl = mDevice.state;
    gl.SetDepthStencil(state.depthStencil);
    gl.SetScissor(state.scissor);
    gl.SetBlend(state.blend);
    for (TextureRef const& texture : state.textures) {
        if (texture.texture != 0) mDevice.BindTexture(texture);
    }
    mApplied = &state;
}

// A clear does not use the viewport.
void GlSubmitter::BindForClear(TargetRef const& target) {
    mApplied = nullptr;
    mDevice.host.Bind({target.frameBuffer, target.frameBuffer});
}

void GlSubmitter::Execute(ColorClear const& clear) {
    BindForClear(clear.target);
    mDevice.state.SetScissor(clear.scissor);
    ClearColor(clear.color.data());
    ++mDevice.counters.clears;
}

void GlSubmitter::Execute(TextureClear const& clear) {
    BindForClear(clear.target);
    GlOverride<GlScissorTestAccess> const scissor(mDevice.state.scissorTest, false);
    GLfloat const transparent[4] = {};
    ClearColor(transparent);
}

// Uses glClearBuffer, which does not change the clear colour of external GL, as glClear would.
void GlSubmitter::ClearColor(GLfloat const* color) {
    GlOverride<GlObstaclesAccess> const obstacles(mDevice.state.obstacles, 0);
    GlOverride<GlColorMaskAccess> const mask(mDevice.state.colorMask, kGlAllColors);
    Gl::ClearBufferfv(GL_COLOR, 0, color);
}

void GlSubmitter::Execute(DepthStencilClear const& clear) {
    BindForClear(clear.target);
    mDevice.state.SetScissor(clear.scissor);
    mDevice.frameBuffers.Attach(clear.target);
    GlOverride<GlObstaclesAccess> const obstacles(mDevice.state.obstacles, 0);
    GlOverride<GlDepthStencilMaskAccess> const mask(mDevice.state.depthStencilMask, kGlAllDepthStencil);
    if (clear.clearDepth && clear.clearStencil) {
        Gl::ClearBufferfi(GL_DEPTH_STENCIL, 0, clear.depth, clear.stencil);
    } else if (clear.clearDepth) {
        Gl::ClearBufferfv(GL_DEPTH, 0, &clear.depth);
    } else {
        Gl::ClearBufferiv(GL_STENCIL, 0, &clear.stencil);
    }
    ++mDevice.counters.clears;
}

// GL names the attachments of a frame buffer object and of the default frame buffer differently.
void GlSubmitter::Execute(Discard const& discard) {
    bool const isObject = discard.target.frameBuffer != 0;
    GLenum parts[3] = {};
    GLsizei count = 0;
    if (discard.color) parts[count++] = isObject ? GL_COLOR_ATTACHMENT0 : GL_COLOR;
    if (discard.depthStencil) {
        parts[count++] = isObject ? GL_DEPTH_ATTACHMENT : GL_DEPTH;
        parts[count++] = isObject ? GL_STENCIL_ATTACHMENT : GL_STENCIL;
    }
    mApplied = nullptr;
    mDevice.host.Bind({discard.target.frameBuffer, discard.target.frameBuffer});
    Gl::InvalidateFramebuffer(GL_DRAW_FRAMEBUFFER, count, parts);
}

void GlSubmitter::Execute(TargetCopy const& copy) {
    BeginCopy();
    if (HasAlpha(copy.from)) {
        mDevice.host.BindRead(copy.from.frameBuffer);
        GlEditTexture const edit(mDevice.state, copy.to.texture);
        Gl::CopyTexSubImage2D(GL_TEXTURE_2D, 0, 0, 0, 0, 0, copy.width, copy.height);
    } else {
        // glCopyTexSubImage2D fails if the source lacks alpha. A blit reads alpha as 1.
        Blit(copy.from, copy.to, copy.width, copy.height);
    }
    ++mDevice.counters.copies;
}

void GlSubmitter::BeginCopy() {
    mApplied = nullptr;
    if (mDevice.workarounds.Needs(GlWorkaround::FinishBeforeCopies)) Gl::Finish();
}

// Not cached, because a host may bind another surface under the same name. The query is cheap next to the
// copy.
bool GlSubmitter::HasAlpha(TargetRef const& target) {
    if (target.texture != 0) return true;
    mDevice.host.BindDraw(target.frameBuffer);
    GLint bits = 0;
    Gl::GetIntegerv(GL_ALPHA_BITS, &bits);
    ++mDevice.counters.queries;
    return bits > 0;
}

void GlSubmitter::Execute(TextureDraw const& draw) {
    BeginCopy();
    Blit(draw.from, draw.to, draw.from.width, draw.from.height);
    ++mDevice.counters.copies;
}

void GlSubmitter::Execute(MipmapUpdate const& update) {
    BeginCopy();
    mDevice.UpdateMipmap(update.texture);
}

// The scissor test is the only state that affects a blit.
void GlSubmitter::Blit(TargetRef const& from, TargetRef const& to, int width, int height) {
    mDevice.host.Bind({to.frameBuffer, from.frameBuffer});
    GlOverride<GlScissorTestAccess> const scissor(mDevice.state.scissorTest, false);
    Gl::BlitFramebuffer(0, 0, width, height, 0, 0, width, height, GL_COLOR_BUFFER_BIT, GL_NEAREST);
}

} // namespace Moka::detail
