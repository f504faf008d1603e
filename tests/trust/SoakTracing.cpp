#include "tests/support/TracingThread.h"
#include "tests/trust/MixedWork.h"
#include "tests/trust/Soak.h"

namespace Moka::Testing {

std::unique_ptr<IGLMsgQueue> StartRenderThread() { return std::make_unique<TracingThread>(MixedWork::kSide); }

int CountRendererObjects() { return RendererTrace::CountLiveObjects(); }

} // namespace Moka::Testing
