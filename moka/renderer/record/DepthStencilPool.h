// DepthStencilPool: keeps returned depth-stencil buffers for the next request of the same size, because a
// stencil clip takes and returns one on every draw.
// Thread: render thread, within a request.
#pragma once

#include "moka/renderer/device/RunState.h"

#include <deque>

namespace Moka::detail {

class Recorder;

class DepthStencilPool {
public:
    explicit DepthStencilPool(Recorder& recorder) : mRecorder(recorder) {}

    // The contents are undefined. Returns 0 if the device is out of memory.
    DeviceName Take(int width, int height);
    // If the pool is full, this deletes the oldest buffer, and flushes first if the list may use it.
    void Return(DeviceName name, int width, int height);
    void Clear();

private:
    // Enough for a few canvases that clip in turn. A buffer of screen size takes about 10 MB.
    static constexpr std::size_t kMaxWaiting = 4;

    struct Entry {
        DeviceName name;
        int width;
        int height;
    };

    void DeleteOldest();

    Recorder& mRecorder;
    std::deque<Entry> mWaiting; // oldest first
};

} // namespace Moka::detail
