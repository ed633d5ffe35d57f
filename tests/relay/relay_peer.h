// A relay on a scripted transport library, and the frames that its peers send.
#ifndef TESTS_RELAY_RELAY_PEER_H
#define TESTS_RELAY_RELAY_PEER_H

#include <gmock/gmock.h>

#include <memory>
#include <string>
#include <utility>

#include "tests/relay/running_relay.h"
#include "tests/support/fake_norv.h"
#include "tests/support/tcp.h"

namespace relay_peer {

using tcp::Connection;
using tcp::Octets;
using tcp::operator+;
using tcp::words;

constexpr std::size_t headerSize = 20;
constexpr std::size_t blockSize = 56;

const Octets openRequest = words({1003, 0, 28, 0, 0}) + words({1, 2, 3, 4, 5, 512, 50});
const Octets closeRequest = words({2000, 0, 0, 0, 0});
const Octets closed = words({2001, 0, 0, 0, 0});
const Octets opened = words({1002, 0, 20, 0, 0}) + words({1, 2, 3, 4, 5});

// A command of type 8 to 0.1.1.21.2, under a source that is not the sender's.
inline Octets command(std::uint32_t transaction, const Octets& body = {}) {
    const auto size = static_cast<std::uint32_t>(body.size());
    return words({1001, 0, blockSize, size, 0}) +
           words({0, transaction, 8, 9, 9, 9, 0, 1, 1, 9, 9, 2, 21, size}) + body;
}

class RelayTest : public testing::Test {
  protected:
    RelayTest() {
        fake_norv::reset();
        fake_norv::nextHostAddress({5, 2, 0, 3, 4, 1, 0});
    }
    ~RelayTest() override {
        relay_.reset();
        EXPECT_EQ(fake_norv::openQueues(), 0U);
        EXPECT_EQ(fake_norv::outstanding(), 0U);
        EXPECT_THAT(fake_norv::misuses(), testing::ElementsAre());
        fake_norv::reset();
    }

    void start(relay::Options options = {}) { relay_ = std::make_unique<RunningRelay>(std::move(options)); }

    Connection connect() const { return Connection::to(relay_->port()); }
    Connection open() const {
        Connection host = connect();
        host.write(openRequest);
        EXPECT_EQ(host.read(opened.size()).size(), opened.size());
        return host;
    }

    // The relay does this to the connection, says why, gives its queue back, and serves the next one.
    void expectEnd(const Connection& host, const std::string& why) {
        EXPECT_TRUE(host.ends());
        EXPECT_TRUE(relay_->logs(why)) << why;
        expectService();
    }
    void expectService() {
        fake_norv::onWrite(nullptr);
        Connection other = open();
        other.write(closeRequest);
        EXPECT_EQ(other.read(headerSize), closed);
        EXPECT_TRUE(other.ends());
    }

    std::unique_ptr<RunningRelay> relay_;
};

}  // namespace relay_peer

#endif
