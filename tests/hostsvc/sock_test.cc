#include "hostsvc/sock.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/resource.h>

#include <string>
#include <thread>

#include "tests/support/tcp.h"

namespace {

using tcp::Connection;
using tcp::Octets;
using tcp::operator+;
using tcp::words;
using testing::internal::CaptureStderr;
using testing::internal::GetCapturedStderr;

// A sock and what is at its other end.
class SockTest : public testing::Test {
  protected:
    static int pairOfDescriptors(int (&fds)[2]) { return socketpair(AF_UNIX, SOCK_STREAM, 0, fds); }
    SockTest() : paired_(pairOfDescriptors(fds_)), peer_(fds_[1]), sock_(fds_[0]) {}

    void expectFrame(const msg_t& m, std::uint32_t type, std::uint32_t tran, const std::string& data,
                     const std::string& extra) {
        EXPECT_EQ(m.type, type);
        EXPECT_EQ(m.tran, tran);
        EXPECT_EQ(std::string(m.data, static_cast<std::size_t>(m.size)), data);
        EXPECT_EQ(std::string(m.ex_data, static_cast<std::size_t>(m.ex_size)), extra);
        EXPECT_EQ(m.data[m.size], '\0');
        EXPECT_EQ(m.ex_data[m.ex_size], '\0');
    }

    int fds_[2]{-1, -1};
    int paired_;
    Connection peer_;
    sock sock_;
};

Octets text(const std::string& characters) { return {characters.begin(), characters.end()}; }

TEST_F(SockTest, AFrameIsSentAsItsHeaderItsDataAndItsExtraData) {
    std::string data = "abc";
    std::string extra = "defgh";
    const msg_t m{1001, 0x01020304, 3, 5, data.data(), extra.data()};
    EXPECT_EQ(sock_.snd_msg(m), 0);
    const Octets header = peer_.read(16);
    EXPECT_EQ(header, words({1001, 0x01020304, 3, 5}));
    peer_.read(4);  // the sender's own
    EXPECT_EQ(peer_.read(8), text("abcdefgh"));
    EXPECT_FALSE(sock_.failed());
}

TEST_F(SockTest, AFrameWithoutPartsIsItsHeader) {
    EXPECT_EQ(sock_.snd_msg({2000, 0, 0, 0, nullptr, nullptr}), 0);
    EXPECT_EQ(peer_.read(20), words({2000, 0, 0, 0, 0}));
}

TEST_F(SockTest, AFrameWithAPartOutsideTheLimitsIsNotSent) {
    std::string much(102401, 'x');
    for (const auto& [size, extra] : {std::pair{102401, 0}, {0, 102401}, {-1, 0}, {0, -1}})
        EXPECT_EQ(sock_.snd_msg({1001, 0, size, extra, much.data(), much.data()}), -1);
    EXPECT_FALSE(sock_.failed());
    EXPECT_EQ(sock_.snd_msg({7, 8, 0, 0, nullptr, nullptr}), 0);
    EXPECT_EQ(peer_.read(20), words({7, 8, 0, 0, 0}));  // nothing before it
}

TEST_F(SockTest, TheLargestFrameGoesThrough) {
    std::string data(102400, 'd');
    std::string extra(102400, 'e');
    std::thread sender([&] {
        EXPECT_EQ(sock_.snd_msg({1, 2, 102400, 102400, data.data(), extra.data()}), 0);
    });
    sock receiver(peer_.release());
    msg_t m;
    EXPECT_EQ(receiver.get_msg(m), 0);
    expectFrame(m, 1, 2, data, extra);
    free_msg(m);
    sender.join();
}

TEST_F(SockTest, AReceivedFrameOwnsItsPartsWithAZeroOctetBehindEach) {
    peer_.write(words({1002, 42, 3, 2, 0xDEADBEEF}) + text("abcde"));
    msg_t m;
    EXPECT_EQ(sock_.get_msg(m), 0);
    expectFrame(m, 1002, 42, "abc", "de");
    free_msg(m);
    peer_.write(words({2001, 0, 0, 0, 0}));
    EXPECT_EQ(sock_.get_msg(m), 0);
    expectFrame(m, 2001, 0, "", "");
    free_msg(m);
}

TEST_F(SockTest, APeerThatClosesWithinTheHeaderLeavesTheMissingCountAndTheErrorFlag) {
    peer_.write(Octets(10));
    peer_.close();
    char header[20];
    EXPECT_EQ(sock_.readblock(header, 20), 10);
    EXPECT_TRUE(sock_.failed());
    msg_t m;
    EXPECT_EQ(sock_.get_msg(m), -1);
    EXPECT_EQ(m.data, nullptr);
}

TEST_F(SockTest, APeerThatClosesAfterAnyOctetOfAFrameMakesReceivingFail) {
    const Octets frame = words({1001, 0, 3, 2, 0}) + text("abcde");
    for (std::size_t n = 0; n < frame.size(); ++n) {
        ASSERT_EQ(pairOfDescriptors(fds_), 0);
        sock receiver(fds_[0]);
        Connection sender(fds_[1]);
        sender.write({frame.begin(), frame.begin() + static_cast<long>(n)});
        sender.close();
        msg_t m;
        EXPECT_EQ(receiver.get_msg(m), -1) << n;
        EXPECT_TRUE(receiver.failed());
        EXPECT_EQ(m.data != nullptr, n >= 20) << n;
        free_msg(m);
    }
}

TEST_F(SockTest, APartJustAboveTheLimitIsReadAndRefusedAndTheNextFrameIsFound) {
    std::thread sender([&] {
        peer_.write(words({1001, 0, 102401, 1, 0}) + Octets(102402));
        peer_.write(words({1001, 0, 0, 102401, 0}) + Octets(102401));
        peer_.write(words({1003, 5, 0, 0, 0}));
    });
    msg_t m;
    for (int i = 0; i < 2; ++i) {
        EXPECT_EQ(sock_.get_msg(m), -1);
        free_msg(m);
    }
    EXPECT_EQ(sock_.get_msg(m), 0);
    EXPECT_EQ(m.type, 1003U);
    free_msg(m);
    sender.join();
}

TEST_F(SockTest, SizesBeyondReasonEndTheReading) {
    for (const auto& [size, extra] :
         {std::pair{1024001, 0}, {0, 1024001}, {2147483647, 0}, {0, 2147483647}, {-1, 2147483647}}) {
        ASSERT_EQ(pairOfDescriptors(fds_), 0);
        sock receiver(fds_[0]);
        const Connection sender(fds_[1]);
        sender.write(
            words({1001, 0, static_cast<std::uint32_t>(size), static_cast<std::uint32_t>(extra), 0}));
        msg_t m;
        CaptureStderr();
        EXPECT_EQ(receiver.get_msg(m), -1);
        EXPECT_EQ(GetCapturedStderr(), "Unable to allocate memory in get_msg\n");
        EXPECT_EQ(m.data, nullptr);
        EXPECT_EQ(m.ex_data, nullptr);
        EXPECT_EQ(receiver.get_msg(m), -1);
    }
}

TEST_F(SockTest, ANegativeSizeIsAFailedAllocationAndTheNextFrameIsRead) {
    for (const auto& [size, extra] : {std::pair{-1, 0}, {0, -1}, {-1, -1}, {-2147483647 - 1, 0}, {7, -2}}) {
        peer_.write(words({1001, 0, static_cast<std::uint32_t>(size), static_cast<std::uint32_t>(extra), 0}) +
                    words({1003, 5, 2, 0, 0}) + text("ab"));
        msg_t m;
        CaptureStderr();
        EXPECT_EQ(sock_.get_msg(m), -1);
        EXPECT_EQ(GetCapturedStderr(), "Unable to allocate memory in get_msg\n");
        EXPECT_EQ(m.data, nullptr);
        EXPECT_EQ(m.ex_data, nullptr);
        EXPECT_FALSE(sock_.failed());
        ASSERT_EQ(sock_.get_msg(m), 0);
        EXPECT_EQ(m.type, 1003U);
        EXPECT_STREQ(m.data, "ab");
        free_msg(m);
    }
}

TEST_F(SockTest, OnceTheErrorFlagIsSetNoFrameGoesThrough) {
    Connection other(dup(peer_.get()));
    shutdown(sock_.descriptor(), SHUT_RD);
    char octet = 0;
    EXPECT_EQ(sock_.readblock(&octet, 1), 1);
    EXPECT_EQ(sock_.snd_msg({2000, 0, 0, 0, nullptr, nullptr}), -1);
    msg_t m;
    EXPECT_EQ(sock_.get_msg(m), -1);
}

TEST_F(SockTest, WritingToAPeerThatHasGoneFailsAndTheProcessLives) {
    peer_.close();
    EXPECT_LT(sock_.writeblock("abc", 3), 0);
    EXPECT_TRUE(sock_.failed());
    EXPECT_EQ(sock_.snd_msg({2000, 0, 0, 0, nullptr, nullptr}), -1);
}

TEST_F(SockTest, BlocksOfNoLengthReturnTheirLength) {
    EXPECT_EQ(sock_.readblock(nullptr, 0), 0);
    EXPECT_EQ(sock_.readblock(nullptr, -3), -3);
    EXPECT_EQ(sock_.writeblock(nullptr, 0), 0);
    EXPECT_EQ(sock_.writeblock(nullptr, -3), -3);
}

TEST_F(SockTest, WaitsForReadingWritingOrAnExceptionAsTheModeSays) {
    EXPECT_EQ(sock_.ready(0, 0), 0);
    EXPECT_EQ(sock_.ready('r', 0, 1000), 0);
    EXPECT_EQ(sock_.ready('w', 0, 0), 1);
    EXPECT_EQ(sock_.ready('w', -1, -1), 1);
    EXPECT_EQ(sock_.ready('e', 0, 0), 0);
    EXPECT_EQ(sock_.ready('?', -1, -1), 1);
    peer_.write({1});
    EXPECT_EQ(sock_.ready('r', -1, -1), 1);
    EXPECT_EQ(sock_.ready(0, 0), 1);
}

TEST_F(SockTest, ADescriptorThatCannotBeWaitedForCountsAsReady) {
    EXPECT_EQ(sock_.ready('r', -2, 0), 1);
    sock nothing(-1);
    EXPECT_EQ(nothing.ready('r', -1, -1), 1);
    CaptureStderr();
    nothing.close();
    EXPECT_EQ(GetCapturedStderr(), "Unable to flush socket data, socket may remain open on -1\n");
}

TEST_F(SockTest, DescriptorsBeyondAThousandAreWaitedForToo) {
    rlimit limit{};
    getrlimit(RLIMIT_NOFILE, &limit);
    if (limit.rlim_max < 2100)
        GTEST_SKIP() << "this machine allows no more";
    const rlimit more{2100, limit.rlim_max};
    setrlimit(RLIMIT_NOFILE, &more);
    {
        sock high(fcntl(sock_.descriptor(), F_DUPFD, 2000));
        ASSERT_GE(high.descriptor(), 2000);
        EXPECT_EQ(high.ready(0, 0), 0);
        peer_.write({1});
        EXPECT_EQ(high.ready(0, 0), 1);
    }
    setrlimit(RLIMIT_NOFILE, &limit);
}

class SockOverTcp : public testing::Test {
  protected:
    tcp::Listener listener_;
};

TEST_F(SockOverTcp, AnAddressAndAPortAreKeptInNetworkOrder) {
    const sock it(inet_addr("1.2.3.4"), 6554);
    EXPECT_EQ(it.address().sin_family, AF_INET);
    EXPECT_EQ(it.address().sin_port, htons(6554));
    EXPECT_EQ(it.address().sin_addr.s_addr, inet_addr("1.2.3.4"));
    EXPECT_FALSE(it.failed());
}

TEST_F(SockOverTcp, APortInTheHostTextComesBeforeTheArgument) {
    constexpr struct {
        const char* host;
        int port;
    } cases[] = {{"127.0.0.1", 6554},        {"127.0.0.1:7000", 7000},   {"localhost:7000", 7000},
                 {"127.0.0.1:1:7000", 7000}, {"127.0.0.1:0x1b58", 7000}, {"127.0.0.1:", 0}};
    for (const auto& each : cases) {
        const sock it(each.host, 6554);
        EXPECT_EQ(ntohs(it.address().sin_port), each.port) << each.host;
        EXPECT_EQ(it.address().sin_addr.s_addr, htonl(INADDR_LOOPBACK)) << each.host;
        EXPECT_FALSE(it.failed());
    }
}

TEST_F(SockOverTcp, AHostTextWithAPortConnectsThere) {
    for (const char* name : {"127.0.0.1", "localhost"}) {
        sock it(listener_.host(name).c_str(), 1);
        EXPECT_EQ(it.connect(), 0);
        const Connection peer = listener_.accept();
        EXPECT_EQ(it.writeblock("hello", 5), 0);
        EXPECT_EQ(peer.read(5), text("hello"));
    }
}

TEST_F(SockOverTcp, ANameThatNobodyKnowsLeavesNoSocket) {
    const sock it("no such name:7000", 6554);
    EXPECT_TRUE(it.failed());
    EXPECT_EQ(it.descriptor(), 0);
}

TEST_F(SockOverTcp, AConnectionThatIsRefusedSetsTheErrorFlag) {
    sock it(inet_addr("127.0.0.1"), 1);
    EXPECT_LT(it.connect(), 0);
    EXPECT_TRUE(it.failed());
}

TEST_F(SockOverTcp, ClosingDropsWhatWasNotSentAndResetsTheConnection) {
    sock it(inet_addr("127.0.0.1"), listener_.port());
    it.connect();
    const Connection peer = listener_.accept();
    EXPECT_EQ(it.close(), 0);
    EXPECT_EQ(it.descriptor(), 0);
    char octet = 0;
    EXPECT_EQ(recv(peer.get(), &octet, 1, 0), -1);
    EXPECT_EQ(errno, ECONNRESET);
}

TEST_F(SockOverTcp, AFailedConnectionIsClosedPlainly) {
    const int peer = [&] {
        sock it(inet_addr("127.0.0.1"), listener_.port());
        it.connect();
        const int accepted = listener_.accept().release();
        shutdown(it.descriptor(), SHUT_RD);
        char octet = 0;
        it.readblock(&octet, 1);
        EXPECT_TRUE(it.failed());
        return accepted;
    }();
    char octet = 0;
    EXPECT_EQ(recv(Connection(peer).get(), &octet, 1, 0), 0);  // an orderly end
}

TEST_F(SockOverTcp, ItListensAndAcceptsToo) {
    sock server(htonl(INADDR_LOOPBACK), 0);
    ASSERT_EQ(server.bind(), 0);
    ASSERT_EQ(server.listen(5), 0);
    sockaddr_in bound{};
    socklen_t size = sizeof bound;
    getsockname(server.descriptor(), reinterpret_cast<sockaddr*>(&bound), &size);
    const Connection first = Connection::to(ntohs(bound.sin_port));
    sockaddr_in from{};
    const int fd = server.accept(from);
    sock accepted(fd, from);
    EXPECT_EQ(accepted.address().sin_addr.s_addr, htonl(INADDR_LOOPBACK));
    EXPECT_NE(accepted.address().sin_port, 0);
    const Connection second = Connection::to(ntohs(bound.sin_port));
    const Connection other(server.accept());
    second.write({7});
    EXPECT_EQ(other.read(1), Octets{7});
    EXPECT_EQ(accepted.shutdown(SHUT_WR), 0);
    EXPECT_TRUE(first.ends());
}

TEST(Sock, ANewOneHasNoSocketAndNoError) {
    const sock it;
    EXPECT_FALSE(it.failed());
    EXPECT_EQ(it.descriptor(), 0);
}

}  // namespace
