// A queue in another machine, whose relay is what the test writes and reads at the other end.
#ifndef TESTS_HOSTSVC_REMOTE_MSG_QUEUE_H
#define TESTS_HOSTSVC_REMOTE_MSG_QUEUE_H

#include <gmock/gmock.h>

#include <algorithm>
#include <cstring>
#include <future>
#include <memory>
#include <string>
#include <thread>
#include <utility>

#include "hostsvc/KSMsgRef.h"
#include "hostsvc/KSRemoteMsgQueue.h"
#include "tests/support/fake_norv.h"
#include "tests/support/tcp.h"

namespace remote {

using tcp::Connection;
using tcp::Octets;
using tcp::operator+;
using tcp::words;

constexpr NvCompDesc asked{1005, 2, 0, 3, 4, 1, 0};
constexpr NvCompDesc given{0x1234, 12, 0, 13, 14, 11, 0};
constexpr std::size_t openRequestSize = 20 + 28;
constexpr std::size_t headerSize = 20;

const Octets opened = words({1002, 0, 20, 0, 0}) + words({11, 12, 13, 14, 0x1234});
const Octets closed = words({2001, 0, 0, 0, 0});
const Octets closeRequest = words({2000, 0, 0, 0, 0});

// A message of type 9, transaction 10000 and low octet 0x5A, from 0.1.1.21.2 to Given, with a body of three.
const Octets block = words({0x5A, 10000, 9, 0, 1, 1, 11, 12, 13, 2, 21, 0x1234, 14, 3});
const Octets body{1, 2, 3};
const Octets messageFrame = words({1001, 0, 56, 3, 0}) + block + body;

inline Octets withoutSendersWord(Octets frame) {
    std::fill(frame.begin() + 16, frame.begin() + 20, 0);
    return frame;
}

inline Octets octetsOf(const KSMsgRef& msg) {
    Octets octets(NVMSG_HEADER_SIZE + msg.getSize());
    std::memcpy(octets.data(), msg.getMsgRef(), octets.size());
    return octets;
}

class KSRemoteMsgQueueTest : public testing::Test {
  protected:
    KSRemoteMsgQueueTest() { fake_norv::reset(); }
    ~KSRemoteMsgQueueTest() override {
        EXPECT_EQ(fake_norv::outstanding(), 0U);
        EXPECT_THAT(fake_norv::misuses(), testing::ElementsAre());
    }

    std::unique_ptr<KSRemoteMsgQueue> make() const {
        return std::make_unique<KSRemoteMsgQueue>(asked, 512, 50, listener_.host().c_str());
    }

    // A queue, and its relay's end of the connection.
    std::pair<std::unique_ptr<KSRemoteMsgQueue>, Connection> open() const {
        auto queue = std::async(std::launch::async, [this] { return make(); });
        Connection relay = listener_.accept();
        relay.read(openRequestSize);
        relay.write(opened);
        return {queue.get(), std::move(relay)};
    }

    // The queue goes, and the relay closes as it should.
    static void close(std::unique_ptr<KSRemoteMsgQueue>& queue, const Connection& relay) {
        std::thread other([&] {
            relay.read(headerSize);
            relay.write(closed);
        });
        queue.reset();
        other.join();
    }

    std::string errorLine() const {
        return "Error communicating with remote message queue on " + listener_.host() + "\n";
    }

    std::string errorLines(int count) const {
        std::string lines;
        for (; count > 0; --count)
            lines += errorLine();
        return lines;
    }

    tcp::Listener listener_;
};

}  // namespace remote

#endif
