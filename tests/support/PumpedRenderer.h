// PumpedRenderer: a hand-pumped queue whose render thread, while tasks run, is the thread that pumps it. In between
// that thread is a caller's, so that a call of the renderer that should have been a task is a violation.
#pragma once

#include "moka/renderer/RendererFactory.h"
#include "tests/support/Queues.h"
#include "tests/support/RendererTrace.h"

namespace Moka::Testing {

class PumpedRenderer : public HandPumpedQueue {
public:
    explicit PumpedRenderer(int maxTextureSize, Predicate refuses = {})
        : HandPumpedQueue(std::move(refuses)) {
        RendererTrace::Reset();
        RendererTrace::SetMaxTextureSize(maxTextureSize);
        RendererFactory::AttachContext();
        RendererTrace::DeclareNoRenderThread();
    }
    ~PumpedRenderer() override {
        RendererTrace::DeclareRenderThread();
        RendererFactory::DetachContext();
    }

protected:
    void BeforeRun() override { RendererTrace::DeclareRenderThread(); }
    void AfterRun() override { RendererTrace::DeclareNoRenderThread(); }
};

} // namespace Moka::Testing
