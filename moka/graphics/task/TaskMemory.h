// TaskMemory: the memory pool of tasks. Blocks have a few fixed sizes. Each thread has free lists, and
// threads exchange blocks in batches. A task is allocated on one thread and freed on another; with malloc
// that costs two to three times as much as the rest of the post.
// Thread:  any, also at the exit of a thread or the process.
// Units:   bytes. Every block starts on its own cache line.
// Cost:    one lock for each kTaskBatch blocks that a thread takes or returns. Memory is kept until the
//          process ends. It is bounded by the largest number of tasks ever queued, plus a few batches for
//          each thread.
// Fails:   returns null if memory runs out.
// Under the address sanitizer every block is allocated separately, so that it detects the use of a freed
// task.
#pragma once

#include <cstddef>

namespace Moka::detail {

constexpr std::size_t kTaskAlignment = 64;
constexpr int kTaskBatch = 32;

void* AllocateTask(std::size_t size) noexcept;
// size must be that of the allocation. Null is ignored.
void FreeTask(void* memory, std::size_t size) noexcept;
// Frees a block of unknown size. Slow: it searches all chunks.
void FreeTask(void* memory) noexcept;

} // namespace Moka::detail
