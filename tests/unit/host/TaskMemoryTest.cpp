#include "moka/graphics/task/TaskMemory.h"

#include "moka/graphics/task/ITask.h"
#include "tests/support/Awaited.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <set>
#include <thread>
#include <utility>
#include <vector>

namespace Moka::Testing {
namespace {

using detail::AllocateTask;
using detail::FreeTask;

constexpr std::size_t kSizes[] = {1, 16, 64, 65, 128, 129, 192, 193, 256, 257, 384, 385, 4096};

TEST(TaskMemoryTest, GivesBlocksOfTheirOwnOnCacheLinesOfTheirOwn) {
    std::vector<std::pair<unsigned char*, std::size_t>> blocks; // each filled with its number
    for (int i = 0; i < 100; ++i) {
        for (std::size_t const size : kSizes) {
            auto* const memory = static_cast<unsigned char*>(AllocateTask(size));
            ASSERT_NE(memory, nullptr);
            ASSERT_EQ(reinterpret_cast<std::uintptr_t>(memory) % detail::kTaskAlignment, 0u);
            std::memset(memory, static_cast<unsigned char>(blocks.size()), size);
            blocks.emplace_back(memory, size);
        }
    }
    unsigned char number = 0;
    for (auto const& [memory, size] : blocks)
        ASSERT_EQ(std::count(memory, memory + size, number++), static_cast<std::ptrdiff_t>(size));
    for (auto const& [memory, size] : blocks) FreeTask(memory, size);
    FreeTask(nullptr, 64);
    FreeTask(nullptr);
}

#if !defined(__SANITIZE_ADDRESS__)
TEST(TaskMemoryTest, AThreadThatEndsLeavesItsBlocksToOthers) {
    constexpr std::size_t kSize = 200;
    std::set<void*> seen;
    std::size_t largest = 0;
    for (int round = 0; round < 100; ++round) {
        std::thread([&] {
            std::vector<void*> blocks;
            for (int i = 0; i < 70; ++i) blocks.push_back(AllocateTask(kSize));
            for (void* const block : blocks) FreeTask(block, kSize);
            seen.insert(blocks.begin(), blocks.end());
        }).join();
        if (round == 0) largest = seen.size() + 2 * detail::kTaskBatch;
    }
    EXPECT_LE(seen.size(), largest);
}

// As from a caller to the render thread, which lives on.
TEST(TaskMemoryTest, AOneWayStreamReusesItsBlocks) {
    constexpr std::size_t kSize = 100;
    constexpr int kRounds = 50;
    std::set<void*> seen;
    std::vector<void*> blocks;
    Awaited<int> turn; // odd: the other thread's
    std::thread consumer([&] {
        for (int round = 0; round < kRounds; ++round) {
            turn.AwaitAtLeast(2 * round + 1);
            for (void* const block : blocks) FreeTask(block, kSize);
            ++turn;
        }
    });
    for (int round = 0; round < kRounds; ++round) {
        blocks.clear();
        for (int i = 0; i < 100; ++i) blocks.push_back(AllocateTask(kSize));
        seen.insert(blocks.begin(), blocks.end());
        ++turn;
        turn.AwaitAtLeast(2 * round + 2);
    }
    consumer.join();
    EXPECT_LE(seen.size(), 300u);
}
#endif

} // namespace
} // namespace Moka::Testing
