// The mailbox's requests, replies and events, twice: over the transport library of this machine, and through
// a relay.
#include <gmock/gmock.h>

#include <atomic>
#include <condition_variable>
#include <cstring>
#include <mutex>
#include <optional>
#include <thread>

#include "hostsvc/KSMsgQueue.h"
#include "hostsvc/KSMsgRef.h"
#include "tests/relay/running_relay.h"
#include "tests/support/fake_norv.h"

namespace {

using fake_norv::Message;
using testing::ElementsAre;

constexpr NvCompDesc boardAddress{2, 1, 0, 1, 0x15, 0, 0};
constexpr NvCompDesc otherAddress{3, 1, 0, 1, 0x15, 0, 0};
constexpr unsigned commandType = 8;
constexpr unsigned replyType = 9;
constexpr unsigned eventType = 32;
constexpr unsigned soon = 30000;  // ms; what is waited for comes at once

using Octets = std::vector<std::uint8_t>;

Octets bodyOf(const KSMsgRef& msg) {
    Octets body(msg.getSize());
    if (!body.empty())
        std::memcpy(body.data(), msg.getMsgRef() + 1, body.size());
    return body;
}

// Keeps what it receives, and frees the messages.
class Receiver : public KSAsyncMsgReceiver {
  public:
    int receive(KSMsgRef& msg) {
        const std::lock_guard lock(lock_);
        types_.push_back(msg.getMsgType());
        bodies_.push_back(bodyOf(msg));
        msg.free();
        changed_.notify_all();
        return 1;
    }

    std::vector<unsigned> types(std::size_t count) {
        std::unique_lock lock(lock_);
        changed_.wait_for(lock, std::chrono::seconds(30), [&] { return types_.size() >= count; });
        return types_;
    }
    std::vector<Octets> bodies(std::size_t count) {
        types(count);
        const std::lock_guard lock(lock_);
        return bodies_;
    }

  private:
    std::mutex lock_;
    std::condition_variable changed_;
    std::vector<unsigned> types_;
    std::vector<Octets> bodies_;
};

enum class Way { local, relay };

class Mailbox : public testing::TestWithParam<Way> {
  protected:
    Mailbox() {
        fake_norv::reset();
        unsetenv("HOST");
        if (GetParam() == Way::relay) {
            relay_.emplace();
            setenv("REMOTE_NORV", relay_->host().c_str(), 1);
        } else {
            unsetenv("REMOTE_NORV");
        }
        queue_.emplace(NvCompDesc{}, 512, 5, nullptr);
        queue_->registerAsyncCallback(static_cast<KSAsyncMsgReceiver*>(&receiver_),
                                      static_cast<KSMsgQueue::AsyncMember>(&Receiver::receive));
    }
    ~Mailbox() override {
        queue_.reset();
        relay_.reset();
        unsetenv("REMOTE_NORV");
        EXPECT_EQ(fake_norv::openQueues(), 0U);
        EXPECT_EQ(fake_norv::outstanding(), 0U);
        EXPECT_THAT(fake_norv::misuses(), ElementsAre());
        fake_norv::reset();
    }

    struct Answer {
        unsigned type;
        unsigned transaction;
        NvCompDesc source;
        Octets body;
    };

    std::optional<Answer> ask(unsigned timeoutMs = soon, int anySource = 0, const Octets& body = {},
                              unsigned transaction = 10000) {
        KSMsgRef msg(static_cast<unsigned>(body.size()));
        msg.setMsgType(commandType);
        msg.setTrans(transaction);
        msg.setTgtAddr(boardAddress);
        if (!body.empty())
            std::memcpy(msg.getMsgRef() + 1, body.data(), body.size());
        KSMsgRef back = queue_->request(msg, timeoutMs, replyType, anySource);
        if (back.getMsgRef() == nullptr)
            return std::nullopt;
        Answer answer{back.getMsgType(), back.getTrans(), back.getSrcAddr(), bodyOf(back)};
        back.free();
        return answer;
    }

    // Each command is answered with these, all of its transaction unless they have one.
    static void answers(const std::vector<Message>& with) {
        fake_norv::onWrite([with](const Message& heard) {
            for (Message message : heard.type == commandType ? with : std::vector<Message>()) {
                message.transaction = message.transaction != 0 ? message.transaction : heard.transaction;
                message.target = heard.source;
                fake_norv::deliver(message);
            }
        });
    }

    void event(unsigned type, const Octets& body = {}) const {
        EXPECT_TRUE(fake_norv::deliver({0, type, boardAddress, queue_->getHostDesc(), body}));
    }

    Receiver receiver_;
    std::optional<RunningRelay> relay_;
    std::optional<KSMsgQueue> queue_;
};

TEST_P(Mailbox, ARequestReachesItsTargetUnderTheQueuesAddressAndReturnsItsReply) {
    answers({{0, replyType, boardAddress, {}, {4, 5, 6}}});
    const auto answer = ask(soon, 0, {1, 2, 3});
    ASSERT_TRUE(answer);
    EXPECT_EQ(answer->type, replyType);
    EXPECT_EQ(answer->transaction, 10000U);
    EXPECT_TRUE(descComp(answer->source, boardAddress));
    EXPECT_EQ(answer->body, Octets({4, 5, 6}));
    const Message heard = fake_norv::written().at(0);
    EXPECT_EQ(heard.type, commandType);
    EXPECT_EQ(heard.transaction, 10000U);
    EXPECT_TRUE(descComp(heard.source, queue_->getHostDesc()));
    EXPECT_TRUE(descComp(heard.target, boardAddress));
    EXPECT_EQ(heard.body, Octets({1, 2, 3}));
}

TEST_P(Mailbox, RepliesOfTheGeneralTypeAndOfTypeZeroAnswerAnyRequest) {
    answers({{0, 0x800001, boardAddress, {}, {}}});
    EXPECT_EQ(ask()->type, 0x800001U);
    answers({{0, 0, boardAddress, {}, {}}});
    EXPECT_EQ(ask()->type, 0U);
}

TEST_P(Mailbox, MessagesOfAnotherTypeTransactionOrSourceAreNoReplies) {
    answers({{0, replyType + 1, boardAddress, {}, {}},
             {10001, replyType + 2, boardAddress, {}, {}},
             {0, 0x800001, otherAddress, {}, {}},
             {0, replyType, boardAddress, {}, {}}});
    EXPECT_EQ(ask()->type, replyType);
    EXPECT_THAT(receiver_.types(3), ElementsAre(replyType + 1, replyType + 2, 0x800001));
}

TEST_P(Mailbox, AnySourceMayAnswerWhenItIsAllowed) {
    answers({{0, replyType, otherAddress, {}, {}}});
    EXPECT_EQ(ask(soon, 1)->type, replyType);
}

TEST_P(Mailbox, ARequestThatNobodyAnswersEndsAndItsLateReplyGoesToTheReceiver) {
    EXPECT_FALSE(ask(20));
    ASSERT_TRUE(fake_norv::waitForCalls(fake_norv::Op::write, 1));
    fake_norv::deliver(fake_norv::replyTo(fake_norv::written().at(0), replyType));
    EXPECT_THAT(receiver_.types(1), ElementsAre(replyType));
}

TEST_P(Mailbox, ARequestWithoutTimeoutReturnsAFreshMessageAndItsReplyGoesToTheReceiver) {
    answers({{0, replyType, boardAddress, {}, {1, 2, 3}}});
    EXPECT_EQ(ask(0)->body, Octets());
    EXPECT_THAT(receiver_.types(1), ElementsAre(replyType));
}

TEST_P(Mailbox, EventsComeWholeAndInOrder) {
    std::vector<unsigned> types;
    std::vector<Octets> bodies;
    for (unsigned i = 0; i < 300; ++i) {
        types.push_back(eventType + i);
        bodies.emplace_back(i * 3 % 1000, static_cast<std::uint8_t>(i));
        event(types.back(), bodies.back());
    }
    EXPECT_EQ(receiver_.types(300), types);
    EXPECT_EQ(receiver_.bodies(300), bodies);
}

TEST_P(Mailbox, RequestsAndEventsGoTogether) {
    answers({{0, replyType, boardAddress, {}, {}}});
    std::atomic<bool> stop{false};
    std::thread board([&] {
        const NvCompDesc host = queue_->getHostDesc();
        for (unsigned i = 0; i < 2000 && !stop; ++i)
            fake_norv::deliver({0, eventType, boardAddress, host, {static_cast<std::uint8_t>(i)}});
    });
    for (unsigned i = 0; i < 50; ++i) {
        const auto answer = ask(soon, 0, {}, 20000 + i);
        ASSERT_TRUE(answer);
        EXPECT_EQ(answer->transaction, 20000 + i);
    }
    stop = true;
    board.join();
    receiver_.types(1);
    const std::vector<Octets> bodies = receiver_.bodies(1);
    for (std::size_t i = 0; i < bodies.size(); ++i)
        EXPECT_EQ(bodies[i], Octets{static_cast<std::uint8_t>(i)});
}

TEST_P(Mailbox, TheLargestBodyGoesThrough) {
    const Octets large(102400, 0x42);
    answers({{0, replyType, boardAddress, {}, large}});
    EXPECT_EQ(ask(soon, 0, large)->body, large);
    EXPECT_EQ(fake_norv::written().at(0).body, large);
}

TEST_P(Mailbox, QueuesComeAndGoAndHaveAddressesOfTheirOwn) {
    KSMsgQueue other(NvCompDesc{}, 512, 5, nullptr);
    EXPECT_FALSE(descComp(other.getHostDesc(), queue_->getHostDesc()));
    for (int i = 0; i < 20; ++i)
        KSMsgQueue(NvCompDesc{}, 512, 5, nullptr);
    answers({{0, replyType, boardAddress, {}, {}}});
    EXPECT_EQ(ask()->type, replyType);
}

TEST_P(Mailbox, DestructionWhileEventsArriveLeavesNothingBehind) {
    for (int round = 0; round < 10; ++round) {
        std::atomic<bool> stop{false};
        std::thread board([&, host = queue_->getHostDesc()] {
            while (!stop)
                fake_norv::deliver({0, eventType, boardAddress, host, {1, 2, 3}});
        });
        receiver_.types(receiver_.types(0).size() + 1);
        queue_.reset();
        stop = true;
        board.join();
        queue_.emplace(NvCompDesc{}, 512, 5, nullptr);
        queue_->registerAsyncCallback(static_cast<KSAsyncMsgReceiver*>(&receiver_),
                                      static_cast<KSMsgQueue::AsyncMember>(&Receiver::receive));
    }
}

INSTANTIATE_TEST_SUITE_P(Over, Mailbox, testing::Values(Way::local, Way::relay), [](const auto& each) {
    return std::string(each.param == Way::local ? "TheLocalQueue" : "TheRelay");
});

}  // namespace
