#include "moka/host/RenderThread.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/trust/MixedWork.h"
#include "tests/trust/Soak.h"

#include <cstdio>

namespace Moka::Testing {

std::unique_ptr<IGLMsgQueue> StartRenderThread() {
    RenderThreadOptions options;
    options.limits.maxTextureSize = MixedWork::kSide;
    options.debugContext = true;
    options.surfaceWidth = MixedWork::kSide; // the screen bitmaps need a default frame buffer
    options.surfaceHeight = MixedWork::kSide;
    std::string error;
    auto thread = RenderThread::Start(options, &error);
    if (!thread) std::fprintf(stderr, "no render thread: %s\n", error.c_str());
    return thread;
}

// What the driver reported counts too: none of it may come.
int CountRendererObjects() {
    RendererStatistics const s = RendererFactory::GetStatistics();
    return s.textures + s.samplers + s.frameBuffers + s.renderBuffers + s.pooledRenderBuffers +
           s.renderTargets + s.textureObjects + s.depthStencilBuffers + s.programs + s.graphicsObjects +
           s.stateObjects + s.buffers + static_cast<int>(s.errors);
}

} // namespace Moka::Testing
