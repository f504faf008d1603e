// DrawListBuilder: records draws, clears and copies into a draw list and joins draws of one state into runs.
// It tracks which textures and programs the list uses.
// A draw joins the latest run of its state, unless its bounds overlap those of a run in between: overlapping
// draws keep their order.
// Thread: render thread.
// Cost:   the builder reuses the memory of the largest list, so once it is warm it does not allocate.
// Fails:  throws bad_alloc. The list is then as it was before the call.
#pragma once

#include "moka/base/Likely.h"
#include "moka/renderer/RendererStatistics.h"
#include "moka/renderer/device/DrawList.h"
#include "moka/renderer/record/RunBounds.h"

#include <cstdint>
#include <unordered_map>

namespace Moka::detail {

struct Counters;
class ProgramState;
struct ProgramLayout;

// A range of vertices in the list with number `list`. The range is valid until that list is flushed.
struct ListVertices {
    std::uint64_t list = 0;
    std::size_t offset = 0; // floats
    std::size_t size = 0;   // floats
    std::size_t stride = 0; // floats of one vertex
    int first = 0;          // offset in vertices
};

// A draw of `count` vertices, starting with vertex `first`.
struct ListDraw {
    ListVertices const& vertices; // in the current list
    int first;
    int count;
    DrawBounds bounds;
};

// A draw that is never joined to a run. Values and vertices are copied into the list.
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

    // With merging off, draws share a run only if state and values are equal.
    void SetMerging(bool on) { mMerges = on; }

    // Copies the vertices to a multiple of their stride (in floats) and sets `place`. The vertices that
    // `place` named before are removed if no draw uses them and they are the last ones in the list.
    void AddVertices(float const* vertices, int count, int stride, ListVertices& place) {
        DropVertices(place);
        auto const step = static_cast<std::size_t>(stride);
        if (MOKA_UNLIKELY(mEndStride != step)) Align(step);
        std::size_t const size = static_cast<std::size_t>(count) * step;
        std::size_t const offset = mList.vertices.size();
        mList.vertices.Append(vertices, size);
        place = {mNumber, offset, size, step, mEndVertex};
        mEndVertex += count;
    }
    bool Has(ListVertices const& vertices) const { return vertices.list == mNumber; }
    float const* GetVertices(ListVertices const& vertices) const {
        return mList.vertices.data() + vertices.offset;
    }

    // isKnownSame: the state equals that of the last draw, so no comparison is needed. The program's values
    // are copied if they have changed.
    void AddDraw(RunState const& state, bool isKnownSame, ProgramState& program, ListDraw const& draw);
    void AddSeparateDraw(SeparateDraw const& draw);
    // Changes the scissor of a recorded stencil clear or separate draw. command is its index in the list.
    void SetScissor(std::size_t command, ScissorState const& scissor);
    // Adds any command other than a draw.
    template <class Other>
    void Add(Other const& command) {
        UseTextures(command);
        mList.commands.emplace_back(command);
        mFirstOpenRun = mRunCount;
    }

    // Removes the vertices if no draw uses them and they are the last ones in the list.
    void DropVertices(ListVertices const& vertices) {
        if (MOKA_UNLIKELY(IsUndrawnEnd(vertices))) RemoveEnd(vertices);
    }

    // The number of the current list. The first list is 1.
    std::uint64_t GetNumber() const { return mNumber; }
    // The list is incomplete until Finish().
    DrawList const& GetList() const { return mList; }
    // True if a command in the list reads or writes the texture.
    bool UsesTexture(DeviceName texture) const;
    // Call this when the texture is deleted, while the list is empty.
    void ForgetTexture(DeviceName texture) { mTextureUses.erase(texture); }

    bool IsEmpty() const { return mList.commands.empty(); }
    // True if the list is large enough to be flushed now, so that the GPU works while the CPU records the
    // rest.
    bool IsFull() const {
        return MOKA_UNLIKELY(mList.vertices.size() >= kFullFloats || mListedFloats >= 2 * kFullFloats ||
                             mList.commands.size() >= kFullCommands || mList.uniforms.size() >= kFullBytes);
    }
    // Completes the list: puts the records and vertices of each run in order.
    DrawList const& Finish();
    // full: the list was flushed because IsFull() was true.
    void Clear(bool full);
    std::uint64_t GetCapacityBytes() const;

private:
    static constexpr std::size_t kFullFloats = 1u << 18; // 1 MiB
    static constexpr std::size_t kFullBytes = 1u << 20;
    static constexpr std::size_t kFullCommands = 1u << 13;
    // A draw searches at most this many of the latest runs for one of its state.
    static constexpr std::size_t kReach = 16;
    // From this many draws on, a run keeps its constants: a draw with another value opens a new run.
    static constexpr int kLongRun = 32;
    // The most vertices that are copied to make one run contiguous.
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
        RunBounds bounds;        // of the draws before `unbounded`
        std::uint32_t unbounded; // the first draw that is not in `bounds` yet, or kEnd
    };

    // How a record follows the last one of a run.
    struct Continuation {
        bool isNext = false;       // its vertices directly follow those of the last record
        bool isSame = false;       // its values are equal
        std::uint32_t varying = 0; // one bit for each integer that differs
    };

    bool IsUndrawnEnd(ListVertices const& vertices) const {
        return Has(vertices) && vertices.offset >= mDrawnFloats &&
               vertices.offset + vertices.size == mList.vertices.size();
    }
    void RemoveEnd(ListVertices const& vertices);
    void Align(std::size_t stride);
    std::size_t AddState(RunState const& state);
    std::size_t AddValues(ProgramState& program);
    OpenRun* FindRun(std::size_t state, DrawBounds const& bounds);
    OpenRun* FindEarlierRun(std::size_t state, DrawBounds const& bounds);
    bool MayTouch(OpenRun& run, DrawBounds const& bounds);
    // Returns false if the record needs a run of its own.
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
    std::vector<OpenRun> mRuns; // the first mRunCount belong to the current list
    std::size_t mRunCount = 0;
    std::size_t mFirstOpenRun = 0;       // earlier runs are closed: another command follows them
    RunEnd mFlushReason = RunEnd::Other; // why the previous list ended
    std::size_t mLastState = kNoState;   // the state of the last draw; separate draws do not count
    std::size_t mDrawnFloats = 0;        // draws use only vertices before this offset
    std::size_t mEndStride = 0;          // the list's size in floats is mEndVertex times this
    int mEndVertex = 0;
    // The vertices of all draws. One that is drawn twice counts twice, because gathering may copy it.
    std::size_t mListedFloats = 0;
    // ListVertices and ProgramState::Listed refer to lists by this number, so clearing invalidates them all.
    std::uint64_t mNumber = 1;
    std::unordered_map<DeviceName, std::uint64_t> mTextureUses; // the number of the last list that used it
};

} // namespace Moka::detail
