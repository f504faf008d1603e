#include "apps/notebook/AllocationCount.h"

#include "moka/base/Export.h"

#include <cstdlib>
#include <new>

namespace {

thread_local std::uint64_t tAllocations = 0;

} // namespace

namespace Moka {

std::uint64_t CountAllocations() { return tAllocations; }

} // namespace Moka

// The other forms of operator new call this one.
MOKA_API void* operator new(std::size_t size) {
    ++tAllocations;
    if (void* const memory = std::malloc(size > 0 ? size : 1)) return memory;
    throw std::bad_alloc();
}

MOKA_API void operator delete(void* memory) noexcept { std::free(memory); }
MOKA_API void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }
