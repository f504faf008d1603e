#include "moka/renderer/gles/GlMergedRuns.h"

#include "moka/renderer/gles/GlDevice.h"
#include "moka/renderer/gles/GlTables.h"

#include <algorithm>

namespace Moka::detail {

void GlMergedRuns::Prepare(DrawList const& list) {
    mMerged.clear();
    mRecords.clear();
    mNumbers.clear();
    mNext = 0;
    int budget = kMostLinks;
    for (Command const& command : list.commands) {
        auto const* const run = std::get_if<Run>(&command);
        if (run && run->recordCount > 1 && run->isContiguous) Place(list, *run, &budget);
    }
    if (!mMerged.empty()) Upload();
}

void GlMergedRuns::Place(DrawList const& list, Run const& run, int* budget) {
    GlVariants* const variants = mDevice.programs.GetVariants(list.states[run.state].program);
    if (!variants) return;
    unsigned char const* const values = list.uniforms.data() + list.records[run.firstRecord].values;
    std::size_t variant = 0;
    if (!variants->Choose(run, values, budget, &variant)) return;
    if (mAlignment == 0) {
        GLint alignment = 1;
        Gl::GetIntegerv(GL_UNIFORM_BUFFER_OFFSET_ALIGNMENT, &alignment);
        mAlignment = static_cast<std::size_t>(std::max(alignment, 1));
    }
    mRecords.resize(GetBlockStep(mRecords.size()));
    mMerged.push_back({&run, variants, variant, mRecords.size(), mNumbers.size()});
    PlaceRecords(list, run, variants->GetLayout());
}

// Rounds bytes up to the alignment of uniform blocks.
std::size_t GlMergedRuns::GetBlockStep(std::size_t bytes) const {
    return (bytes + mAlignment - 1) / mAlignment * mAlignment;
}

void GlMergedRuns::PlaceRecords(DrawList const& list, Run const& run, ProgramLayout const& layout) {
    std::size_t const stride = GetRecordStride(layout);
    std::size_t const perBlock = GetRecordsPerBlock(layout);
    std::size_t const blockStep = GetBlockStep(perBlock * stride);
    std::size_t const begin = mRecords.size();
    std::size_t const last = run.recordCount - 1;
    mRecords.resize(begin + last / perBlock * blockStep + (last % perBlock + 1) * stride);
    for (std::size_t i = 0; i < run.recordCount; ++i) {
        Record const& record = list.records[run.firstRecord + i];
        unsigned char const* const values = list.uniforms.data() + record.values;
        std::copy_n(values, layout.integersEnd,
                    &mRecords[begin + i / perBlock * blockStep + i % perBlock * stride]);
        mNumbers.insert(mNumbers.end(), static_cast<std::size_t>(record.count),
                        static_cast<GLushort>(i % perBlock));
    }
}

void GlMergedRuns::Upload() {
    // GL requires that the range bound for the last block is as large as the declared block.
    mRecords.resize(mRecords.size() + kBlockBytes);
    if (mRecordBuffer == 0) {
        Gl::GenBuffers(1, &mRecordBuffer);
        Gl::GenBuffers(1, &mNumberBuffer);
        mDevice.counters.buffers += 2;
    }
    mDevice.host.SaveUniformBuffer();
    mDevice.state.uniformBuffer.Set(mRecordBuffer);
    Gl::BufferData(GL_UNIFORM_BUFFER, static_cast<GLsizeiptr>(mRecords.size()), mRecords.data(),
                   GL_STREAM_DRAW);
    std::size_t const numberBytes = mNumbers.size() * sizeof(GLushort);
    mDevice.state.arrayBuffer.Set(mNumberBuffer);
    Gl::BufferData(GL_ARRAY_BUFFER, static_cast<GLsizeiptr>(numberBytes), mNumbers.data(), GL_STREAM_DRAW);
    mDevice.counters.vertexBytes += mRecords.size() + numberBytes;
}

bool GlMergedRuns::Draw(DrawList const& list, Run const& run) {
    if (mNext == mMerged.size() || mMerged[mNext].run != &run) return false;
    Merged const& merged = mMerged[mNext++];
    Record const* const records = &list.records[run.firstRecord];
    ProgramLayout const& layout = merged.variants->GetLayout();
    merged.variants->Use(merged.variant, list.uniforms.data() + records->values);
    RunState const& state = list.states[run.state];
    mDevice.vertexFormats.BindNumbered(state.format, records->first, mNumberBuffer, merged.numbers);
    std::size_t const perBlock = GetRecordsPerBlock(layout);
    std::size_t const blockBytes = perBlock * GetRecordStride(layout);
    std::size_t offset = merged.records;
    int const begin = records->first;
    for (std::size_t i = 0; i < run.recordCount; i += perBlock) {
        Record const& last = records[std::min(i + perBlock, run.recordCount) - 1];
        int const first = records[i].first;
        Gl::BindBufferRange(GL_UNIFORM_BUFFER, GlVariants::kBinding, mRecordBuffer,
                            static_cast<GLintptr>(offset), static_cast<GLsizeiptr>(blockBytes));
        Gl::DrawArrays(ToGlPrimitive(state.primitive), first - begin, last.first + last.count - first);
        ++mDevice.counters.draws;
        if (i > 0) ++mDevice.counters.runEnds[static_cast<std::size_t>(RunEnd::Full)];
        offset += GetBlockStep(blockBytes);
    }
    return true;
}

void GlMergedRuns::Clear() {
    if (mRecordBuffer == 0) return;
    for (GLuint const buffer : {mRecordBuffer, mNumberBuffer}) {
        mDevice.state.ForgetBuffer(buffer);
        Gl::DeleteBuffers(1, &buffer);
    }
    mRecordBuffer = mNumberBuffer = 0;
    mDevice.counters.buffers -= 2;
}

} // namespace Moka::detail
