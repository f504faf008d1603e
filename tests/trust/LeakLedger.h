// LeakLedger: a queue that refuses some tasks by chance, and the book of what each refusal leaves behind by
// design. At the end a test settles the book: it gives back every reference and deletes every object that a
// refused task would have, and then nothing at all may be left.
// Thread: one, which stands for both sides.
#pragma once

#include "moka/graphics/task/IGLMsgQueue.h"
#include "tests/support/Queues.h"

#include <cstdint>
#include <functional>
#include <map>
#include <random>
#include <set>
#include <string>
#include <vector>

namespace Moka::Testing {

class LeakLedger {
public:
    // Enters what a refused task would have given back or deleted. False for a task it does not know.
    bool Enter(ITask* task);
    // Does it now, in the order in which it was refused; later, on the render thread.
    void Settle();

    int CountEntries() const { return static_cast<int>(mEntries.size()); }
    // The tasks refused, by what they would have done.
    std::map<std::string, int> const& GetKinds() const { return mKinds; }

private:
    std::vector<std::function<void()>> mEntries;
    std::map<std::string, int> mKinds;
};

class UnreliableQueue final : public HandPumpedQueue {
public:
    UnreliableQueue(unsigned seed, int percent) : mRandom(seed), mPercent(percent) {}

    void WaitForTasks() override { RunAll(); }
    void SetReliable(bool reliable) { mReliable = reliable; }

    LeakLedger& GetLedger() { return mLedger; }
    std::int64_t CountOffered() const { return mOffered; }
    // Refused tasks that the ledger does not know.
    std::set<std::string> const& GetUnknown() const { return mUnknown; }

protected:
    bool Accepts(int ordinal, ITask* task) override;

private:
    std::mt19937 mRandom;
    int const mPercent;
    bool mReliable = false;
    std::int64_t mOffered = 0;
    std::set<std::string> mUnknown;
    LeakLedger mLedger;
};

} // namespace Moka::Testing
