// GlSubmitter: executes the commands of a draw list in order, with as few GL calls as the state cache allows.
// Thread: render thread.
#pragma once

#include "moka/renderer/device/DrawList.h"

#include <cstdint>
#include <string>

namespace Moka::detail {

class GlDevice;

class GlSubmitter {
public:
    explicit GlSubmitter(GlDevice& device) : mDevice(device) {}

    void Submit(DrawList const& list);

private:
    std::string DescribeFlush(DrawList const& list);
    void ExecuteAll(DrawList const& list);
    void Execute(Run const& run);
    void Execute(ColorClear const& clear);
    void Execute(DepthStencilClear const& clear);
    void Execute(TextureClear const& clear);
    void Execute(Discard const& discard);
    void Execute(TargetCopy const& copy);
    void Execute(TextureDraw const& draw);
    void Execute(MipmapUpdate const& update);

    void Apply(RunState const& state);
    void BindForClear(TargetRef const& target);
    void ClearColor(float const* color);
    void BeginCopy();
    bool HasAlpha(TargetRef const& target);
    void Blit(TargetRef const& from, TargetRef const& to, int width, int height);

    GlDevice& mDevice;
    DrawList const* mList = nullptr;
    RunState const* mApplied = nullptr; // the state of the last command; null unless it was a run
    std::uint64_t mDescribedRequests = 0;
};

} // namespace Moka::detail
