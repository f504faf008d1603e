// CodecGate: stops the image codecs, so that a test can act while a file is being decoded or encoded. The
// program that links CodecGate.cpp calls every codec through it.
#pragma once

#include <atomic>

namespace Moka::Testing {

// While one exists, every decode and encode waits at the gate until it opens. One at a time, on one thread.
class CodecGate {
public:
    CodecGate();
    ~CodecGate(); // opens
    CodecGate(CodecGate const&) = delete;
    CodecGate& operator=(CodecGate const&) = delete;

    // Until a codec has come to the gate.
    static void AwaitArrival();
    void Open();

private:
    bool mIsClosed = true;
};

// While it is true, every decode and encode throws std::bad_alloc.
extern std::atomic<bool> codecsThrow;

} // namespace Moka::Testing
