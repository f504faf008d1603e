#include "moka/renderer/gles/GlDrawList.h"

#include "moka/renderer/gles/GlFrameBuffer.h"
#include "moka/renderer/gles/GlTextureStorage.h"
#include "moka/renderer/gles/GlUniforms.h"

#include <cstring>
#include <utility>

namespace Moka::detail {

void GlDrawList::AddDraw(GlDrawState const& state, bool isKnownSame, GLfloat const* vertices, GLsizei count,
                         int floatsPerVertex) {
    std::size_t const stateIndex = AddState(state, isKnownSame);
    std::size_t const uniforms = AddUniforms(*state.program);
    GLint const first = AddVertices(vertices, count, floatsPerVertex);
    GlRun const run{stateIndex, uniforms, first, count};
    if (!Extend(run)) mCommands.emplace_back(run);
}

std::size_t GlDrawList::AddState(GlDrawState const& state, bool isKnownSame) {
    bool const isSame = !mStates.empty() && (isKnownSame || mStates.back() == state);
    if (!isSame) {
        mStates.push_back(state);
        Mark(state.target);
        for (GlTextureUse const& texture : state.textures) {
            if (texture.storage) texture.storage->listed = mNumber;
        }
    }
    return mStates.size() - 1;
}

std::size_t GlDrawList::AddUniforms(GlUniforms& program) {
    GlUniforms::Listed& listed = program.listed;
    std::size_t const size = program.GetSize();
    unsigned char const* const values = program.GetValues();
    bool const isHere = listed.list == mNumber;
    if (isHere && (!listed.isStale || std::memcmp(GetUniforms(listed.offset), values, size) == 0)) {
        listed.isStale = false;
        return listed.offset;
    }
    std::size_t const offset = mUniforms.size();
    mUniforms.insert(mUniforms.end(), values, values + size); // may throw, and then nothing is listed
    listed = {mNumber, offset, false};
    return offset;
}

// A run starts at a whole vertex, counted in vertices of its own layout.
GLint GlDrawList::AddVertices(GLfloat const* vertices, GLsizei count, int floatsPerVertex) {
    auto const stride = static_cast<std::size_t>(floatsPerVertex);
    std::size_t const first = (mVertices.size() + stride - 1) / stride;
    mVertices.resize(first * stride);
    mVertices.insert(mVertices.end(), vertices, vertices + static_cast<std::size_t>(count) * stride);
    return static_cast<GLint>(first);
}

bool GlDrawList::Extend(GlRun const& run) {
    if (mCommands.empty()) return false;
    auto* const last = std::get_if<GlRun>(&mCommands.back());
    if (!last || last->state != run.state || last->uniforms != run.uniforms) return false;
    bool const isNext = last->first + last->count == run.first;
    // Strips would grow together.
    if (!isNext || mStates[run.state].primitive != PrimitiveType::TriangleList) return false;
    last->count += run.count;
    return true;
}

void GlDrawList::Add(GlColorClear clear) {
    Mark(clear.target);
    mCommands.emplace_back(std::move(clear));
}

void GlDrawList::Add(GlDepthStencilClear clear) {
    Mark(clear.target);
    mCommands.emplace_back(std::move(clear));
}

void GlDrawList::Add(GlDiscard discard) {
    Mark(discard.target);
    mCommands.emplace_back(std::move(discard));
}

void GlDrawList::Add(GlTargetCopy copy) {
    Mark(copy.target);
    copy.to->listed = mNumber;
    mCommands.emplace_back(std::move(copy));
}

void GlDrawList::Mark(GlTargetUse const& target) {
    if (GlTextureStorage* const storage = target.frameBuffer->GetStorage()) storage->listed = mNumber;
}

bool GlDrawList::Uses(GlTextureStorage const& storage) const { return storage.listed == mNumber; }

bool GlDrawList::Uses(GlUniforms const& program) const { return program.listed.list == mNumber; }

void GlDrawList::Clear() {
    mCommands.clear();
    mStates.clear();
    mUniforms.clear();
    mVertices.clear();
    ++mNumber;
}

std::uint64_t GlDrawList::GetBytes() const {
    return mCommands.capacity() * sizeof(GlCommand) + mStates.capacity() * sizeof(GlDrawState) +
           mUniforms.capacity() + mVertices.capacity() * sizeof(GLfloat);
}

} // namespace Moka::detail
