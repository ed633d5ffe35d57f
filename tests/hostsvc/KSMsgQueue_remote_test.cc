// The whole host queue, with its reader thread, over a queue in another machine.
#include <atomic>
#include <condition_variable>
#include <iostream>
#include <mutex>

#include "hostsvc/KSMsgQueue.h"
#include "tests/hostsvc/remote_msg_queue.h"

namespace {

using namespace remote;  // NOLINT(google-build-using-namespace): the words of these tests

class KSMsgQueueOverTheNetwork : public KSRemoteMsgQueueTest {
  protected:
    std::pair<std::unique_ptr<KSMsgQueue>, Connection> openMailbox() const {
        const std::string host = listener_.host();
        auto queue = std::async(std::launch::async,
                                [&] { return std::make_unique<KSMsgQueue>(asked, 512, 50, host.c_str()); });
        Connection relay = listener_.accept();
        relay.read(openRequestSize);
        relay.write(opened);
        return {queue.get(), std::move(relay)};
    }
};

TEST_F(KSMsgQueueOverTheNetwork, ARequestGetsItsReply) {
    auto [queue, relay] = openMailbox();
    std::thread board([&relay = relay] {
        relay.read(headerSize + 56);
        relay.write(messageFrame);
        relay.read(headerSize);
        relay.write(closed);
    });
    KSMsgRef command(0U);
    command.setMsgType(8);
    command.setTrans(10000);
    command.setTgtAddr({2, 1, 0, 1, 21, 0, 0});
    KSMsgRef reply = queue->request(command, 30000, 9, 0);
    ASSERT_NE(reply.getMsgRef(), nullptr);
    EXPECT_EQ(reply.getSize(), 3U);
    reply.free();
    queue.reset();
    board.join();
}

TEST_F(KSMsgQueueOverTheNetwork, ARequestThatCannotBeSentIsFreedAndTimesOut) {
    auto [queue, relay] = openMailbox();
    KSMsgRef tooLarge(102401U);
    EXPECT_EQ(queue->request(tooLarge, 5, 9, 0).getMsgRef(), nullptr);
    EXPECT_EQ(fake_norv::outstanding(), 0U);
    std::thread board([&relay = relay] {
        relay.read(headerSize);
        relay.write(closed);
    });
    queue.reset();
    board.join();
}

// The standard error stream while it lives.
class Errors : public std::streambuf {
  public:
    Errors() : before_(std::cerr.rdbuf(this)) {}
    ~Errors() override { std::cerr.rdbuf(before_); }

    // What was written once it ends with this.
    std::string until(const std::string& end) {
        std::unique_lock lock(lock_);
        changed_.wait_for(lock, std::chrono::seconds(30), [&] { return text_.ends_with(end); });
        return text_;
    }

  protected:
    int overflow(int character) override {
        const std::lock_guard lock(lock_);
        text_.push_back(static_cast<char>(character));
        changed_.notify_all();
        return character;
    }

  private:
    std::mutex lock_;
    std::condition_variable changed_;
    std::string text_;
    std::streambuf* before_;
};

TEST_F(KSMsgQueueOverTheNetwork, AConnectionThatIsLostEndsTheReaderAndNotTheProgram) {
    Errors errors;
    auto [queue, relay] = openMailbox();
    relay.close();
    const std::string last =
        "The connection to the remote message queue on " + listener_.host() + " is lost\n";
    EXPECT_EQ(errors.until(last), errorLines(10) + last);
    KSMsgRef command(0U);
    EXPECT_EQ(queue->request(command, 5, 9, 0).getMsgRef(), nullptr);
    queue.reset();
}

TEST_F(KSMsgQueueOverTheNetwork, DestructionWhileMessagesStreamInFindsTheAcknowledgementAmongThem) {
    for (int round = 0; round < 20; ++round) {
        auto [queue, relay] = openMailbox();
        std::atomic<bool> asked{false};
        std::thread sender([&, &relay = relay] {
            while (!asked)
                relay.write(messageFrame);
            relay.write(closed);
        });
        std::thread listener([&, &relay = relay] {
            relay.read(headerSize);
            asked = true;
        });
        queue->registerAsyncCallback([](KSMsgRef& msg) {
            msg.free();
            return 1;
        });
        queue.reset();
        sender.join();
        listener.join();
        EXPECT_EQ(fake_norv::outstanding(), 0U);
    }
}

}  // namespace
