// AllocationCount.h: counts the calls of operator new on the calling thread. Allocations by malloc in C
// libraries and in the driver do not count.
#pragma once

#include <cstdint>

namespace Moka::Bench {

std::uint64_t CountAllocations();

} // namespace Moka::Bench
