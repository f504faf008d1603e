#include "moka/renderer/record/DrawListBuilder.h"

#include "moka/renderer/record/ProgramState.h"

#include <algorithm>
#include <cstring>

namespace Moka::detail {

ListVertices DrawListBuilder::AddVertices(float const* vertices, int count, int stride,
                                          ListVertices const& previous) {
    std::vector<float>& floats = mList.vertices;
    if (IsUndrawnEnd(previous)) floats.resize(previous.offset);
    auto const step = static_cast<std::size_t>(stride);
    std::size_t const offset = (floats.size() + step - 1) / step * step;
    std::size_t const size = static_cast<std::size_t>(count) * step;
    // Draws of one format leave no gap.
    if (floats.size() < offset) floats.resize(offset);
    floats.insert(floats.end(), vertices, vertices + size);
    return {mNumber, offset, size, step};
}

bool DrawListBuilder::IsUndrawnEnd(ListVertices const& vertices) const {
    return Has(vertices) && vertices.offset >= mDrawnFloats &&
           vertices.offset + vertices.size == mList.vertices.size();
}

void DrawListBuilder::AddDraw(RunState const& state, bool isKnownSame, ProgramState& program,
                              ListVertices const& vertices, int first, int count) {
    int const start = static_cast<int>(vertices.offset / vertices.stride) + first;
    Run const run{AddState(state, isKnownSame), AddValues(program), start, count};
    if (!Extend(run)) mList.commands.emplace_back(run);
    mDrawnFloats = std::max(mDrawnFloats, vertices.offset + vertices.size);
}

std::size_t DrawListBuilder::AddState(RunState const& state, bool isKnownSame) {
    bool const isSame = !mList.states.empty() && (isKnownSame || mList.states.back() == state);
    if (!isSame) {
        UseTexture(state.target.texture);
        for (TextureRef const& texture : state.textures) UseTexture(texture.texture);
        mList.states.push_back(state);
    }
    return mList.states.size() - 1;
}

std::size_t DrawListBuilder::AddValues(ProgramState& program) {
    ProgramState::Listed& listed = program.listed;
    std::vector<unsigned char> const& values = program.GetValues();
    bool const isHere = listed.list == mNumber;
    bool const isSame = isHere && (!listed.isStale || std::memcmp(&mList.uniforms[listed.offset],
                                                                  values.data(), values.size()) == 0);
    if (!isSame) {
        listed.offset = mList.uniforms.size();
        mList.uniforms.insert(mList.uniforms.end(), values.begin(), values.end());
        listed.list = mNumber;
    }
    listed.isStale = false;
    return listed.offset;
}

bool DrawListBuilder::Extend(Run const& run) {
    if (mList.commands.empty()) return false;
    auto* const last = std::get_if<Run>(&mList.commands.back());
    if (!last || last->state != run.state || last->uniforms != run.uniforms) return false;
    bool const isNext = last->first + last->count == run.first;
    // Joined strips would be connected by triangles that nobody asked for.
    if (!isNext || mList.states[run.state].primitive != PrimitiveType::TriangleList) return false;
    last->count += run.count;
    return true;
}

void DrawListBuilder::Add(ColorClear const& clear) {
    UseTexture(clear.target.texture);
    mList.commands.emplace_back(clear);
}

void DrawListBuilder::Add(DepthStencilClear const& clear) {
    UseTexture(clear.target.texture);
    mList.commands.emplace_back(clear);
}

void DrawListBuilder::Add(TextureClear const& clear) {
    UseTexture(clear.target.texture);
    mList.commands.emplace_back(clear);
}

void DrawListBuilder::Add(Discard const& discard) {
    UseTexture(discard.target.texture);
    mList.commands.emplace_back(discard);
}

void DrawListBuilder::Add(TargetCopy const& copy) {
    UseTexture(copy.from.texture);
    UseTexture(copy.to.texture);
    mList.commands.emplace_back(copy);
}

void DrawListBuilder::Add(TextureDraw const& draw) {
    UseTexture(draw.from.texture);
    UseTexture(draw.to.texture);
    mList.commands.emplace_back(draw);
}

void DrawListBuilder::UseTexture(DeviceName texture) {
    if (texture != 0) mTextureUses[texture] = mNumber;
}

bool DrawListBuilder::UsesTexture(DeviceName texture) const {
    auto const found = mTextureUses.find(texture);
    return found != mTextureUses.end() && found->second == mNumber;
}

bool DrawListBuilder::Uses(ProgramState const& program) const { return program.listed.list == mNumber; }

void DrawListBuilder::Clear() {
    mList.commands.clear();
    mList.states.clear();
    mList.uniforms.clear();
    mList.vertices.clear();
    mDrawnFloats = 0;
    ++mNumber;
}

std::uint64_t DrawListBuilder::GetCapacityBytes() const {
    return mList.commands.capacity() * sizeof(Command) + mList.states.capacity() * sizeof(RunState) +
           mList.uniforms.capacity() + mList.vertices.capacity() * sizeof(float);
}

} // namespace Moka::detail
