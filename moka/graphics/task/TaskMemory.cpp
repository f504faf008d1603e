#include "moka/graphics/task/TaskMemory.h"

#include <mutex>
#include <new>
#include <utility>

#if defined(__SANITIZE_ADDRESS__)
#define MOKA_TASK_POOL 0
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
#define MOKA_TASK_POOL 0
#endif
#endif
#ifndef MOKA_TASK_POOL
#define MOKA_TASK_POOL 1
#endif

namespace Moka::detail {
namespace {

constexpr std::align_val_t kAlignment{kTaskAlignment};

void* AllocateAligned(std::size_t size) noexcept { return operator new(size, kAlignment, std::nothrow); }
void FreeAligned(void* memory) noexcept { operator delete(memory, kAlignment); }

} // namespace

#if MOKA_TASK_POOL

namespace {

constexpr std::size_t kClassSizes[] = {64, 128, 192, 256, 384};
constexpr std::size_t kClassCount = sizeof kClassSizes / sizeof kClassSizes[0];
constexpr std::size_t kLargest = kClassSizes[kClassCount - 1];

// The size class for a number of cache lines.
constexpr std::size_t kClassOfLines[] = {0, 0, 1, 2, 3, 4, 4};
static_assert(sizeof kClassOfLines / sizeof kClassOfLines[0] == kLargest / kTaskAlignment + 1);

constexpr std::size_t ClassOf(std::size_t size) noexcept {
    return kClassOfLines[(size + kTaskAlignment - 1) / kTaskAlignment];
}

// The contents of a free block. The first block of a batch in a depot also links the batches.
struct FreeBlock {
    FreeBlock* next;
    FreeBlock* nextBatch;
    int count;
};

struct Batch {
    FreeBlock* first = nullptr;
    int count = 0;

    void Push(void* memory) noexcept {
        first = new (memory) FreeBlock{first, nullptr, 0};
        ++count;
    }
    void* Pop() noexcept {
        FreeBlock* const block = std::exchange(first, first->next);
        --count;
        // Another core wrote the next block last; prefetch it while the caller fills this one.
        __builtin_prefetch(first, 1);
        return block;
    }
};

// A unit of allocation: one cache line with this header, then kTaskBatch blocks.
struct alignas(kTaskAlignment) Chunk {
    Chunk* next;
};

// Holds batches of one size class that threads have returned, for other threads.
class alignas(kTaskAlignment) Depot {
public:
    constexpr Depot() noexcept = default;

    Batch Take(std::size_t blockSize) noexcept {
        {
            std::lock_guard<std::mutex> const lock(mMutex);
            if (FreeBlock* const first = mBatches) {
                mBatches = first->nextBatch;
                return {first, first->count};
            }
        }
        return MakeBatch(blockSize);
    }

    void Give(Batch batch) noexcept {
        if (batch.count == 0) return;
        batch.first->count = batch.count;
        std::lock_guard<std::mutex> const lock(mMutex);
        batch.first->nextBatch = std::exchange(mBatches, batch.first);
    }

    bool Owns(void const* memory, std::size_t blockSize) noexcept {
        auto const* const address = static_cast<char const*>(memory);
        std::lock_guard<std::mutex> const lock(mMutex);
        for (Chunk const* chunk = mChunks; chunk; chunk = chunk->next) {
            auto const* const blocks = reinterpret_cast<char const*>(chunk + 1);
            if (address >= blocks && address < blocks + kTaskBatch * blockSize) return true;
        }
        return false;
    }

private:
    Batch MakeBatch(std::size_t blockSize) noexcept {
        void* const memory = AllocateAligned(sizeof(Chunk) + kTaskBatch * blockSize);
        if (!memory) return {};
        auto* const chunk = new (memory) Chunk{nullptr};
        Batch batch;
        for (int i = kTaskBatch - 1; i >= 0; --i) {
            batch.Push(reinterpret_cast<char*>(chunk + 1) + static_cast<std::size_t>(i) * blockSize);
        }
        std::lock_guard<std::mutex> const lock(mMutex);
        chunk->next = std::exchange(mChunks, chunk);
        return batch;
    }

    std::mutex mMutex;
    FreeBlock* mBatches = nullptr;
    Chunk* mChunks = nullptr;
};

// A union, so that it is never destroyed: destructors of other static objects may still post and free tasks.
union Depots {
    constexpr Depots() noexcept : each() {}
    ~Depots() {}
    Depot each[kClassCount];
};
Depots theDepots;

// The free blocks of one thread. Two batches for each size class, so that a thread that allocates and frees
// in turn does not exchange a batch with the depot at every step.
enum class CacheState : unsigned char { Unused, Live, Gone };
struct ThreadCache {
    Batch current[kClassCount];
    Batch spare[kClassCount];
    CacheState state = CacheState::Unused;
};

// Separate from the reaper, so that the common path checks no initialisation, and so that the state of the
// cache can still be read after the reaper has run.
thread_local ThreadCache tCache;

struct Reaper {
    ~Reaper() {
        tCache.state = CacheState::Gone;
        for (std::size_t i = 0; i < kClassCount; ++i) {
            theDepots.each[i].Give(std::exchange(tCache.current[i], {}));
            theDepots.each[i].Give(std::exchange(tCache.spare[i], {}));
        }
    }
    void Arm() noexcept { tCache.state = CacheState::Live; }
};
thread_local Reaper tReaper;

// Returns true if the thread may keep free blocks.
bool HasCache(ThreadCache& cache) noexcept {
    if (cache.state == CacheState::Unused) tReaper.Arm();
    return cache.state == CacheState::Live;
}

void* AllocateFromDepot(std::size_t index) noexcept {
    Batch batch = theDepots.each[index].Take(kClassSizes[index]);
    if (batch.count == 0) return nullptr;
    void* const block = batch.Pop();
    theDepots.each[index].Give(batch);
    return block;
}

void* AllocateSlowly(ThreadCache& cache, std::size_t index) noexcept {
    if (!HasCache(cache)) return AllocateFromDepot(index);
    Batch& current = cache.current[index];
    current = std::exchange(cache.spare[index], {});
    if (current.count == 0) current = theDepots.each[index].Take(kClassSizes[index]);
    return current.count > 0 ? current.Pop() : nullptr;
}

void FreeSlowly(ThreadCache& cache, void* memory, std::size_t index) noexcept {
    Batch one;
    one.Push(memory);
    if (!HasCache(cache)) return theDepots.each[index].Give(one);
    Batch const full = std::exchange(cache.current[index], one);
    if (full.count > 0) theDepots.each[index].Give(std::exchange(cache.spare[index], full));
}

void FreeBlockOf(void* memory, std::size_t index) noexcept {
    ThreadCache& cache = tCache;
    Batch& current = cache.current[index];
    // The count is also 0 in a cache that is unused or gone.
    if (current.count > 0 && current.count < kTaskBatch) {
        current.Push(memory);
    } else {
        FreeSlowly(cache, memory, index);
    }
}

} // namespace

void* AllocateTask(std::size_t size) noexcept {
    if (size > kLargest) return AllocateAligned(size);
    std::size_t const index = ClassOf(size);
    ThreadCache& cache = tCache;
    Batch& current = cache.current[index];
    return current.count > 0 ? current.Pop() : AllocateSlowly(cache, index);
}

void FreeTask(void* memory, std::size_t size) noexcept {
    if (!memory) return;
    if (size > kLargest) {
        FreeAligned(memory);
    } else {
        FreeBlockOf(memory, ClassOf(size));
    }
}

void FreeTask(void* memory) noexcept {
    if (!memory) return;
    for (std::size_t index = 0; index < kClassCount; ++index) {
        if (theDepots.each[index].Owns(memory, kClassSizes[index])) return FreeBlockOf(memory, index);
    }
    FreeAligned(memory);
}

#else

void* AllocateTask(std::size_t size) noexcept { return AllocateAligned(size); }
void FreeTask(void* memory, std::size_t) noexcept { FreeAligned(memory); }
void FreeTask(void* memory) noexcept { FreeAligned(memory); }

#endif

} // namespace Moka::detail
