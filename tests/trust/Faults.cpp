#include "tests/trust/Faults.h"

#include <atomic>
#include <cstddef>
#include <cstdlib>
#include <mutex>
#include <new>
#include <unordered_set>

namespace Moka::Testing {
namespace {

thread_local int tPauses = 0;

struct Sweep {
    std::atomic<bool> isArmed{false};
    std::atomic<int> count{0};
    int first = 0;
    bool all = false;

    bool Fails() {
        if (!isArmed) return false;
        int const ordinal = ++count;
        return first > 0 && (ordinal == first || (all && ordinal > first));
    }
};

Sweep theSweeps[3];

Sweep& SweepOf(Faults::Kind kind) { return theSweeps[static_cast<int>(kind)]; }

// Ahead of each block of operator new. Those that are counted are in a list, so that a leak checker finds
// the leaks that docs/ownership.md lists. Keeps the alignment.
struct alignas(std::max_align_t) Header {
    bool isCounted;
    Header* previous;
    Header* next;
};

class ObjectList {
public:
    void Add(Header* header) {
        std::lock_guard<std::mutex> const lock(mMutex);
        header->next = mFirst;
        if (mFirst) mFirst->previous = header;
        mFirst = header;
        ++mCount;
    }
    void Remove(Header* header) {
        std::lock_guard<std::mutex> const lock(mMutex);
        if (header->next) header->next->previous = header->previous;
        (header->previous ? header->previous->next : mFirst) = header->next;
        --mCount;
    }
    std::int64_t GetCount() {
        std::lock_guard<std::mutex> const lock(mMutex);
        return mCount;
    }

private:
    std::mutex mMutex;
    Header* mFirst = nullptr;
    std::int64_t mCount = 0;
};

// Constant-initialised and never destroyed: memory is used before main and after it.
union Objects {
    constexpr Objects() noexcept : list() {}
    ~Objects() {}
    ObjectList list;
};
Objects theObjects;

void* Allocate(std::size_t size, bool isCounted) noexcept {
    if (isCounted && SweepOf(Faults::Kind::Objects).Fails()) return nullptr;
    void* const memory = std::malloc(sizeof(Header) + size);
    if (!memory) return nullptr;
    auto* const header = new (memory) Header{isCounted, nullptr, nullptr};
    if (isCounted) theObjects.list.Add(header);
    return header + 1;
}

void* AllocateOrThrow(std::size_t size) {
    bool const fails = tPauses == 0 && SweepOf(Faults::Kind::Throwing).Fails();
    void* const memory = fails ? nullptr : Allocate(size, false);
    if (!memory) throw std::bad_alloc();
    return memory;
}

void Free(void* memory) noexcept {
    if (!memory) return;
    Header* const header = static_cast<Header*>(memory) - 1;
    if (header->isCounted) theObjects.list.Remove(header);
    std::free(header);
}

// The tasks alive, by address.
class TaskBlocks {
public:
    void Add(void* block) {
        Faults::Pause const pause;
        std::lock_guard<std::mutex> const lock(mMutex);
        if (block) mBlocks.insert(block);
    }
    void Remove(void* block) {
        std::lock_guard<std::mutex> const lock(mMutex);
        if (block && mBlocks.erase(block) == 0) ++mWrong;
    }
    std::size_t GetCount() {
        std::lock_guard<std::mutex> const lock(mMutex);
        return mBlocks.size();
    }
    int GetWrong() {
        std::lock_guard<std::mutex> const lock(mMutex);
        return mWrong;
    }
    // Never destroyed, since tasks are freed while the process ends.
    static TaskBlocks& Get() {
        static auto* const blocks = new TaskBlocks;
        return *blocks;
    }

private:
    std::mutex mMutex;
    std::unordered_set<void*> mBlocks;
    int mWrong = 0;
};

} // namespace

void Faults::Arm(Kind kind, int k, bool all) {
    Sweep& sweep = SweepOf(kind);
    sweep.first = k;
    sweep.all = all;
    sweep.count = 0;
    sweep.isArmed = true;
}

int Faults::Disarm() {
    int count = 0;
    for (Sweep& sweep : theSweeps)
        if (sweep.isArmed.exchange(false)) count = sweep.count;
    return count;
}

Faults::Pause::Pause() { ++tPauses; }
Faults::Pause::~Pause() { --tPauses; }

std::int64_t Faults::CountLive(Kind kind) {
    return kind == Kind::Objects ? theObjects.list.GetCount()
                                 : static_cast<std::int64_t>(TaskBlocks::Get().GetCount());
}

int Faults::CountWrongFrees() { return TaskBlocks::Get().GetWrong(); }

} // namespace Moka::Testing

using Moka::Testing::Allocate;
using Moka::Testing::AllocateOrThrow;
using Moka::Testing::Free;

void* operator new(std::size_t size) { return AllocateOrThrow(size); }
void* operator new[](std::size_t size) { return AllocateOrThrow(size); }
void* operator new(std::size_t size, std::nothrow_t const&) noexcept { return Allocate(size, true); }
void* operator new[](std::size_t size, std::nothrow_t const&) noexcept { return Allocate(size, true); }
void operator delete(void* memory) noexcept { Free(memory); }
void operator delete[](void* memory) noexcept { Free(memory); }
void operator delete(void* memory, std::size_t) noexcept { Free(memory); }
void operator delete[](void* memory, std::size_t) noexcept { Free(memory); }
void operator delete(void* memory, std::nothrow_t const&) noexcept { Free(memory); }
void operator delete[](void* memory, std::nothrow_t const&) noexcept { Free(memory); }

// The linker's names for the wrapped functions and the real ones.
extern "C" {
void* __real__ZN4Moka6detail12AllocateTaskEm(std::size_t size);
void __real__ZN4Moka6detail8FreeTaskEPvm(void* memory, std::size_t size);
void __real__ZN4Moka6detail8FreeTaskEPv(void* memory);

void* __wrap__ZN4Moka6detail12AllocateTaskEm(std::size_t size) {
    using Moka::Testing::Faults;
    if (Moka::Testing::SweepOf(Faults::Kind::Tasks).Fails()) return nullptr;
    void* const block = __real__ZN4Moka6detail12AllocateTaskEm(size);
    Moka::Testing::TaskBlocks::Get().Add(block);
    return block;
}
void __wrap__ZN4Moka6detail8FreeTaskEPvm(void* memory, std::size_t size) {
    Moka::Testing::TaskBlocks::Get().Remove(memory);
    __real__ZN4Moka6detail8FreeTaskEPvm(memory, size);
}
void __wrap__ZN4Moka6detail8FreeTaskEPv(void* memory) {
    Moka::Testing::TaskBlocks::Get().Remove(memory);
    __real__ZN4Moka6detail8FreeTaskEPv(memory);
}
}
