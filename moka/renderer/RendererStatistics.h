/// RendererStatistics: the numbers of the renderer's live objects by kind, and counts of its work since the
/// context was attached. Tests find leaks with them: at the end only pooled objects may be left.
#pragma once

#include <array>
#include <cstdint>

namespace Moka {

/// Why a draw could not join the run of draws before it. Runs of one state become one draw call each.
enum class RunEnd {
    Program,
    Texture, ///< or its sampling
    Blend,
    Scissor,
    Clip, ///< or another depth-stencil state
    Target,
    Primitive, ///< or the layout of the vertices; a strip is always a run of its own
    Values,    ///< a constant of the run differs, or too many vertices would have to be copied
    Full,      ///< the list is full
    Other,     ///< a clear, a copy or a flush lies between
};
/// The number of reasons.
inline constexpr std::size_t kRunEnds = 10;

/// The reason as one lower-case word.
constexpr char const* GetName(RunEnd end) {
    switch (end) {
    case RunEnd::Program:
        return "program";
    case RunEnd::Texture:
        return "texture";
    case RunEnd::Blend:
        return "blend";
    case RunEnd::Scissor:
        return "scissor";
    case RunEnd::Clip:
        return "clip";
    case RunEnd::Target:
        return "target";
    case RunEnd::Primitive:
        return "primitive";
    case RunEnd::Values:
        return "values";
    case RunEnd::Full:
        return "full";
    case RunEnd::Other:
        break;
    }
    return "other";
}

struct RendererStatistics {
    int textures = 0; ///< GL textures; several texture objects may share one
    /// Live objects by kind.
    int samplers = 0;
    int frameBuffers = 0;  ///< created by the renderer
    int renderBuffers = 0; ///< in use, without the pooled ones
    int pooledRenderBuffers = 0;
    int renderTargets = 0; ///< objects of the interfaces, as are the following
    int textureObjects = 0;
    int depthStencilBuffers = 0;
    int programs = 0;
    int variants = 0; ///< rewritten programs, which draw runs whose uniform values differ
    int graphicsObjects = 0;
    int stateObjects = 0; ///< blend and depth-stencil states
    int buffers = 0;      ///< the renderer's GL buffers and vertex arrays, kept while the context is attached

    /// The draws that were requested, the runs that they were joined into, and the draw calls that were
    /// submitted.
    std::uint64_t drawRequests = 0;
    std::uint64_t runs = 0;
    std::uint64_t draws = 0;
    std::uint64_t records = 0;                     ///< sets of uniform values in the runs
    std::array<std::uint64_t, kRunEnds> runEnds{}; ///< by RunEnd
    std::uint64_t flushes = 0;                     ///< of the draw list
    std::uint64_t listBytes = 0;                   ///< memory that the draw list holds

    /// Calls that change the driver's state.
    std::uint64_t frameBufferSwitches = 0;
    std::uint64_t programSwitches = 0;
    std::uint64_t uniformChanges = 0;
    std::uint64_t textureSwitches = 0;
    std::uint64_t blendChanges = 0; ///< with the colour mask
    std::uint64_t depthStencilChanges = 0;
    std::uint64_t scissorChanges = 0;
    std::uint64_t queries = 0; ///< queries of GL state, each of which may stall

    /// Work and bytes moved.
    std::uint64_t clears = 0;
    std::uint64_t copies = 0;
    std::uint64_t mipmapUpdates = 0; ///< times that a texture's levels were generated
    std::uint64_t bytesUploaded = 0; ///< texels
    std::uint64_t vertexBytes = 0;
    std::uint64_t bytesReadBack = 0;
    std::uint64_t errors = 0; ///< GL errors and error-severity debug messages
};

} // namespace Moka
