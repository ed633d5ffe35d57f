// A host queue on the scripted transport, its receiver, and what is asked over it.
#ifndef TESTS_HOSTSVC_MSG_QUEUE_H
#define TESTS_HOSTSVC_MSG_QUEUE_H

#include <gmock/gmock.h>

#include <condition_variable>
#include <cstdlib>
#include <mutex>
#include <optional>
#include <utility>
#include <vector>

#include "hostsvc/KSMsgQueue.h"
#include "tests/support/fake_norv.h"

constexpr NvCompDesc boardAddress{2, 1, 0, 1, 0x15, 0, 0};
constexpr NvCompDesc otherAddress{3, 1, 0, 1, 0x15, 0, 0};
constexpr unsigned commandType = 8;
constexpr unsigned replyType = 9;
constexpr unsigned soon = 10000;  // ms; what is waited for comes at once

// Keeps the types of what it receives; frees the messages.
class Receiver : public KSAsyncMsgReceiver {
  public:
    int receive(KSMsgRef& msg) {
        const unsigned type = msg.getMsgType();
        msg.free();
        const std::lock_guard lock(lock_);
        types_.push_back(type);
        changed_.notify_all();
        return 1;
    }

    std::vector<unsigned> types() const {
        const std::lock_guard lock(lock_);
        return types_;
    }

    bool waitFor(std::size_t count) {
        std::unique_lock lock(lock_);
        return changed_.wait_for(lock, std::chrono::seconds(30), [&] { return types_.size() >= count; });
    }

  private:
    mutable std::mutex lock_;
    std::condition_variable changed_;
    std::vector<unsigned> types_;
};

constexpr auto receiverMember = static_cast<KSMsgQueue::AsyncMember>(&Receiver::receive);

// Takes what is parked.
class SynchronousQueue : public KSMsgQueue {
  public:
    using KSMsgQueue::KSMsgQueue;

    unsigned read() {
        messageAvailable_.lock();
        KSMsgRef msg(std::exchange(unclaimed_, nullptr));
        slotFree_.unlock();
        const unsigned type = msg.getMsgType();
        msg.free();
        return type;
    }
};

class KSMsgQueueTest : public testing::Test {
  protected:
    KSMsgQueueTest() {
        fake_norv::reset();
        unsetenv("HOST");
        unsetenv("REMOTE_NORV");
        queue_.emplace(NvCompDesc{}, 512, 5, nullptr);
    }
    ~KSMsgQueueTest() override {
        queue_.reset();
        EXPECT_EQ(fake_norv::openQueues(), 0U);
        EXPECT_EQ(fake_norv::outstanding(), 0U);
        EXPECT_THAT(fake_norv::misuses(), testing::ElementsAre());
        fake_norv::reset();
    }

    void receive() {
        queue_->registerAsyncCallback(static_cast<KSAsyncMsgReceiver*>(&receiver_), receiverMember);
    }

    static KSMsgRef command(unsigned transaction = 10000) {
        KSMsgRef msg(0U);
        msg.setMsgType(commandType);
        msg.setTrans(transaction);
        msg.setTgtAddr(boardAddress);
        return msg;
    }

    // What came back: its type, or nothing. The message is freed.
    std::optional<unsigned> ask(unsigned timeoutMs, int anySource = 0, unsigned transaction = 10000) {
        KSMsgRef msg = command(transaction);
        KSMsgRef back = queue_->request(msg, timeoutMs, replyType, anySource);
        EXPECT_EQ(msg.getMsgRef(), nullptr);
        if (back.getMsgRef() == nullptr)
            return std::nullopt;
        const unsigned type = back.getMsgType();
        back.free();
        return type;
    }

    void event(unsigned type) const {
        EXPECT_TRUE(fake_norv::deliver({0, type, boardAddress, queue_->getHostDesc(), {}}));
    }

    // Each command is answered with these messages, all of its transaction unless they have one.
    static void answers(std::vector<fake_norv::Message> with) {
        fake_norv::onWrite([with](const fake_norv::Message& heard) {
            if (heard.type != commandType)
                return;
            for (fake_norv::Message message : with) {
                message.transaction = message.transaction != 0 ? message.transaction : heard.transaction;
                message.target = heard.source;
                fake_norv::deliver(message);
            }
        });
    }

    Receiver receiver_;
    std::optional<SynchronousQueue> queue_;
};

#endif
