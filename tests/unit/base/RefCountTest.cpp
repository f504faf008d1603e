#include "moka/base/RefCount.h"
#include "moka/base/RefPtr.h"

#include <gtest/gtest.h>

#include <thread>
#include <vector>

namespace Moka {
namespace {

class Counted : public RefCount {
public:
    explicit Counted(int* deleted) : mDeleted(deleted) {}
    ~Counted() override { ++*mDeleted; }

private:
    int* mDeleted;
};

// Under the thread sanitizer: the destructor reads what the other threads wrote before they let go.
TEST(RefCountTest, TheLastUnrefSeesWhatTheOthersDid) {
    constexpr std::size_t kThreads = 4;
    struct Shared : RefCount {
        explicit Shared(int* total) : sum(total) {}
        ~Shared() override {
            for (int const part : parts) *sum += part;
        }
        int* sum;
        int parts[kThreads] = {};
    };
    for (int round = 0; round < 200; ++round) {
        int sum = 0;
        auto* const object = new Shared(&sum);
        std::vector<std::thread> threads;
        for (int& part : object->parts) {
            object->Ref();
            threads.emplace_back([object, &part] {
                object->Ref();
                part = 1;
                object->Unref();
                object->Unref();
            });
        }
        object->Unref();
        for (std::thread& thread : threads) thread.join();
        ASSERT_EQ(sum, static_cast<int>(kThreads));
    }
}

TEST(RefPtrTest, AdoptsSharesMovesAndReleases) {
    int deleted = 0;
    {
        auto adopted = RefPtr<Counted>::Adopt(new Counted(&deleted));
        EXPECT_EQ(adopted->GetRefCount(), 1);
        EXPECT_EQ(adopted->Ref(), 2);
        EXPECT_EQ(adopted->Unref(), 1);
        auto shared = RefPtr<Counted>::Share(adopted.Get());
        RefPtr<Counted> copy = shared;
        EXPECT_EQ(adopted->GetRefCount(), 3);
        RefPtr<Counted> const moved = std::move(copy);
        EXPECT_EQ(adopted->GetRefCount(), 3);
        RefPtr<Counted>& same = shared;
        shared = same;
        EXPECT_EQ(adopted->GetRefCount(), 3);
        shared = RefPtr<Counted>();
        EXPECT_EQ(adopted->GetRefCount(), 2);
        Counted* const released = adopted.Release();
        EXPECT_FALSE(adopted);
        EXPECT_EQ(released->Unref(), 1);
        EXPECT_EQ(deleted, 0) << "moved holds it still";
    }
    EXPECT_EQ(deleted, 1);
    EXPECT_FALSE(RefPtr<Counted>::Share(nullptr));
}

} // namespace
} // namespace Moka
