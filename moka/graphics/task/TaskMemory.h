// TaskMemory: the memory that tasks live in. Blocks of a few fixed sizes, kept in free lists of the thread at
// hand and exchanged between threads in batches, because a task is allocated on one thread and freed on
// another, which costs two to three times the whole post when malloc does it.
// Thread:  any, also while a thread or the process is being torn down.
// Units:   bytes. Every block starts on a cache line of its own.
// Cost:    one lock for each kTaskBatch blocks that a thread takes or gives. Memory is kept for reuse until
//          the process ends: it is bounded by the most tasks ever queued and a few batches for each thread.
// Fails:   null when memory runs out.
// Under the address sanitizer every block is allocated by itself, so that the use of a freed task is found.
#pragma once

#include <cstddef>

namespace Moka::detail {

constexpr std::size_t kTaskAlignment = 64;
constexpr int kTaskBatch = 32;

void* AllocateTask(std::size_t size) noexcept;
// size is the one the block was allocated with. Null is ignored.
void FreeTask(void* memory, std::size_t size) noexcept;
// For whoever does not know the size. Slow: it looks for the block among all there are.
void FreeTask(void* memory) noexcept;

} // namespace Moka::detail
