// Traces that do not end, and what ends them.
#include "tests/softboard/three_channels.h"

namespace softboard {
namespace {

// Endless frames, as fast as they are read.
class EndlessTest : public BoardTest {
  protected:
    EndlessTest() {
        Scenario scenario = threeChannels();
        for (DChannel& channel : scenario.channels) {
            channel.loop = true;
        }
        reset(scenario);
    }

    // Reads up to the reply.
    void readUntil(Host& host, uint32_t type) {
        while (host.read().type != type) {
        }
    }
};

TEST_F(EndlessTest, ALoopGoesOnWithTheBoardsClockRunning) {
    startTrace(ccs);
    const uint32_t expected[] = {0, 5, 255, 260, 510, 515};
    for (const uint32_t ticks : expected) {
        const Message event = host_.read();
        BodyReader body(event.body);
        body.u32();
        body.u32();
        EXPECT_EQ(body.u32(), ticks);
    }
}

TEST_F(EndlessTest, NoEventFollowsTheReplyToTheCancellation) {
    for (const uint32_t cancel : {26U, 8U}) {
        startTrace(ccs);
        host_.read();
        host_.send(cancel, ccs, cancel == 26 ? group2 : traceOff);
        readUntil(host_, cancel + 1);
        expectSilence();
        host_.ask(8, ccs, traceOff);
        host_.ask(26, ccs, group2);
    }
}

TEST_F(EndlessTest, CancellingAllEventsStopsThem) {
    startTrace(ccs);
    host_.send(30, ccs);
    host_.send(2, ccs);
    readUntil(host_, 3);
    expectSilence();
}

TEST_F(EndlessTest, ACancellationLeavesTheSubscriptionsOfOtherQueues) {
    const Octets list{1, 0, 0, 0, 2, 0, 0, 0};
    startTrace(ccs);
    for (const uint32_t cancel : {26U, 28U, 30U}) {
        Host other;
        other.send(22, ccs, detectBody(other));
        readUntil(other, 23);
        other.send(cancel, ccs, cancel == 28 ? list : group2);
        other.send(2, tsc);
        readUntil(other, 3);
        EXPECT_EQ(other.ask(2, tsc).type, 3U) << cancel;  // no event to it
        for (int i = 0; i < 100; ++i) {
            EXPECT_EQ(host_.read().type, 32U) << cancel;
        }
    }
}

TEST_F(EndlessTest, AQueueThatGoesAwayEndsItsSubscriptions) {
    {
        Host other;
        EXPECT_EQ(other.ask(22, ccs, detectBody(other)).type, 23U);
        other.send(8, ccs, traceOn);
        readUntil(other, 32);
    }
    EXPECT_TRUE(waitForOutstanding(0));
    expectSilence();
}

TEST_F(EndlessTest, AQueueClosedWhileItIsBoundEndsItsSubscriptions) {
    const uint32_t queue = nvQueueOpen();
    NvCompDesc address{};
    nvQueueBind(queue, &address);
    const Octets body = BodyWriter().address(addressOf(address)).u32(2).u32(0).take();
    EXPECT_EQ(host_.ask(22, ccs, body).type, 23U);
    EXPECT_EQ(host_.ask(8, ccs, traceOn).type, 9U);
    EXPECT_TRUE(waitForMessages(32, 1));
    nvQueueClose(queue);
    clearJournal();
    expectSilence();
    EXPECT_EQ(journal().find("EvtDetected"), std::string::npos);
    EXPECT_EQ(host_.ask(22, ccs, detectBody(host_)).type, 23U);
    // From the first frame on.
    EXPECT_EQ(host_.read().body, (Octets{2, 0, 0, 0, 1, 0, 0, 0, 0, 0, 0, 0, 3, 0, 0, 0, 0x00, 0x01, 0x7f}));
}

TEST_F(EndlessTest, FramesThatNobodyHearsAreNotPlayed) {
    const Octets nobody = BodyWriter().address({9, 9, 9, 9, 9}).u32(2).u32(0).take();
    EXPECT_EQ(host_.ask(22, ccs, nobody).type, 23U);
    EXPECT_EQ(host_.ask(8, ccs, traceOn).type, 9U);
    for (int i = 0; i < 50; ++i) {
        expectSilence();
    }
    EXPECT_FALSE(waitForMessages(32, 1, std::chrono::milliseconds(0)));
}

TEST_F(EndlessTest, FramesWaitForAReaderThatFallsBehind) {
    Host other;
    startTrace(ccs);
    EXPECT_TRUE(waitForMessages(32, 64));
    EXPECT_EQ(other.ask(2, tsc).type, 3U);
    EXPECT_EQ(outstanding(), 64U);
    for (int i = 0; i < 100; ++i) {
        EXPECT_EQ(host_.read().type, 32U);
    }
}

TEST_F(EndlessTest, TwoDChannelsPlaySideBySide) {
    Host other;
    EXPECT_EQ(other.ask(22, secondCcs, detectBody(other)).type, 23U);
    other.send(8, secondCcs, traceOn);
    startTrace(ccs);
    for (int i = 0; i < 200; ++i) {
        EXPECT_EQ(host_.read().source, ccs);
        Message event = other.read();
        if (event.type != 32) {
            event = other.read();
        }
        EXPECT_EQ(event.source, secondCcs);
    }
}

TEST_F(EndlessTest, BoardsMayBeReplacedWhileFramesPlay) {
    startTrace(ccs);
    host_.read();
    reset(oneChannel({}));
    host_.send(18, ccs, {10, 0, 0, 0});
    Message reply = host_.read();
    while (reply.type == 32) {
        reply = host_.read();
    }
    EXPECT_EQ(reply.body[4], 0);
}

}  // namespace
}  // namespace softboard
