// Allocation.h: lets a test see how memory is taken and given back, and make it run out. A program that links
// moka_allocation allocates through it everywhere, in the libraries under test too.
#pragma once

#include <cstddef>
#include <cstdint>

namespace Moka::Testing {

// How many of a kind of scope the thread is in.
template <class Kind>
class CountedScope {
public:
    CountedScope() { ++sCount; }
    ~CountedScope() { --sCount; }
    CountedScope(CountedScope const&) = delete;
    CountedScope& operator=(CountedScope const&) = delete;

    static inline thread_local int sCount = 0;
};

// Which of the thread's allocations fail while one exists: all, or array new that does not throw. Collect results
// in the scope and assert after it, since assertions allocate.
struct FailAllocations : CountedScope<FailAllocations> {};
struct NoArrayMemory : CountedScope<NoArrayMemory> {};

// Makes the k-th allocation of a kind in the process fail, and knows how many are still alive. Which one is the k-th
// is only certain while one thread allocates.
class Faults {
public:
    // What operator new(nothrow) gives; what operator new gives or throws for, of which nobody counts the living; the
    // memory of tasks, where the program wraps the functions of TaskMemory.h (tests/trust/TaskFaults.cpp).
    enum class Kind { Objects, Throwing, Tasks };

    // From now on: counts the allocations of a kind, and fails the k-th of them (0 fails none), or all from the k-th
    // on.
    static void Arm(Kind kind, int k, bool all);
    // How many of the kind there were since, failed ones included.
    static int Disarm();
    // For an allocation of the kind that comes now.
    static bool Fails(Kind kind);

    // While one lives, those of its thread's allocations that throw neither fail nor count.
    struct Pause : CountedScope<Pause> {};

    // Not yet freed.
    static std::int64_t CountLive(Kind kind);
    static void AddLive(Kind kind, int count);
    // From now on a leak checker takes what operator new(nothrow) gives for used: it may leak as docs/ownership.md
    // lists.
    static void AcceptLeaks();
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
