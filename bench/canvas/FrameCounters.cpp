#include "bench/canvas/FrameCounters.h"

#include <algorithm>

namespace Moka::Bench {
namespace {

double Median(std::vector<double>& values) {
    auto const middle = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2);
    std::nth_element(values.begin(), middle, values.end());
    return *middle;
}

} // namespace

void FrameCounters::Add(FrameCost const& cost) {
    mLast = cost;
    mCaller.push_back(cost.caller);
    mRecord.push_back(cost.render.record);
    mRender.push_back(cost.render.GetRender());
    mFinish.push_back(cost.render.finish);
    mState.SetIterationTime(cost.caller + cost.render.whole);
}

void FrameCounters::AddBare(RenderCost const& bare) {
    mBareRender.push_back(bare.GetRender());
    mRenderRatio.push_back(mLast.render.GetRender() / bare.GetRender());
    mWholeRatio.push_back(mLast.render.whole / bare.whole);
}

void FrameCounters::ReportTime(char const* name, std::vector<double>& seconds) {
    if (!seconds.empty()) mState.counters[name] = Median(seconds) * mScale;
}

void FrameCounters::Report() {
    if (mCaller.empty()) return;
    ReportTime("caller", mCaller);
    ReportTime("record", mRecord);
    ReportTime("render", mRender);
    ReportTime("finish", mFinish);
    ReportTime("bare_render", mBareRender);
    if (!mRenderRatio.empty()) {
        mState.counters["render_ratio"] = Median(mRenderRatio);
        mState.counters["whole_ratio"] = Median(mWholeRatio);
    }
    ReportStatistics();
}

void FrameCounters::ReportStatistics() {
    RendererStatistics const& before = mLast.before;
    RendererStatistics const& after = mLast.after;
    auto const report = [&](char const* name, std::uint64_t RendererStatistics::*member) {
        mState.counters[name] = static_cast<double>(after.*member - before.*member);
    };
    report("runs", &RendererStatistics::runs);
    report("records", &RendererStatistics::records);
    report("draws", &RendererStatistics::draws);
    report("flushes", &RendererStatistics::flushes);
    report("targets", &RendererStatistics::frameBufferSwitches);
    report("programs", &RendererStatistics::programSwitches);
    report("uniforms", &RendererStatistics::uniformChanges);
    report("textures", &RendererStatistics::textureSwitches);
    report("blends", &RendererStatistics::blendChanges);
    report("stencils", &RendererStatistics::depthStencilChanges);
    report("scissors", &RendererStatistics::scissorChanges);
    report("clears", &RendererStatistics::clears);
    report("copies", &RendererStatistics::copies);
    report("queries", &RendererStatistics::queries);
    report("vertex_bytes", &RendererStatistics::vertexBytes);
    report("texel_bytes", &RendererStatistics::bytesUploaded);
    report("list_growth", &RendererStatistics::listBytes);
    mState.counters["allocations"] = static_cast<double>(mLast.allocations);
    mState.counters["live_textures"] = after.textures;
}

} // namespace Moka::Bench
