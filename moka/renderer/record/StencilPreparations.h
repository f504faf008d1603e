// StencilPreparations: what draws into the stencil alone leave in a depth-stencil buffer. A preparation is a clear
// of the stencil and the draws that follow it without writing colour. It is recorded when a draw that tests the
// stencil needs it, where that draw lies, and not again while the buffer still holds it.
// Owner:  the recorder.
// Thread: render thread, within a request. Used while requests are deferred.
// Cost:   two preparations are compared by their values and vertices. The memory for them is kept.
#pragma once

#include "moka/renderer/DrawBounds.h"
#include "moka/renderer/device/DrawList.h"
#include "moka/renderer/record/DrawListBuilder.h"

#include <vector>

namespace Moka::detail {

class ProgramState;

class StencilPreparations {
public:
    explicit StencilPreparations(DrawListBuilder& list) : mList(list) {}

    // The next request of a preparation is kept. False: it is none, and the caller records it.
    bool TakeClear(DepthStencilClear const& clear);
    bool TakeDraw(RunState const& state, ProgramState const& program, float const* vertices, int count,
                  int stride);

    bool IsPending() const { return mIsPending; }
    // Before a draw that tests the stencil is recorded: the buffer holds what the draw tests. Throws bad_alloc.
    void BeforeDraw(RunState const& state, DrawBounds const& bounds);
    // What is kept is recorded.
    void Finish();
    // Before the target's buffer is written in another way, or external GL may see it: what is kept is recorded,
    // and drawn all over the target.
    void Complete(TargetRef const& target);
    // Whether one that is kept or that a buffer holds is drawn with the program.
    bool Uses(DeviceName program) const;
    // The buffer's contents are not known any more.
    void Forget(DeviceName depthStencil);
    // The program is deleted.
    void ForgetUses(DeviceName program);
    void ForgetAll();

private:
    struct Step {
        bool isClear;
        int clearValue;
        RunState state; // of a draw; its target is the one of the whole
        std::size_t values;
        std::size_t valueBytes;
        std::size_t vertices;
        int count;
        int stride;

        bool IsSame(Step const& other) const;
    };

    // The steps and what they refer to.
    struct Recipe {
        TargetRef target;
        std::vector<Step> steps;
        std::vector<unsigned char> values;
        std::vector<float> vertices;

        void Clear();
        bool IsSame(Recipe const& other) const;
        bool Uses(DeviceName program) const;
    };

    // What one buffer holds inside a part of it.
    struct Content {
        DeviceName buffer = 0;
        Recipe recipe;
        ScissorRect part;
        std::uint64_t list = 0;            // that it was recorded in last
        std::vector<std::size_t> commands; // of that list
    };

    static constexpr std::size_t kMostContents = 8;

    bool IsPendingFor(DeviceName buffer) const {
        return mIsPending && mPending.target.depthStencil == buffer;
    }
    Content* Find(DeviceName buffer);
    Content& Replace(DeviceName buffer);
    void Ensure(Content& content, TargetRef const& target, ScissorRect const& part);
    void Record(Content& content, TargetRef const& target, ScissorRect const& part);

    DrawListBuilder& mList;
    bool mIsPending = false;
    Recipe mPending;
    std::vector<Content> mContents; // oldest first
};

} // namespace Moka::detail
