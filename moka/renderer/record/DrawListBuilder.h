// DrawListBuilder: records draws, clears and copies into a draw list and joins adjacent draws that share
// everything. Knows which textures and programs the list uses.
// Thread: render thread.
// Cost:   the memory of the largest list is kept and used again, so a warm builder allocates nothing.
// Fails:  bad_alloc; the list is then as it was before the call.
#pragma once

#include "moka/renderer/device/DrawList.h"

#include <cstdint>
#include <unordered_map>

namespace Moka::detail {

class ProgramState;

// Vertices that were handed over and lie in a list, or lay in it until it was flushed.
struct ListVertices {
    std::uint64_t list = 0;
    std::size_t offset = 0; // floats
    std::size_t size = 0;   // floats
    std::size_t stride = 0; // floats of one vertex
};

class DrawListBuilder {
public:
    // Places the vertices at a multiple of their stride (floats of one vertex). previous are those that they
    // take the place of: at the end of the list and not drawn, they are dropped.
    ListVertices AddVertices(float const* vertices, int count, int stride, ListVertices const& previous);
    bool Has(ListVertices const& vertices) const { return vertices.list == mNumber; }
    float const* GetVertices(ListVertices const& vertices) const {
        return mList.vertices.data() + vertices.offset;
    }

    // Draws count of the vertices, from the first one on, which lie in this list. state is compared with the
    // last draw's unless isKnownSame; the program's values are copied if they changed.
    void AddDraw(RunState const& state, bool isKnownSame, ProgramState& program, ListVertices const& vertices,
                 int first, int count);
    void Add(ColorClear const& clear);
    void Add(DepthStencilClear const& clear);
    void Add(TextureClear const& clear);
    void Add(Discard const& discard);
    void Add(TargetCopy const& copy);
    void Add(TextureDraw const& draw);

    // Whether a command in the list reads or writes the texture.
    bool UsesTexture(DeviceName texture) const;
    bool Uses(ProgramState const& program) const;
    // The name means nothing any more; the list is empty.
    void ForgetTexture(DeviceName texture) { mTextureUses.erase(texture); }

    bool IsEmpty() const { return mList.commands.empty(); }
    // Large enough for the GPU to begin while the rest is recorded.
    bool IsFull() const {
        return mList.vertices.size() >= kFullFloats || mList.commands.size() >= kFullCommands;
    }
    DrawList const& GetList() const { return mList; }
    void Clear();
    std::uint64_t GetCapacityBytes() const;

private:
    static constexpr std::size_t kFullFloats = 1u << 18; // 1 MiB
    static constexpr std::size_t kFullCommands = 1u << 13;

    bool IsUndrawnEnd(ListVertices const& vertices) const;
    std::size_t AddState(RunState const& state, bool isKnownSame);
    std::size_t AddValues(ProgramState& program);
    bool Extend(Run const& run);
    void UseTexture(DeviceName texture);

    DrawList mList;
    std::size_t mDrawnFloats = 0; // draws refer to vertices before it
    // Numbers the lists, so that marks of earlier lists mean nothing in this one.
    std::uint64_t mNumber = 1;
    std::unordered_map<DeviceName, std::uint64_t> mTextureUses; // the number of the last list that used it
};

} // namespace Moka::detail
