// Soak.h: what the two soak programs differ in: the render thread they work on.
#pragma once

#include "moka/graphics/task/IGLMsgQueue.h"

#include <memory>

namespace Moka::Testing {

// Null, after a line on stderr, when there is none to be had.
std::unique_ptr<IGLMsgQueue> StartRenderThread();

// Alive on the render thread, once its queue is idle.
int CountRendererObjects();

} // namespace Moka::Testing
