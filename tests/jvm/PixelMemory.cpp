#include "tests/jvm/PixelMemory.h"

#include <cstdlib>
#include <new>

namespace {

thread_local int failing = 0;
thread_local int live = 0;

void* Allocate(std::size_t size) {
    void* const memory = std::malloc(size > 0 ? size : 1);
    if (memory) ++live;
    return memory;
}

void Free(void* memory) {
    if (memory) --live;
    std::free(memory);
}

} // namespace

void* operator new[](std::size_t size) {
    void* const memory = Allocate(size);
    if (!memory) throw std::bad_alloc();
    return memory;
}
void* operator new[](std::size_t size, std::nothrow_t const&) noexcept {
    return failing > 0 ? nullptr : Allocate(size);
}
void operator delete[](void* memory) noexcept { Free(memory); }
void operator delete[](void* memory, std::size_t) noexcept { Free(memory); }
void operator delete[](void* memory, std::nothrow_t const&) noexcept { Free(memory); }

namespace Moka::Testing {

NoPixelMemory::NoPixelMemory() { ++failing; }
NoPixelMemory::~NoPixelMemory() { --failing; }

int GetLiveArrays() { return live; }

} // namespace Moka::Testing
