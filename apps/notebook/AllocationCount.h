// AllocationCount.h: counts the calls of operator new on the calling thread. Allocations by malloc in C
// libraries and in the driver do not count. A program that contains AllocationCount.cpp replaces operator new for all C++
// code of its process: the library, the application and the driver.
#pragma once

#include <cstdint>

namespace Moka {

std::uint64_t CountAllocations();

} // namespace Moka
