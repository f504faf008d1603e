#include "tests/support/Allocation.h"

#include <atomic>
#include <cstdlib>
#include <new>

namespace {

using Moka::Testing::FailAllocations;
using Moka::Testing::NoArrayMemory;

thread_local int allocations = 0;
std::atomic<std::size_t> liveBytes{0};
std::atomic<std::size_t> peakBytes{0};
constexpr std::size_t kPrefix = 16; // for the size of an array; keeps the alignment

void* Allocate(std::size_t size) noexcept {
    ++allocations;
    return FailAllocations::sAll > 0 ? nullptr : std::malloc(size + kPrefix);
}

void* AllocateArray(std::size_t size) noexcept {
    auto* const block = static_cast<unsigned char*>(Allocate(size));
    if (!block) return nullptr;
    *reinterpret_cast<std::size_t*>(block) = size;
    std::size_t const live = liveBytes += size;
    std::size_t peak = peakBytes;
    while (live > peak && !peakBytes.compare_exchange_weak(peak, live)) {
    }
    return block + kPrefix;
}

void* OrThrow(void* block) {
    if (!block) throw std::bad_alloc();
    return block;
}

void FreeArray(void* memory) noexcept {
    if (!memory) return;
    auto* const block = static_cast<unsigned char*>(memory) - kPrefix;
    liveBytes -= *reinterpret_cast<std::size_t*>(block);
    std::free(block);
}

} // namespace

void* operator new(std::size_t size) { return OrThrow(Allocate(size)); }
void* operator new[](std::size_t size) { return OrThrow(AllocateArray(size)); }
void* operator new(std::size_t size, std::nothrow_t const&) noexcept { return Allocate(size); }
void* operator new[](std::size_t size, std::nothrow_t const&) noexcept {
    return NoArrayMemory::sArrays > 0 ? nullptr : AllocateArray(size);
}
void operator delete(void* block) noexcept { std::free(block); }
void operator delete[](void* block) noexcept { FreeArray(block); }
void operator delete(void* block, std::size_t) noexcept { std::free(block); }
void operator delete[](void* block, std::size_t) noexcept { FreeArray(block); }
void operator delete(void* block, std::nothrow_t const&) noexcept { std::free(block); }
void operator delete[](void* block, std::nothrow_t const&) noexcept { FreeArray(block); }

namespace Moka::Testing {

thread_local int FailAllocations::sAll = 0;
thread_local int NoArrayMemory::sArrays = 0;

std::size_t ArrayMemory::GetLive() { return liveBytes; }
std::size_t ArrayMemory::GetPeak() { return peakBytes; }
void ArrayMemory::ResetPeak() { peakBytes = liveBytes.load(); }

int GetAllocationCount() { return allocations; }

} // namespace Moka::Testing
