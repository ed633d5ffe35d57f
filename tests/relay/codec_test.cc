// Frames, header blocks, networks and the command line.
#include <gmock/gmock.h>
#include <netinet/tcp.h>

#include <algorithm>
#include <cstring>

#include "relay/cidr.h"
#include "relay/command_line.h"
#include "relay/ended.h"
#include "relay/message.h"
#include "relay/stream.h"
#include "tests/support/fake_norv.h"
#include "tests/support/tcp.h"

namespace relay {
namespace {

using tcp::operator+;
using tcp::words;
using testing::HasSubstr;

const Octets block = words({0x5A, 10000, 9, 0, 1, 1, 11, 12, 13, 2, 21, 0x1234, 14, 3});

FrameHeader parse(std::uint32_t dataSize, std::uint32_t extraSize) {
    const Octets octets = words({1001, 7, dataSize, extraSize, 0xDEADBEEF});
    return FrameHeader::parse(std::span<const std::uint8_t, frameHeaderSize>(octets));
}

TEST(RelayFrame, IsAHeaderOfFiveWordsAndItsParts) {
    EXPECT_EQ(encodeFrame(1002, 42, Octets{1, 2}, Octets{3}), words({1002, 42, 2, 1, 0}) + Octets({1, 2, 3}));
    EXPECT_EQ(encodeFrame(2001, 0), words({2001, 0, 0, 0, 0}));
}

TEST(RelayFrame, SizesUpToTheLimitAreTaken) {
    const FrameHeader header = parse(102400, 102400);
    EXPECT_EQ(header.type, 1001U);
    EXPECT_EQ(header.transaction, 7U);
    EXPECT_EQ(header.dataSize, 102400U);
    EXPECT_EQ(header.extraSize, 102400U);
}

TEST(RelayFrame, LargerSizesAndNegativeOnesAreRefused) {
    EXPECT_THROW(parse(102401, 0), Ended);
    EXPECT_THROW(parse(0, 102401), Ended);
    EXPECT_THROW(parse(0xFFFFFFFF, 0), Ended);
    EXPECT_THROW(parse(0, 0x80000000), Ended);
}

class RelayMessage : public testing::Test {
  protected:
    RelayMessage() { fake_norv::reset(); }
    ~RelayMessage() override { EXPECT_EQ(fake_norv::outstanding(), 0U); }

    static Frame frame(const Octets& data, const Octets& extra) {
        return {{1001, 0, static_cast<std::uint32_t>(data.size()), static_cast<std::uint32_t>(extra.size())},
                data,
                extra};
    }
};

TEST_F(RelayMessage, GoesFromItsFrameIntoABufferAndBack) {
    const Message msg = decodeMessage(frame(block, {1, 2, 3}));
    EXPECT_EQ(msg->transaction, 10000U << 8 | 0x5A);
    EXPECT_EQ(msg->type, 9U);
    EXPECT_TRUE(same(sourceOf(*msg), {2, 1, 0, 1, 21, 0, 0}));
    EXPECT_TRUE(same(targetOf(*msg), {0x1234, 12, 0, 13, 14, 11, 0}));
    EXPECT_EQ(msg->size, 3U);
    EXPECT_EQ(encodeMessage(*msg), words({1001, 0, 56, 3, 0}) + block + Octets({1, 2, 3}));
}

TEST_F(RelayMessage, ABlockOfAnotherSizeIsRefused) {
    for (const std::size_t size : {0, 4, 55, 57, 60}) {
        Octets data = block;
        data.resize(size);
        EXPECT_THROW(decodeMessage(frame(data, {1, 2, 3})), Ended) << size;
    }
}

TEST_F(RelayMessage, ABodyOfAnotherSizeThanAnnouncedIsRefused) {
    EXPECT_THROW(decodeMessage(frame(block, {1, 2})), Ended);
    EXPECT_THROW(decodeMessage(frame(block, {1, 2, 3, 4})), Ended);
}

TEST_F(RelayMessage, AWordThatDoesNotFitItsFieldIsRefused) {
    constexpr std::uint32_t most[] = {0xFF, 0xFFFFFF, 0xFFFFFFFF, 0xFF, 0xFF,   0xFF, 0xFF,
                                      0xFF, 0xFF,     0xFFFF,     0xFF, 0xFFFF, 0xFF};
    for (std::size_t i = 0; i < std::size(most); ++i) {
        Octets data = block;
        const Octets fits = words({most[i]});
        std::copy(fits.begin(), fits.end(), data.begin() + 4 * static_cast<long>(i));
        EXPECT_NE(decodeMessage(frame(data, {1, 2, 3})), nullptr) << i;
        if (most[i] == 0xFFFFFFFF)
            continue;
        const Octets exceeds = words({most[i] + 1});
        std::copy(exceeds.begin(), exceeds.end(), data.begin() + 4 * static_cast<long>(i));
        EXPECT_THROW(decodeMessage(frame(data, {1, 2, 3})), Ended) << i;
    }
}

TEST_F(RelayMessage, WithoutMemoryItIsRefused) {
    fake_norv::fail(fake_norv::Op::allocate);
    EXPECT_THROW(decodeMessage(frame(block, {1, 2, 3})), Ended);
}

TEST_F(RelayMessage, AnAddressIsFiveWords) {
    EXPECT_EQ(encodeAddress({5, 2, 0, 3, 4, 1, 0}), words({1, 2, 3, 4, 5}));
}

// A host whose machine has gone is not waited for as long as the system would, idle or not.
TEST(RelayStream, AHostThatDisappearsIsNoticed) {
    const auto option = [](Patience patience, int level, int name) {
        const int fd = ::socket(AF_INET, SOCK_STREAM, 0);
        const Stream stream(Descriptor(fd), patience);
        int value = -1;
        socklen_t size = sizeof value;
        getsockopt(fd, level, name, &value, &size);
        return value;
    };
    EXPECT_EQ(option({}, SOL_SOCKET, SO_KEEPALIVE), 1);
    EXPECT_EQ(option({}, IPPROTO_TCP, TCP_KEEPIDLE), 30);
    EXPECT_EQ(option({}, IPPROTO_TCP, TCP_USER_TIMEOUT), 60000);
    Patience patient;
    patient.write = std::chrono::minutes(5);
    EXPECT_EQ(option(patient, IPPROTO_TCP, TCP_USER_TIMEOUT), 300000);
}

TEST(RelayCidr, ContainsTheAddressesOfItsNetwork) {
    constexpr std::uint32_t address = 0xC0A80117;  // 192.168.1.23
    constexpr struct {
        const char* text;
        bool contains;
    } cases[] = {{"192.168.1.0/24", true},   {"192.168.1.23", true},    {"192.168.1.23/32", true},
                 {"192.168.1.22/32", false}, {"192.168.1.22/31", true}, {"192.168.1.99/24", true},
                 {"0.0.0.0/0", true},        {"128.0.0.0/1", true},     {"0.0.0.0/1", false},
                 {"192.168.2.0/23", false}};
    for (const auto& each : cases) {
        const auto cidr = Cidr::parse(each.text);
        ASSERT_TRUE(cidr) << each.text;
        EXPECT_EQ(cidr->contains(address), each.contains) << each.text;
    }
}

TEST(RelayCidr, OtherTextIsRefused) {
    for (const char* text : {"", "/", "192.168.1.0/", "192.168.1.0/33", "192.168.1.0/-1", "192.168.1/24",
                             "relay/24", "192.168.1.0/24x", "192.168.1.0/24/24", "::1/128"})
        EXPECT_FALSE(Cidr::parse(text)) << text;
}

TEST(RelayEndpoint, HasAPortOrTheDefault) {
    EXPECT_EQ(Endpoint::parse("127.0.0.1:7000", 6554)->text(), "127.0.0.1:7000");
    EXPECT_EQ(Endpoint::parse("10.1.2.3", 6554)->text(), "10.1.2.3:6554");
    EXPECT_EQ(Endpoint::parse("0.0.0.0:0", 6554)->text(), "0.0.0.0:0");
    for (const char* text : {"", ":7000", "127.0.0.1:", "127.0.0.1:65536", "127.0.0.1:-1", "relay:7000",
                             "127.0.0.1:7000:1", "127.0.0.1:1x"})
        EXPECT_FALSE(Endpoint::parse(text, 6554)) << text;
}

CommandLine parsed(std::vector<const char*> arguments) {
    arguments.insert(arguments.begin(), "kv9relayd");
    return parseCommandLine(static_cast<int>(arguments.size()), arguments.data());
}

std::string refusal(const std::vector<const char*>& arguments) {
    try {
        parsed(arguments);
        return "taken";
    } catch (const BadCommandLine& error) {
        return error.what();
    }
}

TEST(RelayCommandLine, ByDefaultItListensForThisMachineAlone) {
    const Options options = parsed({}).options;
    EXPECT_EQ(options.listen.text(), "127.0.0.1:6554");
    EXPECT_TRUE(options.allow.empty());
    EXPECT_EQ(options.maxClients, 128U);
    EXPECT_EQ(options.patience.frame.count(), 10000);
    EXPECT_EQ(options.patience.write.count(), 10000);
}

TEST(RelayCommandLine, OptionsReplaceTheDefaults) {
    const Options options =
        parsed({"--listen", "0.0.0.0:7000", "--allow", "10.0.0.0/8", "--allow", "192.168.1.7",
                "--max-clients", "3", "--frame-timeout", "0.25", "--write-timeout", "2"})
            .options;
    EXPECT_EQ(options.listen.text(), "0.0.0.0:7000");
    ASSERT_EQ(options.allow.size(), 2U);
    EXPECT_EQ(options.allow[1].network, 0xC0A80107U);
    EXPECT_EQ(options.maxClients, 3U);
    EXPECT_EQ(options.patience.frame.count(), 250);
    EXPECT_EQ(options.patience.write.count(), 2000);
}

TEST(RelayCommandLine, AnAddressThatOthersReachIsRefusedWithoutAllow) {
    const std::string said = refusal({"--listen", "0.0.0.0"});
    EXPECT_THAT(said, HasSubstr("--listen 0.0.0.0:6554 would let everyone"));
    EXPECT_THAT(said, HasSubstr("say with --allow CIDR who may"));
    EXPECT_EQ(refusal({"--listen", "127.3.2.1:0"}), "taken");
    EXPECT_EQ(refusal({"--listen", "0.0.0.0", "--allow", "0.0.0.0/0"}), "taken");
}

TEST(RelayCommandLine, AMistakeIsNamed) {
    EXPECT_THAT(refusal({"--listen", "nowhere"}), HasSubstr("--listen nowhere: not an IPv4 address"));
    EXPECT_THAT(refusal({"--allow", "10.0.0.0/40"}), HasSubstr("--allow 10.0.0.0/40: not an IPv4 network"));
    EXPECT_THAT(refusal({"--max-clients", "0"}), HasSubstr("--max-clients"));
    EXPECT_THAT(refusal({"--max-clients", "many"}), HasSubstr("--max-clients"));
    EXPECT_THAT(refusal({"--frame-timeout", "-1"}), HasSubstr("--frame-timeout"));
    EXPECT_THAT(refusal({"--no-such-option"}), HasSubstr("--no-such-option"));
    EXPECT_THAT(refusal({"more"}), HasSubstr("more"));
}

TEST(RelayCommandLine, TimeoutsAreBetweenAMillisecondAndAnHour) {
    for (const std::string option : {"--frame-timeout", "--write-timeout"}) {
        for (const char* bad : {"0", "0.0009", "-1", "3600.1", "1e9", "inf", "nan", "soon", ""})
            EXPECT_THAT(refusal({option.c_str(), bad}), HasSubstr(option)) << bad;
        for (const char* good : {"0.001", "3600"})
            EXPECT_EQ(refusal({option.c_str(), good}), "taken") << good;
    }
    EXPECT_EQ(parsed({"--frame-timeout", "0.001"}).options.patience.frame.count(), 1);
    EXPECT_EQ(parsed({"--write-timeout", "3600"}).options.patience.write.count(), 3600000);
}

TEST(RelayCommandLine, HelpAndVersionArePrinted) {
    EXPECT_THAT(parsed({"--help"}).told, HasSubstr("--allow CIDR"));
    EXPECT_THAT(parsed({"--help"}).told, HasSubstr("ssh -N -L 6554:127.0.0.1:6554"));
    EXPECT_THAT(parsed({"--version"}).told, testing::MatchesRegex("kv9relayd [0-9.]+\n"));
}

}  // namespace
}  // namespace relay
