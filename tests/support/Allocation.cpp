#include "tests/support/Allocation.h"

#include <atomic>
#include <cstdlib>
#include <new>

// The leak checker's, where it is there.
extern "C" __attribute__((weak)) void __lsan_ignore_object(void const* block);

namespace Moka::Testing {
namespace {

thread_local int allocations = 0;
std::atomic<std::size_t> liveBytes{0};
std::atomic<std::size_t> peakBytes{0};
std::atomic<bool> mayLeak{false};

struct KindOfAllocation {
    std::atomic<bool> isArmed{false};
    std::atomic<int> count{0};
    std::atomic<std::int64_t> live{0};
    int first = 0;
    bool all = false;
};
KindOfAllocation theKinds[3];

KindOfAllocation& Get(Faults::Kind kind) { return theKinds[static_cast<int>(kind)]; }

// Ahead of each block; keeps the alignment.
struct alignas(std::max_align_t) Header {
    std::size_t arrayBytes; // 0 where it is no array
    bool isCounted;
};

void CountArray(std::size_t size) {
    std::size_t const live = liveBytes += size;
    std::size_t peak = peakBytes;
    while (live > peak && !peakBytes.compare_exchange_weak(peak, live)) {
    }
}

void* Allocate(std::size_t size, bool isArray, bool throws) {
    ++allocations;
    bool const fails = FailAllocations::sCount > 0 || (isArray && !throws && NoArrayMemory::sCount > 0) ||
                       (throws ? Faults::Pause::sCount == 0 && Faults::Fails(Faults::Kind::Throwing)
                               : Faults::Fails(Faults::Kind::Objects));
    void* const memory = fails ? nullptr : std::malloc(sizeof(Header) + size);
    if (!memory && throws) throw std::bad_alloc();
    if (!memory) return nullptr;
    if (isArray) CountArray(size);
    if (!throws) Faults::AddLive(Faults::Kind::Objects, 1);
    if (!throws && mayLeak && __lsan_ignore_object) __lsan_ignore_object(memory);
    return new (memory) Header{isArray ? size : 0, !throws} + 1;
}

void Free(void* memory) noexcept {
    if (!memory) return;
    Header* const header = static_cast<Header*>(memory) - 1;
    liveBytes -= header->arrayBytes;
    if (header->isCounted) Faults::AddLive(Faults::Kind::Objects, -1);
    std::free(header);
}

} // namespace

void Faults::Arm(Kind kind, int k, bool all) {
    KindOfAllocation& armed = Get(kind);
    armed.first = k;
    armed.all = all;
    armed.count = 0;
    armed.isArmed = true;
}

int Faults::Disarm() {
    int count = 0;
    for (KindOfAllocation& kind : theKinds)
        if (kind.isArmed.exchange(false)) count = kind.count;
    return count;
}

bool Faults::Fails(Kind kind) {
    KindOfAllocation& armed = Get(kind);
    if (!armed.isArmed) return false;
    int const ordinal = ++armed.count;
    return armed.first > 0 && (ordinal == armed.first || (armed.all && ordinal > armed.first));
}

std::int64_t Faults::CountLive(Kind kind) { return Get(kind).live; }
void Faults::AddLive(Kind kind, int count) { Get(kind).live += count; }
void Faults::AcceptLeaks() { mayLeak = true; }

std::size_t ArrayMemory::GetLive() { return liveBytes; }
std::size_t ArrayMemory::GetPeak() { return peakBytes; }
void ArrayMemory::ResetPeak() { peakBytes = liveBytes.load(); }

int GetAllocationCount() { return allocations; }

} // namespace Moka::Testing

using Moka::Testing::Allocate;
using Moka::Testing::Free;

void* operator new(std::size_t size) { return Allocate(size, false, true); }
void* operator new[](std::size_t size) { return Allocate(size, true, true); }
void* operator new(std::size_t size, std::nothrow_t const&) noexcept { return Allocate(size, false, false); }
void* operator new[](std::size_t size, std::nothrow_t const&) noexcept { return Allocate(size, true, false); }
void operator delete(void* block) noexcept { Free(block); }
void operator delete[](void* block) noexcept { Free(block); }
void operator delete(void* block, std::size_t) noexcept { Free(block); }
void operator delete[](void* block, std::size_t) noexcept { Free(block); }
void operator delete(void* block, std::nothrow_t const&) noexcept { Free(block); }
void operator delete[](void* block, std::nothrow_t const&) noexcept { Free(block); }
