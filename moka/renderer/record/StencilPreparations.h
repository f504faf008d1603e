// StencilPreparations: avoids drawing the same stencil clip twice. A preparation is a clear of the stencil
// and the draws after it that do not write colour. It is kept back until a draw tests the stencil, then
// recorded for the area of that draw, and not recorded again while the buffer still holds the result.
// Owner:  the recorder.
// Thread: render thread, within a request. Used in deferred mode only.
// Cost:   preparations are compared by their values and vertices. Their memory is reused.
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

    // Keep back one request of a preparation. They return false if the request does not belong to a
    // preparation; the caller then records it.
    bool TakeClear(DepthStencilClear const& clear);
    bool TakeDraw(RunState const& state, ProgramState const& program, float const* vertices, int count,
                  int stride);

    bool IsPending() const { return mIsPending; }
    // Call this before a draw that tests the stencil. Records the preparation that the draw needs. Throws
    // bad_alloc.
    void BeforeDraw(RunState const& state, DrawBounds const& bounds);
    // Ends the pending preparation.
    void Finish();
    // Call this before other commands write the target's buffer or external GL may see it. Records the
    // pending preparation and extends it to the whole target.
    void Complete(TargetRef const& target);
    // True if a pending preparation, or one that a buffer holds, draws with the program.
    bool Uses(DeviceName program) const;
    // Call this when the contents of the buffer change in an unknown way.
    void Forget(DeviceName depthStencil);
    // Call this when the program is deleted.
    void ForgetUses(DeviceName program);
    void ForgetAll();

private:
    struct Step {
        bool isClear;
        int clearValue;
        RunState state; // of a draw; its target is Recipe::target
        std::size_t values;
        std::size_t valueBytes;
        std::size_t vertices;
        int count;
        int stride;

        bool IsSame(Step const& other) const;
    };

    // The steps of one preparation, with their values and vertices.
    struct Recipe {
        TargetRef target;
        std::vector<Step> steps;
        std::vector<unsigned char> values;
        std::vector<float> vertices;

        void Clear();
        bool IsSame(Recipe const& other) const;
        bool Uses(DeviceName program) const;
    };

    // The preparation that one buffer holds, and where.
    struct Content {
        DeviceName buffer = 0;
        Recipe recipe;
        ScissorRect part;                  // the area that was drawn
        std::uint64_t list = 0;            // the last list that it was recorded in
        std::vector<std::size_t> commands; // its commands in that list
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
