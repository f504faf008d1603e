// Counters: the counts behind RendererStatistics, one set for each attached context.
// Thread: any thread may read. The render thread writes. Any thread may also write the counts of objects that
//         other threads may drop.
#pragma once

#include "moka/renderer/RendererStatistics.h"

#include <algorithm>
#include <array>
#include <atomic>

namespace Moka::detail {

// A count that only one thread writes, so that counting costs a plain addition.
class Counter {
public:
    // Written as one expression, because every draw calls it.
    void operator++() { mValue.store(mValue.load(std::memory_order_relaxed) + 1, std::memory_order_relaxed); }
    void operator+=(std::uint64_t more) { Set(*this + more); }
    void Set(std::uint64_t value) { mValue.store(value, std::memory_order_relaxed); }
    operator std::uint64_t() const { return mValue.load(std::memory_order_relaxed); }

private:
    std::atomic<std::uint64_t> mValue{0};
};

struct Counters {
    std::atomic<int> textures{0};
    std::atomic<int> samplers{0};
    std::atomic<int> frameBuffers{0};
    std::atomic<int> renderBuffers{0};
    std::atomic<int> pooledRenderBuffers{0};
    std::atomic<int> renderTargets{0};
    std::atomic<int> textureObjects{0};
    std::atomic<int> depthStencilBuffers{0};
    std::atomic<int> programs{0};
    std::atomic<int> variants{0};
    std::atomic<int> graphicsObjects{0};
    std::atomic<int> stateObjects{0};
    std::atomic<int> buffers{0};

    Counter drawRequests;
    Counter runs;
    Counter draws;
    Counter records;
    std::array<Counter, kRunEnds> runEnds;
    Counter flushes;
    Counter flushedRequests; // drawRequests at the last flush
    Counter listBytes;

    Counter frameBufferSwitches;
    Counter programSwitches;
    Counter uniformChanges;
    Counter textureSwitches;
    Counter blendChanges;
    Counter depthStencilChanges;
    Counter scissorChanges;
    Counter queries;

    Counter clears;
    Counter copies;
    Counter mipmapUpdates;
    Counter bytesUploaded;
    Counter vertexBytes;
    Counter bytesReadBack;
    // Atomic, because drivers may report errors on their own threads.
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
        result.variants = variants;
        result.graphicsObjects = graphicsObjects;
        result.stateObjects = stateObjects;
        result.buffers = buffers;
        result.drawRequests = drawRequests;
        result.runs = runs;
        result.draws = draws;
        result.records = records;
        std::copy(runEnds.begin(), runEnds.end(), result.runEnds.begin());
        result.flushes = flushes;
        result.listBytes = listBytes;
        result.frameBufferSwitches = frameBufferSwitches;
        result.programSwitches = programSwitches;
        result.uniformChanges = uniformChanges;
        result.textureSwitches = textureSwitches;
        result.blendChanges = blendChanges;
        result.depthStencilChanges = depthStencilChanges;
        result.scissorChanges = scissorChanges;
        result.queries = queries;
        result.clears = clears;
        result.copies = copies;
        result.mipmapUpdates = mipmapUpdates;
        result.bytesUploaded = bytesUploaded;
        result.vertexBytes = vertexBytes;
        result.bytesReadBack = bytesReadBack;
        result.errors = errors;
        return result;
    }
};

} // namespace Moka::detail
