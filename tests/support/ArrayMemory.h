// ArrayMemory: bytes allocated by array new and not deleted, in the whole process: pixel buffers and little
// else.
// Linking it replaces array new and delete, so it is a library of its own, for the tests that ask.
// Thread: any.
#pragma once

#include <cstddef>

namespace Moka::Testing {

class ArrayMemory {
public:
    static std::size_t GetLive();
    static std::size_t GetPeak();
    static void ResetPeak(); // to what is live
};

// While one lives, a non-throwing array new fails on its thread.
class NoArrayMemory {
public:
    NoArrayMemory();
    ~NoArrayMemory();
    NoArrayMemory(NoArrayMemory const&) = delete;
    NoArrayMemory& operator=(NoArrayMemory const&) = delete;
};

} // namespace Moka::Testing
