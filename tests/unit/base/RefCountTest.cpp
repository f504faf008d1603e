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

class Interface {
public:
    virtual ~Interface() = default;
    virtual int Value() const { return 1; }
};

class Second : public Interface, public Counted {
public:
    explicit Second(int* deleted) : Counted(deleted) {}
    int Value() const override { return 2; }
};

class Private : Counted {
public:
    using Counted::Counted;
    using RefCount::Ref;
    using RefCount::Unref;
};

TEST(RefCountTest, StartsAtOneAndDeletesWithTheLastReference) {
    int deleted = 0;
    auto* const object = new Counted(&deleted);
    EXPECT_EQ(object->GetRefCount(), 1);
    EXPECT_EQ(object->Ref(), 2);
    EXPECT_EQ(object->GetRefCount(), 2);
    EXPECT_EQ(object->Unref(), 1);
    EXPECT_EQ(deleted, 0);
    EXPECT_EQ(object->Unref(), 0);
    EXPECT_EQ(deleted, 1);
}

TEST(RefCountTest, DeletesTheWholeObjectAsSecondOrPrivateBase) {
    int deleted = 0;
    auto* const second = new Second(&deleted);
    EXPECT_EQ(static_cast<RefCount*>(second)->Unref(), 0);
    EXPECT_EQ(deleted, 1);
    auto* const hidden = new Private(&deleted);
    EXPECT_EQ(hidden->Ref(), 2);
    EXPECT_EQ(hidden->Unref(), 1);
    EXPECT_EQ(hidden->Unref(), 0);
    EXPECT_EQ(deleted, 2);
}

// Under the thread sanitizer: the destructor reads what the other threads wrote before they let go.
TEST(RefCountTest, TheLastUnrefSeesWhatTheOthersDid) {
    struct Shared : RefCount {
        Shared(int* total, std::size_t count) : sum(total), parts(count) {}
        ~Shared() override {
            for (int const part : parts) *sum += part;
        }
        int* sum;
        std::vector<int> parts;
    };
    constexpr std::size_t kThreads = 4;
    for (int round = 0; round < 200; ++round) {
        int sum = 0;
        auto* const object = new Shared(&sum, kThreads);
        std::vector<std::thread> threads;
        threads.reserve(kThreads);
        for (std::size_t t = 0; t < kThreads; ++t) {
            object->Ref();
            threads.emplace_back([object, t] {
                object->Ref();
                object->parts[t] = 1;
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
        EXPECT_EQ(deleted, 0);
    }
    EXPECT_EQ(deleted, 1);
    EXPECT_FALSE(RefPtr<Counted>::Share(nullptr));
}

} // namespace
} // namespace Moka
