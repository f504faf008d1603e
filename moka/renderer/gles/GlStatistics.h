// GlStatistics: the counters behind RendererStatistics, one set a context.
// Thread: any may read. The render thread writes; the counts of what may be dropped elsewhere are written
//         there too.
#pragma once

#include "moka/renderer/RendererStatistics.h"

#include <atomic>

namespace Moka::detail {

// Written by one thread alone, so that counting a draw costs an addition and no locked one.
class GlCounter {
public:
    void operator++() { *this += 1; }
    void operator--() { Set(*this - 1); }
    void operator+=(std::uint64_t more) { Set(*this + more); }
    void Set(std::uint64_t value) { mValue.store(value, std::memory_order_relaxed); }
    operator std::uint64_t() const { return mValue.load(std::memory_order_relaxed); }

private:
    std::atomic<std::uint64_t> mValue{0};
};

struct GlStatistics {
    std::atomic<int> textures{0};
    std::atomic<int> samplers{0};
    std::atomic<int> frameBuffers{0};
    std::atomic<int> renderBuffers{0};
    std::atomic<int> pooledRenderBuffers{0};
    std::atomic<int> renderTargets{0};
    std::atomic<int> textureObjects{0};
    std::atomic<int> depthStencilBuffers{0};
    std::atomic<int> programs{0};
    std::atomic<int> graphicsObjects{0};
    std::atomic<int> stateObjects{0};
    std::atomic<int> buffers{0};

    GlCounter drawRequests;
    GlCounter draws;
    GlCounter plays;
    GlCounter listBytes;

    GlCounter frameBufferSwitches;
    GlCounter programSwitches;
    GlCounter uniformChanges;
    GlCounter textureSwitches;
    GlCounter blendChanges;
    GlCounter depthStencilChanges;
    GlCounter scissorChanges;
    GlCounter queries;

    GlCounter clears;
    GlCounter copies;
    GlCounter bytesUploaded;
    GlCounter vertexBytes;
    GlCounter bytesReadBack;
    // Drivers may report from a thread of their own.
    std::atomic<std::uint64_t> errors{0};

    RendererStatistics Snapshot() const {
        RendererStatistics result;
        result.textures = textures;
        result.samplers = samplers;
        result.frameBuffers = frameBuffers;
        result.renderBuffers = renderBuffers;
        result.pooledRenderBuffers = pooledRenderBuffers;
        result.renderTargets = renderTargets;
        result.textureObjects = textureObjects;
        result.depthStencilBuffers = depthStencilBuffers;
        result.programs = programs;
        result.graphicsObjects = graphicsObjects;
        result.stateObjects = stateObjects;
        result.buffers = buffers;
        result.drawRequests = drawRequests;
        result.draws = draws;
        result.plays = plays;
        result.listBytes = listBytes;
        result.programSwitches = programSwitches;
        result.uniformChanges = uniformChanges;
        result.textureSwitches = textureSwitches;
        result.blendChanges = blendChanges;
        result.depthStencilChanges = depthStencilChanges;
        result.scissorChanges = scissorChanges;
        result.queries = queries;
        result.vertexBytes = vertexBytes;
        result.frameBufferSwitches = frameBufferSwitches;
        result.clears = clears;
        result.copies = copies;
        result.bytesUploaded = bytesUploaded;
        result.bytesReadBack = bytesReadBack;
        result.errors = errors;
        return result;
    }
};

} // namespace Moka::detail
