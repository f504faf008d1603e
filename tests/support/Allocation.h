// Allocation.h: lets a test see how memory is taken and given back, and make it run out. A program that links
// moka_allocation allocates through it everywhere, in the libraries under test too.
#pragma once

#include <cstddef>

namespace Moka::Testing {

// Which of the thread's allocations fail while one exists: all, or array new that does not throw. Collect results
// in the scope and assert after it, since assertions allocate.
class FailAllocations {
public:
    FailAllocations() { ++sAll; }
    ~FailAllocations() { --sAll; }
    FailAllocations(FailAllocations const&) = delete;
    FailAllocations& operator=(FailAllocations const&) = delete;

    static thread_local int sAll;
};
class NoArrayMemory {
public:
    NoArrayMemory() { ++sArrays; }
    ~NoArrayMemory() { --sArrays; }
    NoArrayMemory(NoArrayMemory const&) = delete;
    NoArrayMemory& operator=(NoArrayMemory const&) = delete;

    static thread_local int sArrays;
};

// Bytes allocated by array new and not deleted, in the whole process: pixel buffers and little else.
class ArrayMemory {
public:
    static std::size_t GetLive();
    static std::size_t GetPeak();
    static void ResetPeak(); // to what is live
};

// The operator new calls of the calling thread so far.
int GetAllocationCount();

} // namespace Moka::Testing
