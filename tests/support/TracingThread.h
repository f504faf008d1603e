// TracingThread: a render thread without GL: a real queue whose thread drives the tracing renderer, which
// keeps no records.
#pragma once

#include "moka/host/TaskQueue.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/RendererTrace.h"

#include <future>
#include <thread>

namespace Moka::Testing {

class TracingThread final : public TaskQueue {
public:
    explicit TracingThread(int maxTextureSize) {
        RendererTrace::Reset();
        RendererTrace::KeepRecords(false);
        RendererTrace::SetMaxTextureSize(maxTextureSize);
        std::promise<void> attached;
        mThread = std::thread([&] {
            RendererFactory::AttachContext();
            attached.set_value();
            Run([] {});
            RendererFactory::DetachContext();
        });
        attached.get_future().wait();
    }
    ~TracingThread() override {
        RequestStop();
        mThread.join();
    }

private:
    std::thread mThread;
};

} // namespace Moka::Testing
