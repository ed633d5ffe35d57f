// The object layer's queue over a relay: what it asks for, and what happens when the relay goes.
#include <atomic>
#include <cstdlib>
#include <future>

#include "tests/support/tcp.h"
#include "tests/support/test_system.h"
#include "tests/vela/transport.h"
#include "vela/MsgQueue.h"

namespace {

using tcp::operator+;
using vela::MsgQueue;

const vela::CompDesc_t Ccs(1, 1, 1, 0x15, 0);

// A queue of the object layer, and the relay's end of its connection.
class RemoteQueueTest : public TransportTest {
  protected:
    RemoteQueueTest() {
        unsetenv("HOST");
        setenv("REMOTE_NORV", listener_.host().c_str(), 1);
    }
    ~RemoteQueueTest() override { unsetenv("REMOTE_NORV"); }

    // Answers the open request, which it returns, and hands over the connection.
    tcp::Octets acceptQueue() {
        relay_ = std::make_unique<tcp::Connection>(listener_.accept());
        tcp::Octets request = relay_->read(20 + 28);
        relay_->write(tcp::words({1002, 0, 20, 0, 0}) + tcp::words({11, 12, 13, 14, 15}));
        return request;
    }

    tcp::Listener listener_;
    std::unique_ptr<tcp::Connection> relay_;
    CapturedErrors errors_;
};

TEST_F(RemoteQueueTest, AnObjectsPrivateQueueAsksForTheDefaultSizes) {
    auto object =
        std::async(std::launch::async, [] { return std::make_unique<vela::Addressable>(Ccs, nullptr); });
    const tcp::Octets request = acceptQueue();
    const auto made = object.get();
    // Node, board, processor, component and instance of the target; 512 octets a reply, 5 messages deep.
    EXPECT_EQ(tcp::Octets(request.begin() + 20, request.end()), tcp::words({0, 1, 1, 0x15, 1, 512, 5}));
    EXPECT_EQ(MsgQueue::DefaultMaxRetMsgSize, 512U);
    relay_->close();
}

std::atomic<int> losses{0};

TEST_F(RemoteQueueTest, ALostConnectionIsToldUntilNullBringsTheDefaultBack) {
    auto making = std::async(std::launch::async, [] { return std::make_unique<MsgQueue>(Ccs, 512, 5); });
    acceptQueue();
    const std::unique_ptr<MsgQueue> queue = making.get();
    const SleeplessSystem system;
    queue->connectionLost(nullptr);
    Signal lost;
    static Signal* told = nullptr;
    told = &lost;
    queue->connectionLost([](MsgQueue*) {
        ++losses;
        told->raise();
    });
    relay_->close();
    ASSERT_TRUE(lost.wait());
    EXPECT_EQ(losses, 1);
    queue->connectionLost(nullptr);  // it is lost already: told at once
    EXPECT_EQ(losses, 1);
}

}  // namespace
