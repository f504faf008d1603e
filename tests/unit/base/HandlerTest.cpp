#include "moka/base/Handler.h"
#include "moka/base/MessageLoop.h"

#include "tests/support/LogCapture.h"

#include <gmock/gmock.h>

#include <atomic>
#include <chrono>
#include <functional>
#include <memory>
#include <optional>
#include <thread>

namespace Moka {
namespace {

using Testing::Awaited;
using testing::ElementsAre;
using testing::IsEmpty;

// A handler whose messages call a closure; it keeps what arrived.
class Receiver {
public:
    using Action = std::function<void(Handler*, int)>;

    explicit Receiver(Action action = nullptr)
        : mAction(std::move(action)), mHandler(std::make_unique<Handler>(&Receive, this)) {}

    Handler* operator->() const { return mHandler.get(); }
    // Safe inside its own message, unlike destroying the receiver.
    void DestroyHandler() { mHandler.reset(); }
    std::vector<int> const& GetReceived() const { return mReceived; }

private:
    static void Receive(Handler* handler, void* argument, int what) {
        auto* const self = static_cast<Receiver*>(argument);
        self->mReceived.push_back(what);
        if (self->mAction) self->mAction(handler, what);
    }

    Action mAction;
    std::vector<int> mReceived;
    std::unique_ptr<Handler> mHandler;
};

class HandlerTest : public testing::Test {
protected:
    Testing::LogCapture log;
};

TEST_F(HandlerTest, MessagesOfAllHandlersRunInTheOrderTheyWereSentAndWaitUntilThen) {
    MessageLoop loop;
    std::vector<std::pair<char, int>> order;
    std::optional<bool> whileRunning;
    Receiver const a([&](Handler* handler, int what) {
        order.emplace_back('a', what);
        whileRunning = handler->HasMessage();
    });
    Receiver const b([&](Handler*, int what) { order.emplace_back('b', what); });
    EXPECT_FALSE(a->HasMessage());
    EXPECT_TRUE(a->SendMessage(1));
    EXPECT_TRUE(b->SendMessage(1));
    EXPECT_TRUE(a->SendMessage());
    EXPECT_TRUE(a->HasMessage());
    EXPECT_FALSE(a->HasMessage(5));
    EXPECT_FALSE(b->HasMessage()) << "another handler's message";
    EXPECT_TRUE(order.empty()) << "only the loop runs messages";
    EXPECT_EQ(loop.RunPending(), 3);
    EXPECT_THAT(order, ElementsAre(std::make_pair('a', 1), std::make_pair('b', 1), std::make_pair('a', 0)));
    EXPECT_EQ(whileRunning, false) << "a result that arrives now needs a new message";
    EXPECT_EQ(loop.RunPending(), 0);
}

TEST_F(HandlerTest, WithoutItsLoopAHandlerRefusesEveryMessage) {
    Receiver const orphan;
    EXPECT_EQ(log.GetLines().size(), 1U);
    auto loop = std::make_unique<MessageLoop>();
    Receiver const receiver;
    EXPECT_TRUE(receiver->SendMessage());
    EXPECT_FALSE(orphan->SendMessage()) << "the loop came too late";
    EXPECT_FALSE(orphan->HasMessage());
    loop.reset();
    EXPECT_EQ(MessageLoop::GetCurrent(), nullptr);
    EXPECT_FALSE(receiver->HasMessage());
    EXPECT_FALSE(receiver->SendMessage());
    MessageLoop next; // a new loop on the same thread does not adopt it
    EXPECT_FALSE(receiver->SendMessage());
    EXPECT_THAT(receiver.GetReceived(), IsEmpty());
}

TEST_F(HandlerTest, AMessageMayDestroyItsOwnHandlerAndOthersWithTheirPendingMessages) {
    MessageLoop loop;
    Receiver const kept;
    Receiver other;
    Receiver* self = nullptr;
    Receiver receiver([&](Handler*, int) {
        self->DestroyHandler();
        other.DestroyHandler();
    });
    self = &receiver;
    for (int i = 0; i < 3; ++i)
        for (Receiver const* each : std::vector<Receiver const*>{&receiver, &other, &kept})
            (*each)->SendMessage(i);
    EXPECT_EQ(loop.RunPending(), 4);
    EXPECT_THAT(receiver.GetReceived(), ElementsAre(0));
    EXPECT_THAT(other.GetReceived(), IsEmpty());
    EXPECT_THAT(kept.GetReceived(), ElementsAre(0, 1, 2));
}

TEST_F(HandlerTest, RunPendingLeavesWhatIsSentMeanwhile) {
    MessageLoop loop;
    Receiver victim;
    Receiver const receiver([&](Handler* handler, int what) {
        handler->SendMessage(what + 10);
        if (what == 1) victim.DestroyHandler(); // a withdrawn message is not made up for
    });
    receiver->SendMessage(1);
    victim->SendMessage(2);
    receiver->SendMessage(3);
    EXPECT_EQ(loop.RunPending(), 2);
    EXPECT_THAT(receiver.GetReceived(), ElementsAre(1, 3));
    EXPECT_EQ(loop.RunPending(), 2);
    EXPECT_THAT(receiver.GetReceived(), ElementsAre(1, 3, 11, 13));
}

TEST_F(HandlerTest, QuitEndsTheRunningOrTheNextRun) {
    MessageLoop loop;
    Receiver const receiver([&](Handler*, int what) {
        if (what == 1) loop.Quit();
    });
    loop.Quit();
    receiver->SendMessage(0);
    loop.Run();
    EXPECT_THAT(receiver.GetReceived(), IsEmpty()) << "asked for before it ran";
    receiver->SendMessage(1);
    receiver->SendMessage(2);
    loop.Run();
    EXPECT_THAT(receiver.GetReceived(), ElementsAre(0, 1));
    EXPECT_EQ(loop.RunPending(), 1) << "what it left can still run";
}

TEST_F(HandlerTest, DestructionElsewhereWaitsForTheRunningMessage) {
    std::unique_ptr<Receiver> receiver;
    Awaited<bool> entered;
    std::atomic<bool> destroyed{false};
    bool finished = false; // not atomic: the destructor's waiting is what makes it visible
    bool refused = false;
    Awaited<MessageLoop*> running;
    std::thread thread([&] {
        MessageLoop loop;
        receiver = std::make_unique<Receiver>([&](Handler* handler, int) {
            entered.Set(true);
            // Ends only when destruction has begun, which closes the handler.
            while (handler->SendMessage(1)) std::this_thread::sleep_for(std::chrono::microseconds(100));
            refused = true;
            std::this_thread::sleep_for(std::chrono::milliseconds(20));
            EXPECT_FALSE(destroyed);
            finished = true;
        });
        running.Set(&loop); // cppcheck-suppress danglingLifetime ; not used after Run()
        loop.Run();
    });
    running.Await([](MessageLoop* loop) { return loop != nullptr; });
    std::this_thread::sleep_for(std::chrono::milliseconds(20)); // until the loop waits for a message
    (*receiver)->SendMessage(0);
    entered.AwaitAtLeast(true);
    receiver->DestroyHandler();
    destroyed = true;
    EXPECT_TRUE(finished);
    EXPECT_TRUE(refused);
    running.Get()->Quit();
    thread.join();
    EXPECT_THAT(receiver->GetReceived(), ElementsAre(0));
}

} // namespace
} // namespace Moka
