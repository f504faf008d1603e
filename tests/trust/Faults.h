// Faults: makes the k-th non-throwing allocation of the process fail, and knows how many are still alive. The
// program that links Faults.cpp allocates through it everywhere, in the libraries under test too: through
// the global operator new, and for tasks through the two functions of TaskMemory.h, which have to be wrapped
// when it is linked. Allocations that throw, those of containers, are a kind of their own.
// Thread: any; which allocation is the k-th is only certain while one thread allocates.
#pragma once

#include <cstdint>

namespace Moka::Testing {

class Faults {
public:
    // What operator new(nothrow) gives; the memory of tasks; what operator new gives or throws for, of which
    // nobody knows how many are alive.
    enum class Kind { Objects, Tasks, Throwing };

    // From now on: counts the allocations of a kind, and fails the k-th of them (0 fails none), or all from
    // the k-th on.
    static void Arm(Kind kind, int k, bool all);
    // How many of the kind there were since, failed ones included.
    static int Disarm();

    // While it lives, those of its thread's allocations that throw neither fail nor count.
    class Pause {
    public:
        Pause();
        ~Pause();
        Pause(Pause const&) = delete;
        Pause& operator=(Pause const&) = delete;
    };

    // Not yet freed.
    static std::int64_t CountLive(Kind kind);
    // Blocks given back that had not been given out, or twice.
    static int CountWrongFrees();
};

} // namespace Moka::Testing
