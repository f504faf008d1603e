#include "tests/support/RecordingThread.h"
#include "tests/trust/MixedWork.h"
#include "tests/trust/Soak.h"

namespace Moka::Testing {

std::unique_ptr<IGLMsgQueue> StartRenderThread() {
    return std::make_unique<RecordingThread>(MixedWork::kSide);
}

int CountRendererObjects() { return RecordingRenderer::CountLiveObjects(); }

} // namespace Moka::Testing
