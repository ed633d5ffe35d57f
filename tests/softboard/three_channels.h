// A software board with three D channels, and a host that talks to it through the transport.
#ifndef TESTS_SOFTBOARD_THREE_CHANNELS_H
#define TESTS_SOFTBOARD_THREE_CHANNELS_H

#include <gtest/gtest.h>

#include "softboard/softboard.h"
#include "softboard/wire.h"
#include "tests/softboard/host.h"

namespace softboard {

const Address managers{0, 1, 0, 0, 0};
const Address tsc{0, 1, 1, 0x12, 0};
const Address ccs{1, 1, 1, 0x15, 0};
const Address secondCcs{2, 1, 1, 0x15, 0};
const Address elsewhere{7, 3, 1, 0x15, 0};

const Octets traceOn{10, 0, 0, 0, 1, 0, 0, 0};
const Octets traceOff{10, 0, 0, 0, 0, 0, 0, 0};
const Octets group2{2, 0, 0, 0};

// CompStart {instance, board 1, processor, component 255, node 0}, one attribute: key 0, the type.
inline Octets findBody(uint8_t type, uint8_t processor, uint8_t instance) {
    return {instance, 0, 1, processor, 255, 0, 1, 0, 0, 0, 0, 0, 0, 0, type, 0, 0, 0};
}

// D channels 1 and 2 of board 1, and 7 of board 3; two frames on each.
inline Scenario threeChannels() {
    Scenario scenario = oneChannel({{true, 0, {0x00, 0x01, 0x7f}}, {false, 5, {0x00, 0x01, 0x73}}});
    DChannel channel = scenario.channels.front();
    channel.number = 2;
    channel.protocol = ni2;
    scenario.channels.push_back(channel);
    channel.board = 3;
    channel.number = 7;
    channel.label = 3;
    scenario.channels.push_back(channel);
    return scenario;
}

class BoardTest : public testing::Test {
  protected:
    BoardTest() { reset(threeChannels()); }

    // RetAddr this host, EvtType 2, EvtGroup 0.
    static Octets detectBody(const Host& host) {
        return BodyWriter().address(host.address()).u32(2).u32(0).take();
    }
    void startTrace(const Address& address) {
        EXPECT_EQ(host_.ask(8, address, traceOn).type, 9U);
        EXPECT_EQ(host_.ask(22, address, detectBody(host_)).type, 23U);
    }
    // A command after which nothing else is on its way.
    void expectSilence() { EXPECT_EQ(host_.ask(2, tsc).type, 3U); }

    Host host_;
};

}  // namespace softboard

#endif
