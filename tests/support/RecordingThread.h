// RecordingThread: a render thread without GL: a real queue whose thread drives the recording renderer, which
// keeps no records.
#pragma once

#include "moka/host/TaskQueue.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/RecordingRenderer.h"

#include <future>
#include <thread>

namespace Moka::Testing {

class RecordingThread final : public TaskQueue {
public:
    explicit RecordingThread(int maxTextureSize) {
        RecordingRenderer::Reset();
        RecordingRenderer::KeepRecords(false);
        RecordingRenderer::SetMaxTextureSize(maxTextureSize);
        std::promise<void> attached;
        mThread = std::thread([&] {
            RendererFactory::AttachContext();
            attached.set_value();
            Run([] {});
            RendererFactory::DetachContext();
        });
        attached.get_future().wait();
    }
    ~RecordingThread() override {
        RequestStop();
        mThread.join();
    }

private:
    std::thread mThread;
};

} // namespace Moka::Testing
