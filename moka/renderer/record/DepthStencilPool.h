// DepthStencilPool: the device's depth-stencil buffers, kept by size when they are returned, because clips take
// and return one on every draw.
// Thread: render thread, within a request.
#pragma once

#include "moka/renderer/device/RunState.h"

#include <deque>

namespace Moka::detail {

class Recorder;

class DepthStencilPool {
public:
    explicit DepthStencilPool(Recorder& recorder) : mRecorder(recorder) {}

    // Any contents; 0 when the device has no memory.
    DeviceName Take(int width, int height);
    // If the pool is full, the oldest buffer is deleted, after a flush if the list may use it.
    void Return(DeviceName name, int width, int height);
    void Clear();

private:
    // Enough for a few canvases that clip in turn; each buffer of screen size holds some ten megabytes.
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
