// GlStatistics: the counters behind RendererStatistics, one set a context.
// Thread: any. The render thread writes most of them; objects that are dropped elsewhere write theirs there.
#pragma once

#include "moka/renderer/RendererStatistics.h"

#include <atomic>

namespace Moka::detail {

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

    std::atomic<std::uint64_t> frameBufferSwitches{0};
    std::atomic<std::uint64_t> clears{0};
    std::atomic<std::uint64_t> copies{0};
    std::atomic<std::uint64_t> bytesUploaded{0};
    std::atomic<std::uint64_t> bytesReadBack{0};
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
