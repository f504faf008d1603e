// The order of the virtual functions of interfaces that callers were built against.
#include "moka/graphics/task/WorkerTask.h"

#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IRendererDeviceCaps.h"

#include <cstdint>
#include <cstring>
#include <gtest/gtest.h>

namespace Moka {
namespace {

// Where a virtual function stands in its table: in the Itanium ABI a pointer to one holds its offset plus
// one.
template <class F>
std::size_t SlotOf(F function) {
    static_assert(sizeof(function) == 2 * sizeof(std::uintptr_t));
    std::uintptr_t words[2];
    std::memcpy(words, &function, sizeof words);
#if defined(__aarch64__)
    return words[0] / sizeof(void*);
#else
    return (words[0] - 1) / sizeof(void*);
#endif
}

TEST(VirtualOrder, CallersFindEachFunctionInItsSlot) {
    EXPECT_EQ(SlotOf(&IGLMsgQueue::Post), 2u);
    EXPECT_EQ(SlotOf(&IGLMsgQueue::WaitForTasks), 3u);
    EXPECT_EQ(SlotOf(&ITask::run), 2u);
    EXPECT_EQ(SlotOf(&ITask::isGlobalLockAllowed), 3u);
    EXPECT_EQ(SlotOf(&IRendererDeviceCaps::GetMaxTextureSize), 2u);
    using T = IRenderTarget;
    std::size_t const slots[] = {
        SlotOf(&T::Activate),           SlotOf(&T::Deactivate),
        SlotOf(&T::ReadPixels),         SlotOf(&T::Release),
        SlotOf(&T::ClearColor),         SlotOf(&T::AttachDepthStencil),
        SlotOf(&T::DetachDepthStencil), SlotOf(&T::ClearDepthStencil),
    };
    for (std::size_t i = 0; i < 8; ++i) EXPECT_EQ(slots[i], i);
}

} // namespace
} // namespace Moka
