// How the relay bears a transport that fails and frames that are damaged, and how it stops.
#include <chrono>
#include <random>
#include <thread>

#include "tests/relay/relay_peer.h"

namespace {

using namespace relay_peer;  // NOLINT(google-build-using-namespace): the words of these tests
using fake_norv::Op;

using RelayEndTest = RelayTest;

TEST_F(RelayEndTest, ATransportThatRefusesAQueueEndsTheConnection) {
    start();
    for (const Op op : {Op::open, Op::bind}) {
        fake_norv::fail(op);
        const Connection host = connect();
        host.write(openRequest);
        expectEnd(host, op == Op::open ? "opens no more queues" : "binds no more queues");
    }
}

TEST_F(RelayEndTest, ATransportThatReadsNoMoreEndsTheConnection) {
    start();
    fake_norv::fail(Op::read);
    const Connection host = open();
    expectEnd(host, "ended: the transport library reads no more");
}

TEST_F(RelayEndTest, ATransportThatTakesNoMessageEndsTheConnection) {
    start();
    const Connection host = open();
    ASSERT_TRUE(fake_norv::waitForIdleReader());
    fake_norv::fail(Op::write);  // what is to come back when everything before it has been sent
    host.write(closeRequest);
    expectEnd(host, "ended: the transport library takes no message");
}

TEST_F(RelayEndTest, WithoutMemoryForAMessageTheConnectionEnds) {
    start();
    const Connection host = open();
    fake_norv::fail(Op::allocate);
    host.write(command(1));
    expectEnd(host, "ended: the transport library has no memory for a message");
}

TEST_F(RelayEndTest, WithoutMemoryToWakeItsThreadTheQueueIsGivenBackAllTheSame) {
    start();
    Connection host = open();
    ASSERT_TRUE(fake_norv::waitForIdleReader());
    fake_norv::fail(Op::allocate, 1);
    host.close();
    EXPECT_TRUE(relay_->logs("ended: the connection was closed"));
    expectService();
}

TEST_F(RelayEndTest, StoppingSendsMessagesThatAreOnTheirWayAndThenACloseRequest) {
    start();
    fake_norv::onWrite([](const fake_norv::Message& heard) {
        if (heard.type == 8)
            fake_norv::deliver(fake_norv::replyTo(heard, 9));
    });
    const Connection host = open();
    const Connection unopened = connect();
    host.write(command(1) + command(2));
    EXPECT_EQ(host.read(headerSize + blockSize).size(), headerSize + blockSize);
    relay_->stop();
    EXPECT_EQ(host.read(headerSize + blockSize).size(), headerSize + blockSize);
    EXPECT_EQ(host.read(headerSize), closeRequest);
    EXPECT_TRUE(host.ends());
    EXPECT_TRUE(unopened.ends());
    EXPECT_EQ(connect().get(), -1);
}

TEST_F(RelayEndTest, StoppingTwiceReturnsAtOnce) {
    start();
    const Connection host = open();
    for (int i = 0; i < 300; ++i)  // more than the connection holds
        fake_norv::deliver({0, 32, {}, {5, 2, 0, 3, 4, 1, 0}, Octets(102400)});
    relay_->sayStop();
    while (connect().get() != -1)
        std::this_thread::yield();
    relay_->stop();
    EXPECT_EQ(relay_->logged("a frame was not taken"), 0U);
}

// Frames with octets changed, cut and mixed up: nothing more happens than that connections end.
TEST_F(RelayEndTest, DamagedFramesEndNoMoreThanTheirConnections) {
    relay::Options options;
    options.patience.frame = std::chrono::milliseconds(200);
    options.maxClients = 1000;
    start(options);
    const Octets good = openRequest + command(1, {1, 2, 3}) + command(2) + closeRequest;
    std::mt19937 random(20240611);
    for (int round = 0; round < 400; ++round) {
        Octets octets = good;
        for (unsigned changes = random() % 4; changes > 0; --changes)
            octets[random() % octets.size()] = static_cast<std::uint8_t>(random());
        if (random() % 3 == 0)
            octets.resize(random() % octets.size());
        Connection host = connect();
        ASSERT_GE(host.get(), 0);
        host.write(octets);
        if (random() % 2 == 0)
            host.close();
    }
    expectService();
}

}  // namespace
