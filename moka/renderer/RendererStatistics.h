// RendererStatistics: what the renderer holds and what it has done since the context was attached.
// Objects are live ones, by kind; a test that ends with any of them but the pooled ones above zero has
// found a leak.
#pragma once

#include <cstdint>

namespace Moka {

struct RendererStatistics {
    int textures = 0; // storages, not views
    int samplers = 0;
    int frameBuffers = 0;  // made by us
    int renderBuffers = 0; // in use; pooled ones are counted apart
    int pooledRenderBuffers = 0;
    int renderTargets = 0; // objects of our interfaces
    int textureObjects = 0;
    int depthStencilBuffers = 0;
    int programs = 0;

    std::uint64_t frameBufferSwitches = 0;
    std::uint64_t clears = 0;
    std::uint64_t copies = 0;
    std::uint64_t bytesUploaded = 0;
    std::uint64_t bytesReadBack = 0;
    std::uint64_t errors = 0; // GL errors and error-severity debug messages
};

} // namespace Moka
