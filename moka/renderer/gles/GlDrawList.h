// GlDrawList: what was asked for and has not reached GL: draws, clears, copies, in order. Adjacent draws that
// share everything become one run. Nothing here calls GL; GlPlayer does.
// Owner:   keeps what it names alive (frame buffers, textures, programs) until it is cleared.
// Thread:  render thread.
// Cost:    its memory grows to the largest list there was and is used again, so recording allocates nothing
//          once it has warmed up.
#pragma once

#include "moka/renderer/gles/GlDrawState.h"

#include <cstdint>
#include <variant>
#include <vector>

namespace Moka::detail {

// Vertices with one state and one set of uniform values.
struct GlRun {
    std::size_t state;    // index into the list's states
    std::size_t uniforms; // offset into the list's values
    GLint first;          // vertex
    GLsizei count;        // vertices
};

struct GlColorClear {
    GlTargetUse target;
    GlScissor scissor;
    std::array<GLfloat, 4> color;
};

struct GlDepthStencilClear {
    GlTargetUse target;
    GlScissor scissor;
    bool clearDepth;
    bool clearStencil;
    GLfloat depth;
    GLint stencil;
};

// The contents need not be kept.
struct GlDiscard {
    GlTargetUse target;
    bool color;
    bool depthStencil;
};

// A copy of the target's first rows and columns into a texture.
struct GlTargetCopy {
    GlTargetUse target;
    std::shared_ptr<GlTextureStorage> to;
};

using GlCommand = std::variant<GlRun, GlColorClear, GlDepthStencilClear, GlDiscard, GlTargetCopy>;

class GlDrawList {
public:
    // state is compared with the last draw's unless isKnownSame. The values of the program's uniforms are
    // taken down.
    void AddDraw(GlDrawState const& state, bool isKnownSame, GLfloat const* vertices, GLsizei count,
                 int floatsPerVertex);
    void Add(GlColorClear clear);
    void Add(GlDepthStencilClear clear);
    void Add(GlDiscard discard);
    void Add(GlTargetCopy copy);

    bool IsEmpty() const { return mCommands.empty(); }
    // Played now, it is large enough for the GPU to begin while the rest is recorded.
    bool IsFull() const { return mVertices.size() >= kFullFloats || mCommands.size() >= kFullCommands; }
    // Whether a command in the list reads or writes it.
    bool Uses(GlTextureStorage const& storage) const;
    bool Uses(GlUniforms const& program) const;

    std::vector<GlCommand> const& GetCommands() const { return mCommands; }
    GlDrawState const& GetState(std::size_t index) const { return mStates[index]; }
    unsigned char const* GetUniforms(std::size_t offset) const { return mUniforms.data() + offset; }
    std::vector<GLfloat> const& GetVertices() const { return mVertices; }

    void Clear();
    // Of memory, used or not.
    std::uint64_t GetBytes() const;

private:
    static constexpr std::size_t kFullFloats = 1u << 18; // 1 MiB
    static constexpr std::size_t kFullCommands = 1u << 13;

    std::size_t AddState(GlDrawState const& state, bool isKnownSame);
    std::size_t AddUniforms(GlUniforms& program);
    GLint AddVertices(GLfloat const* vertices, GLsizei count, int floatsPerVertex);
    bool Extend(GlRun const& run);
    void Mark(GlTargetUse const& target);

    std::vector<GlCommand> mCommands;
    std::vector<GlDrawState> mStates;
    std::vector<unsigned char> mUniforms;
    std::vector<GLfloat> mVertices;
    // Counts the lists, so that what a program or a texture remembers of this one is told from earlier ones.
    std::uint64_t mNumber = 1;
};

} // namespace Moka::detail
