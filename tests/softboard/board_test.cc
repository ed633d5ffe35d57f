// What the board answers, through the transport: expected octets as they stand on the wire.
#include <gtest/gtest.h>

#include "softboard/softboard.h"
#include "tests/softboard/host.h"

namespace softboard {
namespace {

const Address managers{0, 1, 0, 0, 0};
const Address tsc{0, 1, 1, 0x12, 0};
const Address ccs{1, 1, 1, 0x15, 0};

// CompStart {instance, board 1, processor, component 255, node 0}, one attribute: key 0, the type.
Octets findBody(uint8_t type, uint8_t processor, uint16_t instance) {
    return {static_cast<uint8_t>(instance),
            static_cast<uint8_t>(instance >> 8),
            1,
            processor,
            255,
            0,
            1,
            0,
            0,
            0,
            0,
            0,
            0,
            0,
            type,
            0,
            0,
            0};
}

class BoardTest : public testing::Test {
  protected:
    BoardTest() {
        Scenario scenario = oneChannel({{true, 0, {0x00, 0x01, 0x7f}}, {false, 5, {0x00, 0x01, 0x73}}});
        scenario.channels.push_back(scenario.channels.front());
        scenario.channels.back().number = 2;
        scenario.channels.back().protocol = ni2;
        reset(scenario);
    }

    Host host_;
};

TEST_F(BoardTest, TheTelephonyServiceComponentIsFoundOnProcessor1) {
    const Message reply = host_.ask(8388669, managers, findBody(0x12, 1, 0), 10001);
    EXPECT_EQ(reply.type, 8388615U);
    EXPECT_EQ(reply.transaction, 10001U << 8);
    EXPECT_EQ(reply.source, managers);
    EXPECT_EQ(reply.target, host_.address());
    EXPECT_EQ(reply.body, (Octets{0, 0, 1, 1, 0x12, 0}));
}

TEST_F(BoardTest, TheInstanceOfADChannelIsFoundOnAnyProcessorByItsNumber) {
    EXPECT_EQ(host_.ask(8388669, managers, findBody(0x15, 255, 2)).body, (Octets{2, 0, 1, 1, 0x15, 0}));
}

TEST_F(BoardTest, WhatIsNotThereIsAnsweredByAnErrorThatNamesTheCommand) {
    const Message reply = host_.ask(8388669, managers, findBody(0x15, 255, 9));
    EXPECT_EQ(reply.type, 0U);
    EXPECT_EQ(reply.body, (Octets{0x3d, 0x00, 0x80, 0, 4, 0, 0, 0}));
}

TEST_F(BoardTest, Parameter7IsTheProtocolType) {
    const Address second{2, 1, 1, 0x15, 0};
    const Message reply = host_.ask(18, second, {7, 0, 0, 0});
    EXPECT_EQ(reply.type, 19U);
    EXPECT_EQ(reply.source, second);
    EXPECT_EQ(reply.body, (Octets{7, 0, 0, 0, 12, 0, 0, 0, 0, 0, 0, 0}));
}

TEST_F(BoardTest, TraceEventsComeOnceTheSubscriptionStandsAndTheTraceIsOn) {
    EXPECT_EQ(host_.ask(8, ccs, {10, 0, 0, 0, 1, 0, 0, 0}).type, 9U);
    const Address back = host_.address();
    const auto low = static_cast<uint8_t>(back.instance);
    const auto high = static_cast<uint8_t>(back.instance >> 8);
    EXPECT_EQ(host_.ask(22, ccs, {low, high, 0, 0, 0, back.node, 2, 0, 0, 0, 0, 0, 0, 0}).type, 23U);
    const Message sent = host_.read();
    EXPECT_EQ(sent.type, 32U);
    EXPECT_EQ(sent.source, ccs);
    EXPECT_EQ(sent.target, back);
    EXPECT_EQ(sent.body, (Octets{2, 0, 0, 0, 1, 0, 0, 0, 0, 0, 0, 0, 3, 0, 0, 0, 0x00, 0x01, 0x7f}));
    EXPECT_EQ(host_.read().body, (Octets{2, 0, 0, 0, 0, 0, 0, 0, 5, 0, 0, 0, 3, 0, 0, 0, 0x00, 0x01, 0x73}));
    EXPECT_EQ(host_.ask(26, ccs, {2, 0, 0, 0}).type, 27U);
}

}  // namespace
}  // namespace softboard
