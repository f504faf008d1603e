// DrawListBuilder: records draws, clears and copies into a draw list and joins draws of one state into runs.
// Knows which textures and programs the list uses.
// A draw joins the last run of its state. Between the two only runs may lie whose draws it does not touch, so
// that no pixel is drawn in another order.
// Thread: render thread.
// Cost:   the memory of the largest list is kept and used again, so a warm builder allocates nothing.
// Fails:  bad_alloc; the list is then as it was before the call.
#pragma once

#include "moka/renderer/RendererStatistics.h"
#include "moka/renderer/device/DrawList.h"
#include "moka/renderer/record/RunBounds.h"

#include <cstdint>
#include <unordered_map>

namespace Moka::detail {

struct Counters;
class ProgramState;
struct ProgramLayout;

// Vertices that were handed over and lie in a list, or lay in it until it was flushed.
struct ListVertices {
    std::uint64_t list = 0;
    std::size_t offset = 0; // floats
    std::size_t size = 0;   // floats
    std::size_t stride = 0; // floats of one vertex
    int first = 0;          // offset in vertices
};

// Vertices to draw: count of them, from the first one on.
struct ListDraw {
    ListVertices const& vertices; // of the present list
    int first;
    int count;
    DrawBounds bounds;
};

struct SeparateDraw {
    RunState const& state;
    unsigned char const* values;
    std::size_t valueBytes;
    float const* vertices;
    int count;
    int stride; // floats of one vertex
};

class DrawListBuilder {
public:
    explicit DrawListBuilder(Counters& counters) : mCounters(counters) {}

    // Each draw is a run of its own, except where neither state nor values differ.
    void SetMerging(bool on) { mMerges = on; }

    // Places the vertices at a multiple of their stride (floats of one vertex). place says where; those that it
    // named before are dropped if they lie at the end of the list and are not drawn.
    void AddVertices(float const* vertices, int count, int stride, ListVertices& place);
    bool Has(ListVertices const& vertices) const { return vertices.list == mNumber; }
    float const* GetVertices(ListVertices const& vertices) const {
        return mList.vertices.data() + vertices.offset;
    }

    // state is compared with those of the last runs unless isKnownSame as the last draw's; the program's values
    // are copied if they changed.
    void AddDraw(RunState const& state, bool isKnownSame, ProgramState& program, ListDraw const& draw);
    // A draw that shares its run with no other, of values and vertices that are copied.
    void AddSeparateDraw(SeparateDraw const& draw);
    // Of a clear of the stencil or of a separate draw, by its place in the commands.
    void SetScissor(std::size_t command, ScissorState const& scissor);
    // Any command but a draw.
    template <class Other>
    void Add(Other const& command) {
        UseTextures(command);
        mList.commands.emplace_back(command);
        mFirstOpenRun = mRunCount;
    }

    // Drops vertices that nobody draws if they are the last ones.
    void DropVertices(ListVertices const& vertices);

    // Numbers the lists from 1 on.
    std::uint64_t GetNumber() const { return mNumber; }
    // Not complete before Finish().
    DrawList const& GetList() const { return mList; }
    // Whether a command in the list reads or writes the texture.
    bool UsesTexture(DeviceName texture) const;
    // The name means nothing any more; the list is empty.
    void ForgetTexture(DeviceName texture) { mTextureUses.erase(texture); }

    bool IsEmpty() const { return mList.commands.empty(); }
    // Large enough for the GPU to begin while the rest is recorded.
    bool IsFull() const {
        return mList.vertices.size() >= kFullFloats || mListedFloats >= 2 * kFullFloats ||
               mList.commands.size() >= kFullCommands || mList.uniforms.size() >= kFullBytes;
    }
    // Complete: the runs' records and vertices are in their order.
    DrawList const& Finish();
    // full: the list was flushed because it had no more room.
    void Clear(bool full);
    std::uint64_t GetCapacityBytes() const;

private:
    static constexpr std::size_t kFullFloats = 1u << 18; // 1 MiB
    static constexpr std::size_t kFullBytes = 1u << 20;
    static constexpr std::size_t kFullCommands = 1u << 13;
    // How many runs back a draw looks for one of its state.
    static constexpr std::size_t kReach = 16;
    // A run that so many draws share a constant in is worth keeping that constant.
    static constexpr int kLongRun = 32;
    // Vertices of a run that are copied at most to make it contiguous.
    static constexpr int kMostGathered = 1 << 14;
    static constexpr std::uint32_t kEnd = ~std::uint32_t{0};
    static constexpr std::size_t kNoState = ~std::size_t{0};

    struct Draw {
        Record record;
        DrawBounds bounds;
        std::uint32_t next; // index of the run's next draw, or kEnd
    };

    struct OpenRun {
        std::size_t command; // index into the list's commands
        std::size_t state;   // index into the list's states
        std::size_t stride;  // floats of one vertex
        std::uint32_t head;  // index of the first draw
        std::uint32_t tail;
        int draws;
        int vertices;
        bool isContiguous;
        std::uint32_t varying;
        RunBounds bounds;        // of the draws up to the one before
        std::uint32_t unbounded; // the first draw that is not in bounds yet, or kEnd
    };

    // How a record follows the last one of a run.
    struct Continuation {
        bool isNext = false;       // its vertices lie behind the last one's
        bool isSame = false;       // it has the same values
        std::uint32_t varying = 0; // a bit for each integer that differs
    };

    bool IsUndrawnEnd(ListVertices const& vertices) const;
    void Align(std::size_t stride);
    std::size_t AddState(RunState const& state);
    std::size_t AddValues(ProgramState& program);
    OpenRun* FindRun(std::size_t state, DrawBounds const& bounds);
    OpenRun* FindEarlierRun(std::size_t state, DrawBounds const& bounds);
    bool MayTouch(OpenRun& run, DrawBounds const& bounds);
    // False: the record needs a run of its own.
    bool Continues(OpenRun const& run, ProgramLayout const& layout, Record const& record,
                   Continuation& how) const;
    void Join(OpenRun& run, Record const& record, DrawBounds const& bounds, Continuation const& how);
    void OpenNewRun(std::size_t state, Record const& record, DrawBounds const& bounds, std::size_t stride);
    std::uint32_t AddRecord(Record const& record, DrawBounds const& bounds);
    RunEnd GetEndBefore(std::size_t state) const;
    void FinishRun(OpenRun const& run);
    void Gather(OpenRun const& run, Run& finished);
    void JoinEqualRecords(Run& finished);

    void UseTexture(DeviceName texture);
    void UseTextures(ColorClear const& clear) { UseTexture(clear.target.texture); }
    void UseTextures(DepthStencilClear const& clear) { UseTexture(clear.target.texture); }
    void UseTextures(TextureClear const& clear) { UseTexture(clear.target.texture); }
    void UseTextures(Discard const& discard) { UseTexture(discard.target.texture); }
    void UseTextures(MipmapUpdate const& update) { UseTexture(update.texture); }
    template <class Copy>
    void UseTextures(Copy const& copy) {
        UseTexture(copy.from.texture);
        UseTexture(copy.to.texture);
    }

    Counters& mCounters;
    bool mMerges = true;
    DrawList mList;
    std::vector<Draw> mDraws;
    std::vector<OpenRun> mRuns; // the first mRunCount are of this list
    std::size_t mRunCount = 0;
    std::size_t mFirstOpenRun = 0;       // runs before it lie behind another command
    RunEnd mFlushReason = RunEnd::Other; // why the list before this one ended
    std::size_t mLastState = kNoState;   // of this list's last draw that was no separate one
    std::size_t mDrawnFloats = 0;        // draws refer to vertices before it
    std::size_t mEndStride = 0;          // the list's floats are a multiple of it: mEndVertex times
    int mEndVertex = 0;
    // Of all draws: vertices that are drawn again may have to be copied.
    std::size_t mListedFloats = 0;
    // So that marks of earlier lists mean nothing in this one.
    std::uint64_t mNumber = 1;
    std::unordered_map<DeviceName, std::uint64_t> mTextureUses; // the number of the last list that used it
};

} // namespace Moka::detail
