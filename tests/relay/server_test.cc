// The relay as a peer sees it, on a scripted transport library.
#include <algorithm>
#include <thread>

#include "tests/relay/relay_peer.h"

namespace {

using namespace relay_peer;  // NOLINT(google-build-using-namespace): the words of these tests
using fake_norv::Op;
using testing::ElementsAre;

TEST_F(RelayTest, OpeningAQueueReturnsItsAddress) {
    start();
    const Connection host = connect();
    host.write(words({1003, 42, 28, 0, 0xDEADBEEF}) + words({9, 9, 9, 9, 9, 512, 50}));
    EXPECT_EQ(host.read(40), words({1002, 42, 20, 0, 0}) + words({1, 2, 3, 4, 5}));
    EXPECT_EQ(fake_norv::openQueues(), 1U);
}

TEST_F(RelayTest, AMessageIsWrittenUnderTheQueuesAddressAndItsReplyComesBack) {
    start();
    fake_norv::onWrite([](const fake_norv::Message& heard) {
        if (heard.type == 8)
            fake_norv::deliver(fake_norv::replyTo(heard, 9, {7, 8}));
    });
    const Connection host = open();
    host.write(command(10000, {1, 2, 3}));
    EXPECT_EQ(host.read(headerSize + blockSize + 2),
              words({1001, 0, 56, 2, 0}) + words({0x5A, 10000, 9, 0, 1, 1, 1, 2, 3, 2, 21, 5, 4, 2}) +
                  Octets({7, 8}));
    const fake_norv::Message heard = fake_norv::written().at(0);
    EXPECT_EQ(heard.transaction, 10000U);
    EXPECT_EQ(heard.source.instance, 5);
    EXPECT_EQ(heard.target.instance, 2);
    EXPECT_EQ(heard.body, Octets({1, 2, 3}));
}

TEST_F(RelayTest, EventsComeInOrderAndTheLargestFits) {
    start();
    const Connection host = open();
    const Octets large(102400, 0x77);
    for (const Octets& body : {Octets{1}, large, Octets{}})
        fake_norv::deliver({0, 32, {2, 1, 0, 1, 21, 0, 0}, {5, 2, 0, 3, 4, 1, 0}, body});
    for (const Octets& body : {Octets{1}, large, Octets{}}) {
        const Octets frame = host.read(headerSize + blockSize + body.size());
        ASSERT_EQ(frame.size(), headerSize + blockSize + body.size());
        EXPECT_TRUE(std::equal(body.begin(), body.end(), frame.begin() + headerSize + blockSize));
    }
}

TEST_F(RelayTest, AMessageTooLargeForAFrameEndsTheConnection) {
    start();
    const Connection host = open();
    fake_norv::deliver({0, 32, {}, {5, 2, 0, 3, 4, 1, 0}, Octets(102401)});
    expectEnd(host, "ended: a message of 102401 octets from the board");
}

TEST_F(RelayTest, ACloseIsAcknowledgedBehindEverythingThatWasOnItsWay) {
    start();
    fake_norv::onWrite([](const fake_norv::Message& heard) {
        if (heard.type == 8)
            fake_norv::deliver(fake_norv::replyTo(heard, 9));
    });
    const Connection host = open();
    Octets all;
    for (std::uint32_t i = 0; i < 200; ++i)
        all = std::move(all) + command(10000 + i);
    host.write(all + words({2000, 43, 0, 0, 0}));
    for (std::uint32_t i = 0; i < 200; ++i) {
        const Octets frame = host.read(headerSize + blockSize);
        ASSERT_EQ(Octets(frame.begin() + headerSize + 4, frame.begin() + headerSize + 8), words({10000 + i}));
    }
    EXPECT_EQ(host.read(headerSize), words({2001, 43, 0, 0, 0}));
    EXPECT_TRUE(host.ends());
    EXPECT_TRUE(relay_->logs(": closed"));
}

TEST_F(RelayTest, ClientsHaveQueuesOfTheirOwn) {
    start();
    fake_norv::onWrite([](const fake_norv::Message& heard) {
        if (heard.type == 8)
            fake_norv::deliver(fake_norv::replyTo(heard, 9, heard.body));
    });
    const Connection one = open();
    const Connection two = open();
    one.write(command(1, {1}));
    two.write(command(2, {2}));
    EXPECT_EQ(one.read(headerSize + blockSize + 1).back(), 1);
    EXPECT_EQ(two.read(headerSize + blockSize + 1).back(), 2);
}

TEST_F(RelayTest, AMessageToTheQueueItselfComesBackWhateverItLooksLike) {
    start();
    const Connection host = open();
    const Octets asMark =
        words({1001, 0, 56, 0, 0}) + words({0x5A, 0xFFFFFF, 0, 1, 2, 3, 1, 2, 3, 5, 4, 5, 4, 0});
    host.write(asMark + asMark);
    EXPECT_EQ(host.read(2 * asMark.size()), asMark + asMark);
    host.write(closeRequest);
    EXPECT_EQ(host.read(headerSize), closed);
}

TEST_F(RelayTest, APeerThatClosesAfterAnyOctetGivesItsQueueBack) {
    relay::Options options;
    options.maxClients = 1000;  // more than there are octets: none is refused, however slow the ends are
    start(options);
    const Octets all = openRequest + command(10000, {1, 2, 3}) + closeRequest;
    for (std::size_t n = 0; n < all.size(); ++n) {
        Connection host = connect();
        host.write({all.begin(), all.begin() + static_cast<long>(n)});
        host.close();
    }
    EXPECT_TRUE(relay_->logs("127.0.0.1:", all.size()));
    EXPECT_TRUE(relay_->logs("ended:", all.size()));
    expectService();
}

TEST_F(RelayTest, AFirstFrameThatIsNoOpenRequestEndsTheConnection) {
    const struct {
        Octets octets;
        const char* why;
    } cases[] = {
        {command(1), "ended: a frame of type 1001 instead of 1003"},
        {closeRequest, "ended: a frame of type 2000 instead of 1003"},
        {words({1003, 0, 24, 0, 0}) + Octets(24), "ended: an open request of 24 octets"},
        {words({1003, 0, 32, 0, 0}) + Octets(32), "ended: an open request of 32 octets"},
        {words({1003, 0, 102401, 0, 0}), "ended: a frame with a part of 102401 octets; the most is 102400"},
        {words({1003, 0, 28, 0xFFFFFFFF, 0}), "ended: a frame with a part of 4294967295 octets"},
        {Octets(20, 'G'), "ended: a frame with a part of 1195853639 octets"},
    };
    start();
    for (const auto& each : cases) {
        const Connection host = connect();
        host.write(each.octets);
        expectEnd(host, each.why);
    }
}

TEST_F(RelayTest, AFrameThatIsNoMessageEndsTheConnection) {
    const struct {
        Octets octets;
        const char* why;
    } cases[] = {
        {openRequest, "ended: a frame of type 1003 instead of 1001"},
        {closed, "ended: a frame of type 2001 instead of 1001"},
        {words({1001, 0, 55, 0, 0}) + Octets(55), "ended: a header block of 55 octets"},
        {words({1001, 0, 56, 4, 0}) + Octets(60), "ended: a body of 4 octets that should have 0"},
        {words({1001, 0, 56, 0, 0}) + words({256}) + Octets(52), "ended: word 1 of a header block is 256"},
        {words({1001, 0, 56, 102401, 0}), "ended: a frame with a part of 102401 octets"},
    };
    start();
    for (const auto& each : cases) {
        const Connection host = open();
        host.write(each.octets);
        expectEnd(host, each.why);
    }
}

TEST_F(RelayTest, AHostThatStaysSilentOrStopsWithinAFrameIsEnded) {
    relay::Options options;
    options.patience.frame = std::chrono::milliseconds(200);
    start(options);
    const Connection silent = connect();
    expectEnd(silent, "ended: no whole frame within 200 ms");
    for (const std::size_t n : {std::size_t{1}, std::size_t{20}, command(1).size() - 1}) {
        const Connection host = open();
        const Octets frame = command(1);
        host.write({frame.begin(), frame.begin() + static_cast<long>(n)});
        expectEnd(host, "ended: no whole frame within 200 ms");
    }
}

TEST_F(RelayTest, AHostThatSendsOctetByOctetIsEndedWhenItsTimeIsOver) {
    relay::Options options;
    options.patience.frame = std::chrono::milliseconds(100);
    start(options);
    const Connection host = connect();
    while (host.write(words({1003})) && relay_->logged("ended:") == 0)
        std::this_thread::yield();
    EXPECT_TRUE(relay_->logs("ended: "));
    expectService();
}

TEST_F(RelayTest, AHostThatWaitsForEventsMayBeSilent) {
    relay::Options options;
    options.patience.frame = std::chrono::milliseconds(200);
    start(options);
    const Connection host = open();
    const Connection silent = connect();
    EXPECT_TRUE(silent.ends());  // its time is over; the other's would be too
    EXPECT_TRUE(silent.ends());
    fake_norv::deliver({0, 32, {}, {5, 2, 0, 3, 4, 1, 0}, {1}});
    EXPECT_EQ(host.read(headerSize + blockSize + 1).size(), headerSize + blockSize + 1);
}

TEST_F(RelayTest, AHostThatDoesNotReadIsDisconnected) {
    relay::Options options;
    options.patience.write = std::chrono::milliseconds(50);
    start(options);
    const Connection host = open();
    while (relay_->logged("ended: a frame was not taken within 50 ms") == 0 &&
           fake_norv::deliver({0, 32, {}, {5, 2, 0, 3, 4, 1, 0}, Octets(102400)}))
        std::this_thread::yield();
    expectEnd(host, "ended: a frame was not taken within 50 ms");
}

TEST_F(RelayTest, AHostThatTakesNoRepliesIsReadNoFurther) {
    relay::Options options;
    options.patience.write = std::chrono::milliseconds(50);
    start(options);
    fake_norv::onWrite([](const fake_norv::Message& heard) {
        if (heard.type == 8)
            fake_norv::deliver(fake_norv::replyTo(heard, 9, Octets(50000)));
    });
    const Connection host = open();
    while (host.write(command(1)))
        EXPECT_LT(fake_norv::outstanding(), 200U);
    expectEnd(host, "ended: a frame was not taken within 50 ms");
}

TEST_F(RelayTest, MoreClientsThanAllowedAreRefusedUntilOneGoes) {
    relay::Options options;
    options.maxClients = 2;
    start(options);
    Connection one = open();
    const Connection two = open();
    EXPECT_TRUE(connect().ends());
    EXPECT_TRUE(relay_->logs("refused: 2 clients already"));
    one.write(closeRequest);
    EXPECT_TRUE(one.read(headerSize) == closed && one.ends());
    for (bool served = false; !served;) {  // once it has been noticed that one has gone
        const Connection three = connect();
        three.write(openRequest);
        served = three.read(opened.size()).size() == opened.size();
    }
}

TEST_F(RelayTest, HostsThatAreNotAllowedAreRefused) {
    relay::Options options;
    options.allow = {*relay::Cidr::parse("10.0.0.0/8")};
    start(options);
    EXPECT_TRUE(connect().ends());
    EXPECT_TRUE(relay_->logs("refused: not among those allowed"));
}

}  // namespace
