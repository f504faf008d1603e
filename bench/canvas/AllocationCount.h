// AllocationCount.h: how often the calling thread has asked operator new for memory. What C libraries and the
// driver take from malloc does not count.
#pragma once

#include <cstdint>

namespace Moka::Bench {

std::uint64_t CountAllocations();

} // namespace Moka::Bench
