#include "moka/renderer/record/DrawListBuilder.h"

#include "moka/renderer/device/Counters.h"
#include "moka/renderer/record/ProgramState.h"

#include <algorithm>
#include <cstring>
#include <new>

namespace Moka::detail {
namespace {

// Returns one bit for each integer uniform whose value differs between a and b.
std::uint32_t FindVarying(unsigned char const* a, unsigned char const* b, ProgramLayout const& layout) {
    std::uint32_t varying = 0;
    std::uint32_t bit = 1;
    for (std::size_t at = layout.integersBegin; at < layout.integersEnd; at += sizeof(std::int32_t)) {
        if (std::memcmp(a + at, b + at, sizeof(std::int32_t)) != 0) varying |= bit;
        bit <<= 1;
    }
    return varying;
}

} // namespace

// Pads the list to a multiple of the stride. Draws of one format leave no gap.
void DrawListBuilder::Align(std::size_t stride) {
    AppendBuffer<float>& floats = mList.vertices;
    std::size_t const end = (floats.size() + stride - 1) / stride;
    floats.resize(end * stride);
    mEndStride = stride;
    mEndVertex = static_cast<int>(end);
}

void DrawListBuilder::RemoveEnd(ListVertices const& vertices) {
    mList.vertices.resize(vertices.offset);
    mEndStride = vertices.stride;
    mEndVertex = vertices.first;
}

void DrawListBuilder::AddDraw(RunState const& state, bool isKnownSame, ProgramState& program,
                              ListDraw const& draw) {
    ListVertices const& vertices = draw.vertices;
    bool const isLast = MOKA_LIKELY(isKnownSame && mLastState != kNoState);
    std::size_t const stateIndex = isLast ? mLastState : AddState(state);
    ProgramState::Listed const& listed = program.listed;
    bool const isListed = listed.list == mNumber && !listed.isStale;
    Record const record{isListed ? listed.offset : AddValues(program), vertices.first + draw.first,
                        draw.count};
    OpenRun* const run = FindRun(stateIndex, draw.bounds);
    Continuation how;
    if (run && Continues(*run, program.GetLayout(), record, how)) {
        Join(*run, record, draw.bounds, how);
    } else {
        OpenNewRun(stateIndex, record, draw.bounds, vertices.stride);
    }
    mDrawnFloats = std::max(mDrawnFloats, vertices.offset + vertices.size);
    mListedFloats += static_cast<std::size_t>(draw.count) * vertices.stride;
}

void DrawListBuilder::AddSeparateDraw(SeparateDraw const& draw) {
    ListVertices vertices;
    AddVertices(draw.vertices, draw.count, draw.stride, vertices);
    std::size_t const values = mList.uniforms.size();
    mList.uniforms.Append(draw.values, draw.valueBytes);
    UseTexture(draw.state.target.texture);
    mList.states.push_back(draw.state);
    OpenNewRun(mList.states.size() - 1, {values, vertices.first, draw.count}, {}, vertices.stride);
    mDrawnFloats = vertices.offset + vertices.size;
}

void DrawListBuilder::SetScissor(std::size_t command, ScissorState const& scissor) {
    if (Run const* const run = std::get_if<Run>(&mList.commands[command])) {
        mList.states[run->state].scissor = scissor;
    } else if (auto* const clear = std::get_if<DepthStencilClear>(&mList.commands[command])) {
        clear->scissor = scissor;
    }
}

std::size_t DrawListBuilder::AddState(RunState const& state) {
    std::vector<RunState>& states = mList.states;
    std::size_t const reach = std::min(states.size(), kReach);
    auto const found =
        std::find(states.rbegin(), states.rbegin() + static_cast<std::ptrdiff_t>(reach), state);
    if (found != states.rbegin() + static_cast<std::ptrdiff_t>(reach)) {
        mLastState = static_cast<std::size_t>(states.rend() - found) - 1;
        return mLastState;
    }
    UseTexture(state.target.texture);
    for (TextureRef const& texture : state.textures) UseTexture(texture.texture);
    states.push_back(state);
    mLastState = states.size() - 1;
    return mLastState;
}

std::size_t DrawListBuilder::AddValues(ProgramState& program) {
    ProgramState::Listed& listed = program.listed;
    std::vector<unsigned char> const& values = program.GetValues();
    listed.offset = mList.uniforms.size();
    mList.uniforms.Append(values.data(), values.size());
    listed.list = mNumber;
    listed.isStale = false;
    return listed.offset;
}

inline DrawListBuilder::OpenRun* DrawListBuilder::FindRun(std::size_t state, DrawBounds const& bounds) {
    // Joined triangle strips would be connected by unwanted triangles.
    if (mList.states[state].primitive != PrimitiveType::TriangleList) return nullptr;
    if (MOKA_LIKELY(mRunCount > mFirstOpenRun && mRuns[mRunCount - 1].state == state))
        return &mRuns[mRunCount - 1];
    return mMerges ? FindEarlierRun(state, bounds) : nullptr;
}

DrawListBuilder::OpenRun* DrawListBuilder::FindEarlierRun(std::size_t state, DrawBounds const& bounds) {
    for (std::size_t i = mRunCount; i > mFirstOpenRun && mRunCount - i < kReach; --i) {
        OpenRun& run = mRuns[i - 1];
        if (run.state == state) return &run;
        // A run in between may sample the texture of the other target.
        bool const hasOneTarget =
            mList.states[run.state].target.frameBuffer == mList.states[state].target.frameBuffer;
        if (!hasOneTarget || MayTouch(run, bounds)) return nullptr;
    }
    return nullptr;
}

// Bounds are added lazily, because most runs are never tested.
bool DrawListBuilder::MayTouch(OpenRun& run, DrawBounds const& bounds) {
    for (; run.unbounded != kEnd; run.unbounded = mDraws[run.unbounded].next) {
        run.bounds.Add(mDraws[run.unbounded].bounds);
    }
    return run.bounds.MayTouch(bounds);
}

inline bool DrawListBuilder::Continues(OpenRun const& run, ProgramLayout const& layout, Record const& record,
                                       Continuation& how) const {
    Record const& last = mDraws[run.tail].record;
    how.isNext = last.first + last.count == record.first;
    how.isSame = last.values == record.values;
    if (MOKA_UNLIKELY(!how.isNext) && (!mMerges || run.vertices + record.count > kMostGathered)) return false;
    if (how.isSame) return true;
    // Run::varying has one bit for each integer.
    std::size_t const integers = layout.integersEnd - layout.integersBegin;
    if (!mMerges || integers > 32 * sizeof(std::int32_t)) return false;
    if (integers == 0) return true;
    unsigned char const* const values = mList.uniforms.data();
    how.varying = FindVarying(values + last.values, values + record.values, layout);
    return how.varying == 0 || run.varying != 0 || run.draws < kLongRun;
}

inline void DrawListBuilder::Join(OpenRun& run, Record const& record, DrawBounds const& bounds,
                                  Continuation const& how) {
    if (how.isNext && how.isSame) {
        Draw& last = mDraws[run.tail];
        last.record.count += record.count;
        last.bounds = Enclose(last.bounds, bounds);
        run.unbounded = std::min(run.unbounded, run.tail);
    } else {
        std::uint32_t const index = AddRecord(record, bounds);
        if (run.unbounded == kEnd) run.unbounded = index;
        mDraws[run.tail].next = index;
        run.tail = index;
        run.varying |= how.varying;
        run.isContiguous = run.isContiguous && how.isNext;
    }
    ++run.draws;
    run.vertices += record.count;
}

void DrawListBuilder::OpenNewRun(std::size_t state, Record const& record, DrawBounds const& bounds,
                                 std::size_t stride) {
    RunEnd const end = GetEndBefore(state);
    std::uint32_t const index = AddRecord(record, bounds);
    if (mRuns.size() == mRunCount) mRuns.emplace_back();
    mList.commands.emplace_back(Run{state, 0, 0, true, 0});
    ++mCounters.runs;
    ++mCounters.runEnds[static_cast<std::size_t>(end)];
    OpenRun& run = mRuns[mRunCount++];
    run.command = mList.commands.size() - 1;
    run.state = state;
    run.stride = stride;
    run.head = run.tail = index;
    run.draws = 1;
    run.vertices = record.count;
    run.isContiguous = true;
    run.varying = 0;
    run.bounds.Clear();
    run.unbounded = index;
}

std::uint32_t DrawListBuilder::AddRecord(Record const& record, DrawBounds const& bounds) {
    // Reserved here, so that Finish() need not allocate.
    if (mList.records.capacity() == mDraws.size()) mList.records.reserve(mDraws.size() * 2 + kReach);
    mDraws.push_back({record, bounds, kEnd});
    return static_cast<std::uint32_t>(mDraws.size() - 1);
}

RunEnd DrawListBuilder::GetEndBefore(std::size_t state) const {
    if (mList.commands.empty()) return mFlushReason;
    if (mRunCount == mFirstOpenRun) return RunEnd::Other;
    RunState const& a = mList.states[mRuns[mRunCount - 1].state];
    RunState const& b = mList.states[state];
    if (!(a.target == b.target)) return RunEnd::Target;
    if (a.program != b.program) return RunEnd::Program;
    if (a.format != b.format || a.primitive != b.primitive) return RunEnd::Primitive;
    if (!(a.textures == b.textures)) return RunEnd::Texture;
    if (!(a.blend == b.blend)) return RunEnd::Blend;
    if (!(a.scissor == b.scissor)) return RunEnd::Scissor;
    if (!(a.depthStencil == b.depthStencil)) return RunEnd::Clip;
    return a.primitive == PrimitiveType::TriangleList ? RunEnd::Values : RunEnd::Primitive;
}

DrawList const& DrawListBuilder::Finish() {
    for (std::size_t i = 0; i < mRunCount; ++i) FinishRun(mRuns[i]);
    mCounters.records += mList.records.size();
    return mList;
}

void DrawListBuilder::FinishRun(OpenRun const& run) {
    Run& finished = std::get<Run>(mList.commands[run.command]);
    finished.firstRecord = mList.records.size();
    for (std::uint32_t i = run.head; i != kEnd; i = mDraws[i].next) mList.records.push_back(mDraws[i].record);
    finished.recordCount = mList.records.size() - finished.firstRecord;
    finished.varying = run.varying;
    finished.isContiguous = run.isContiguous;
    if (!run.isContiguous) Gather(run, finished);
}

// Copies the run's vertices to the end of the list, in the order of its records.
void DrawListBuilder::Gather(OpenRun const& run, Run& finished) {
    AppendBuffer<float>& floats = mList.vertices;
    std::size_t const begin = (floats.size() + run.stride - 1) / run.stride * run.stride;
    try {
        floats.resize(begin + static_cast<std::size_t>(run.vertices) * run.stride);
    } catch (std::bad_alloc const&) {
        return; // each record is then drawn from its own place
    }
    int first = static_cast<int>(begin / run.stride);
    for (std::size_t i = 0; i < finished.recordCount; ++i) {
        Record& record = mList.records[finished.firstRecord + i];
        auto const stride = static_cast<std::ptrdiff_t>(run.stride);
        std::copy_n(floats.data() + record.first * stride, record.count * stride,
                    floats.data() + first * stride);
        record.first = first;
        first += record.count;
    }
    finished.isContiguous = true;
    JoinEqualRecords(finished);
}

// Joins neighbours with equal values among the records of the run that is finished last. Records of later
// runs are appended afterwards.
void DrawListBuilder::JoinEqualRecords(Run& finished) {
    std::vector<Record>& records = mList.records;
    std::size_t last = finished.firstRecord;
    for (std::size_t i = last + 1; i < records.size(); ++i) {
        if (records[i].values == records[last].values) {
            records[last].count += records[i].count;
        } else {
            records[++last] = records[i];
        }
    }
    records.resize(last + 1);
    finished.recordCount = records.size() - finished.firstRecord;
}

void DrawListBuilder::UseTexture(DeviceName texture) {
    if (texture != 0) mTextureUses[texture] = mNumber;
}

bool DrawListBuilder::UsesTexture(DeviceName texture) const {
    auto const found = mTextureUses.find(texture);
    return found != mTextureUses.end() && found->second == mNumber;
}

void DrawListBuilder::Clear(bool full) {
    mList.commands.clear();
    mList.states.clear();
    mList.records.clear();
    mList.uniforms.clear();
    mList.vertices.clear();
    mDraws.clear();
    mRunCount = 0;
    mFirstOpenRun = 0;
    mLastState = kNoState;
    mDrawnFloats = 0;
    mEndStride = 0;
    mEndVertex = 0;
    mListedFloats = 0;
    mFlushReason = full ? RunEnd::Full : RunEnd::Other;
    ++mNumber;
}

std::uint64_t DrawListBuilder::GetCapacityBytes() const {
    return mList.commands.capacity() * sizeof(Command) + mList.states.capacity() * sizeof(RunState) +
           mList.records.capacity() * sizeof(Record) + mList.uniforms.capacity() +
           mList.vertices.capacity() * sizeof(float) + mDraws.capacity() * sizeof(Draw) +
           mRuns.capacity() * sizeof(OpenRun);
}

} // namespace Moka::detail
