#include "tests/support/ArrayMemory.h"

#include <atomic>
#include <cstdlib>
#include <new>

namespace {

std::atomic<std::size_t> liveBytes{0};
std::atomic<std::size_t> peakBytes{0};
thread_local int failing = 0;
constexpr std::size_t kPrefix = 16; // keeps the alignment

void* AllocateCounted(std::size_t size) {
    auto* const block = static_cast<unsigned char*>(std::malloc(size + kPrefix));
    if (!block) return nullptr;
    *reinterpret_cast<std::size_t*>(block) = size;
    std::size_t const live = liveBytes += size;
    std::size_t peak = peakBytes;
    while (live > peak && !peakBytes.compare_exchange_weak(peak, live)) {
    }
    return block + kPrefix;
}

void FreeCounted(void* memory) {
    if (!memory) return;
    auto* const block = static_cast<unsigned char*>(memory) - kPrefix;
    liveBytes -= *reinterpret_cast<std::size_t*>(block);
    std::free(block);
}

} // namespace

void* operator new[](std::size_t size) {
    void* const memory = AllocateCounted(size);
    if (!memory) throw std::bad_alloc();
    return memory;
}
void* operator new[](std::size_t size, std::nothrow_t const&) noexcept {
    return failing > 0 ? nullptr : AllocateCounted(size);
}
void operator delete[](void* memory) noexcept { FreeCounted(memory); }
void operator delete[](void* memory, std::size_t) noexcept { FreeCounted(memory); }
void operator delete[](void* memory, std::nothrow_t const&) noexcept { FreeCounted(memory); }

namespace Moka::Testing {

std::size_t ArrayMemory::GetLive() { return liveBytes; }
std::size_t ArrayMemory::GetPeak() { return peakBytes; }
void ArrayMemory::ResetPeak() { peakBytes = liveBytes.load(); }

NoArrayMemory::NoArrayMemory() { ++failing; }
NoArrayMemory::~NoArrayMemory() { --failing; }

} // namespace Moka::Testing
