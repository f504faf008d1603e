#include "tests/unit/base/Allocation.h"

#include <atomic>
#include <cstdlib>
#include <new>

namespace {

thread_local int failing = 0;
thread_local int allocations = 0;
std::atomic<void const*> watched{nullptr};
std::atomic<int> arrayDeletes{0};
std::atomic<int> plainDeletes{0};

void* AllocateOrNull(std::size_t size) noexcept {
    ++allocations;
    return failing > 0 ? nullptr : std::malloc(size > 0 ? size : 1);
}

void* Allocate(std::size_t size) {
    if (void* const block = AllocateOrNull(size)) return block;
    throw std::bad_alloc();
}

void Free(void* block, std::atomic<int>& deletes) noexcept {
    if (block && block == watched) ++deletes;
    std::free(block);
}

} // namespace

void* operator new(std::size_t size) { return Allocate(size); }
void* operator new[](std::size_t size) { return Allocate(size); }
void* operator new(std::size_t size, std::nothrow_t const&) noexcept { return AllocateOrNull(size); }
void* operator new[](std::size_t size, std::nothrow_t const&) noexcept { return AllocateOrNull(size); }
void operator delete(void* block) noexcept { Free(block, plainDeletes); }
void operator delete[](void* block) noexcept { Free(block, arrayDeletes); }
void operator delete(void* block, std::size_t) noexcept { Free(block, plainDeletes); }
void operator delete[](void* block, std::size_t) noexcept { Free(block, arrayDeletes); }
void operator delete(void* block, std::nothrow_t const&) noexcept { Free(block, plainDeletes); }
void operator delete[](void* block, std::nothrow_t const&) noexcept { Free(block, arrayDeletes); }

namespace Moka::Testing {

FailAllocations::FailAllocations() { ++failing; }
FailAllocations::~FailAllocations() { --failing; }

DeleteWatch::DeleteWatch(void const* block) {
    arrayDeletes = 0;
    plainDeletes = 0;
    watched = block;
}
DeleteWatch::~DeleteWatch() { watched = nullptr; }
int DeleteWatch::GetArrayDeletes() const { return arrayDeletes; }
int DeleteWatch::GetPlainDeletes() const { return plainDeletes; }

int GetAllocationCount() { return allocations; }

} // namespace Moka::Testing
