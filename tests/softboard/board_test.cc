// What the board answers, through the transport: expected octets as they stand on the wire.
#include <gtest/gtest.h>

#include "softboard/softboard.h"
#include "softboard/wire.h"
#include "tests/softboard/host.h"

namespace softboard {
namespace {

const Address managers{0, 1, 0, 0, 0};
const Address tsc{0, 1, 1, 0x12, 0};
const Address ccs{1, 1, 1, 0x15, 0};
const Address secondCcs{2, 1, 1, 0x15, 0};
const Address elsewhere{7, 3, 1, 0x15, 0};

const Octets traceOn{10, 0, 0, 0, 1, 0, 0, 0};
const Octets traceOff{10, 0, 0, 0, 0, 0, 0, 0};
const Octets group2{2, 0, 0, 0};

// CompStart {instance, board 1, processor, component 255, node 0}, one attribute: key 0, the type.
Octets findBody(uint8_t type, uint8_t processor, uint8_t instance) {
    return {instance, 0, 1, processor, 255, 0, 1, 0, 0, 0, 0, 0, 0, 0, type, 0, 0, 0};
}

// D channels 1 and 2 of board 1, and 7 of board 3; two frames on each.
Scenario threeChannels() {
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

TEST_F(BoardTest, WithoutAttributesTheFirstComponentIsFound) {
    const Octets body{0, 0, 1, 255, 255, 0, 0, 0, 0, 0};
    EXPECT_EQ(host_.ask(8388669, managers, body).body, (Octets{0, 0, 1, 1, 0x12, 0}));
}

TEST_F(BoardTest, AMissingComponentIsAnsweredByAnErrorThatNamesTheCommand) {
    struct {
        const char* says;
        Octets body;
    } const cases[] = {
        {"no such D channel", findBody(0x15, 255, 9)},           {"no such type", findBody(0x16, 255, 1)},
        {"not on that processor", findBody(0x12, 2, 0)},         {"D channel 0", findBody(0x15, 255, 0)},
        {"another board's", {7, 0, 3, 255, 255, 0, 0, 0, 0, 0}},
    };
    for (const auto& c : cases) {
        const Message reply = host_.ask(8388669, managers, c.body);
        EXPECT_EQ(reply.type, 0U) << c.says;
        EXPECT_EQ(reply.body, (Octets{0x3d, 0x00, 0x80, 0, 4, 0, 0, 0})) << c.says;
    }
}

TEST_F(BoardTest, ASearchThatEndsEarlyIsAnError) {
    Octets body = findBody(0x12, 1, 0);
    body.resize(13);
    EXPECT_EQ(host_.ask(8388669, managers, body).body, (Octets{0x3d, 0x00, 0x80, 0, 6, 0, 0, 0}));
    // A count that promises four thousand million attributes.
    EXPECT_EQ(host_.ask(8388669, managers, {0, 0, 1, 1, 255, 0, 255, 255, 255, 255}).type, 0U);
}

// From one address to another of board 1, with one attribute: key 0, the type.
Octets findAllBody(const Octets& from, const Octets& to, uint8_t type) {
    Octets body = from;
    body.insert(body.end(), to.begin(), to.end());
    for (const uint8_t octet : {1, 0, 0, 0, 0, 0, 0, 0, +type, 0, 0, 0}) {
        body.push_back(octet);
    }
    return body;
}

TEST_F(BoardTest, AllComponentsBetweenTwoAddressesAreListedInOrder) {
    const Octets everything{0, 0, 1, 0, 0, 0, 0xff, 0xff, 1, 0xff, 0xff, 0, 0, 0, 0, 0};
    const Message all = host_.ask(8388706, managers, everything);
    EXPECT_EQ(all.type, 8388707U);
    // Three, none after them, each with its address and type.
    EXPECT_EQ(all.body, (Octets{3, 0, 0, 0, 0,    0, 0, 0, 0, 0,                 //
                                0, 0, 1, 1, 0x12, 0, 0, 0, 0, 0, 0x12, 0, 0, 0,  //
                                1, 0, 1, 1, 0x15, 0, 0, 0, 0, 0, 0x15, 0, 0, 0,  //
                                2, 0, 1, 1, 0x15, 0, 0, 0, 0, 0, 0x15, 0, 0, 0}));
    const Octets from{2, 0, 1, 1, 0x15, 0}, to{0xff, 0xff, 1, 0xff, 0xff, 0};
    EXPECT_EQ(host_.ask(8388706, managers, findAllBody(from, to, 0x15)).body,
              (Octets{1, 0, 0, 0, 0, 0, 0, 0, 0, 0, 2, 0, 1, 1, 0x15, 0, 0, 0, 0, 0, 0x15, 0, 0, 0}));
    EXPECT_EQ(host_.ask(8388706, managers, findAllBody(from, to, 0x12)).body, Octets(10, 0));
    EXPECT_EQ(host_.ask(8388706, managers, {0, 0, 1}).type, 0U);
}

TEST_F(BoardTest, AListThatDoesNotHoldAllNamesTheNextComponent) {
    Scenario scenario = oneChannel({});
    for (uint16_t number = 2; number < 10; ++number) {
        scenario.channels.push_back(scenario.channels.front());
        scenario.channels.back().number = number;
    }
    reset(scenario);
    const Message first =
        host_.ask(8388706, managers, {0, 0, 1, 0, 0, 0, 0xff, 0xff, 1, 0xff, 0xff, 0, 0, 0, 0, 0});
    EXPECT_EQ(first.body.size(), 4U + 6 + 8 * 14);
    EXPECT_EQ(Octets(first.body.begin(), first.body.begin() + 10), (Octets{8, 0, 0, 0, 8, 0, 1, 1, 0x15, 0}));
    const Message rest =
        host_.ask(8388706, managers, {8, 0, 1, 1, 0x15, 0, 0xff, 0xff, 1, 0xff, 0xff, 0, 0, 0, 0, 0});
    EXPECT_EQ(Octets(rest.body.begin(), rest.body.begin() + 12),
              (Octets{2, 0, 0, 0, 0, 0, 0, 0, 0, 0, 8, 0}));
}

TEST_F(BoardTest, AComponentHasItsTypeForAnAttribute) {
    const Message reply = host_.ask(8388666, managers, {1, 0, 1, 1, 0x15, 0, 5, 0, 0, 0, 0, 0, 0, 0});
    EXPECT_EQ(reply.type, 8388614U);
    EXPECT_EQ(reply.body, (Octets{1, 0, 1, 1, 0x15, 0, 1, 0, 0, 0, 0, 0, 0, 0, 0x15, 0, 0, 0}));
    EXPECT_EQ(host_.ask(8388666, managers, {1, 0, 1, 1, 0x15, 0, 5, 0, 0, 0, 1, 0, 0, 0}).body,
              (Octets{1, 0, 1, 1, 0x15, 0, 0, 0, 0, 0}))
        << "from the second on";
    EXPECT_EQ(host_.ask(8388666, managers, {9, 0, 1, 1, 0x15, 0, 5, 0, 0, 0, 0, 0, 0, 0}).type, 0U);
    EXPECT_EQ(host_.ask(8388666, managers, {1, 0}).type, 0U);
}

TEST_F(BoardTest, EachBoardHasManagersOfItsOwn) {
    const Message reply = host_.ask(8388669, {0, 3, 0, 0, 0}, {7, 0, 3, 255, 255, 0, 0, 0, 0, 0});
    EXPECT_EQ(reply.body, (Octets{7, 0, 3, 1, 0x15, 0}));
}

TEST_F(BoardTest, ABoardThatIsNotThereDoesNotAnswer) {
    host_.send(8388669, {0, 2, 0, 0, 0}, findBody(0x12, 1, 0));
    expectSilence();
    EXPECT_EQ(heard(),
              "8388669 {CompStart 0/1/1/255/0 attr [0=18]}\n"
              "2 {}\n");
}

TEST_F(BoardTest, Parameter7IsTheProtocolType) {
    const Message reply = host_.ask(18, secondCcs, {7, 0, 0, 0});
    EXPECT_EQ(reply.type, 19U);
    EXPECT_EQ(reply.source, secondCcs);
    EXPECT_EQ(reply.body, (Octets{7, 0, 0, 0, 12, 0, 0, 0, 0, 0, 0, 0}));
}

TEST_F(BoardTest, Parameter10IsWhatWasSet) {
    EXPECT_EQ(host_.ask(18, ccs, {10, 0, 0, 0}).body, (Octets{10, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0}));
    const Message reply = host_.ask(8, ccs, traceOn);
    EXPECT_EQ(reply.type, 9U);
    EXPECT_TRUE(reply.body.empty());
    EXPECT_EQ(host_.ask(18, ccs, {10, 0, 0, 0}).body, (Octets{10, 0, 0, 0, 1, 0, 0, 0, 0, 0, 0, 0}));
}

TEST_F(BoardTest, AParameterCommandThatIsRefusedNamesParameterAndValue) {
    struct {
        const char* says;
        uint32_t type;
        Octets body;
        Octets error;
    } const cases[] = {
        {"an unknown parameter is set",
         8,
         {99, 0, 0, 0, 5, 0, 0, 0},
         {8, 0, 0, 0, 2, 0, 0, 0, 99, 0, 0, 0, 5, 0, 0, 0}},
        {"an unknown parameter is asked for",
         18,
         {99, 0, 0, 0},
         {18, 0, 0, 0, 2, 0, 0, 0, 99, 0, 0, 0, 0, 0, 0, 0}},
        {"the protocol cannot be set",
         8,
         {7, 0, 0, 0, 1, 0, 0, 0},
         {8, 0, 0, 0, 3, 0, 0, 0, 7, 0, 0, 0, 1, 0, 0, 0}},
        {"the trace is on or off",
         8,
         {10, 0, 0, 0, 2, 0, 0, 0},
         {8, 0, 0, 0, 3, 0, 0, 0, 10, 0, 0, 0, 2, 0, 0, 0}},
        {"the value is missing", 8, {10, 0, 0, 0}, {8, 0, 0, 0, 6, 0, 0, 0, 10, 0, 0, 0, 0, 0, 0, 0}},
    };
    for (const auto& c : cases) {
        const Message reply = host_.ask(c.type, ccs, c.body);
        EXPECT_EQ(reply.type, 0U) << c.says;
        EXPECT_EQ(reply.body, c.error) << c.says;
    }
}

TEST_F(BoardTest, PlainCommandsAreAcknowledged) {
    struct {
        uint32_t type;
        uint32_t reply;
        Address target;
    } const cases[] = {
        {2, 3, ccs},
        {2, 3, managers},
        {4, 5, tsc},
        {6, 7, tsc},
        {24, 25, ccs},
        {26, 27, ccs},
        {28, 29, ccs},
        {8388673, 8388608, managers},
        {8388697, 8388608, managers},
        {8388697, 8388608, ccs},
        {8388698, 8388608, managers},
    };
    for (const auto& c : cases) {
        const Message reply = host_.ask(c.type, c.target, Octets(16, 0));
        EXPECT_EQ(reply.type, c.reply) << c.type;
        EXPECT_EQ(reply.source, c.target) << c.type;
        EXPECT_TRUE(reply.body.empty()) << c.type;
    }
}

TEST_F(BoardTest, AnInstanceIsAllocatedLikeItIsFound) {
    const Octets body{2, 0, 1, 255, 255, 0, 0, 0, 0, 0, 0, 0, 1, 0, 0, 0, 0, 0, 0, 0, 0x15, 0, 0, 0};
    const Message reply = host_.ask(8388670, managers, body);
    EXPECT_EQ(reply.type, 8388615U);
    EXPECT_EQ(reply.body, (Octets{2, 0, 1, 1, 0x15, 0}));
}

TEST_F(BoardTest, SomeCommandsHaveNoReply) {
    for (const uint32_t type : {0U, 1U, 30U, 5376U}) {
        host_.send(type, ccs, {1, 2, 3});
    }
    expectSilence();
}

TEST_F(BoardTest, AnUnknownCommandIsAnsweredByAnError) {
    EXPECT_EQ(host_.ask(4616, ccs).body, (Octets{0x08, 0x12, 0, 0, 1, 0, 0, 0}));
    EXPECT_EQ(host_.ask(18, managers, {7, 0, 0, 0}).body, (Octets{18, 0, 0, 0, 1, 0, 0, 0}));
    EXPECT_EQ(host_.ask(18, {9, 1, 1, 0x15, 0}, {7, 0, 0, 0}).body, (Octets{18, 0, 0, 0, 5, 0, 0, 0}));
    EXPECT_EQ(host_.ask(22, ccs, {1, 0, 0}).body, (Octets{22, 0, 0, 0, 6, 0, 0, 0}));
    EXPECT_EQ(host_.ask(26, ccs, {2}).body, (Octets{26, 0, 0, 0, 6, 0, 0, 0}));
    EXPECT_EQ(host_.ask(28, ccs, {2, 0, 0, 0, 1, 0, 0, 0}).body, (Octets{28, 0, 0, 0, 6, 0, 0, 0}));
}

TEST_F(BoardTest, TraceEventsComeOnceTheSubscriptionStandsAndTheTraceIsOn) {
    startTrace(ccs);
    const Message sent = host_.read();
    EXPECT_EQ(sent.type, 32U);
    EXPECT_EQ(sent.source, ccs);
    EXPECT_EQ(sent.target, host_.address());
    EXPECT_EQ(sent.body, (Octets{2, 0, 0, 0, 1, 0, 0, 0, 0, 0, 0, 0, 3, 0, 0, 0, 0x00, 0x01, 0x7f}));
    EXPECT_EQ(host_.read().body, (Octets{2, 0, 0, 0, 0, 0, 0, 0, 5, 0, 0, 0, 3, 0, 0, 0, 0x00, 0x01, 0x73}));
    EXPECT_EQ(host_.ask(26, ccs, group2).type, 27U);
}

TEST_F(BoardTest, TheOrderOfSubscriptionAndTraceDoesNotMatter) {
    EXPECT_EQ(host_.ask(22, ccs, detectBody(host_)).type, 23U);
    EXPECT_EQ(host_.ask(8, ccs, traceOn).type, 9U);
    EXPECT_EQ(host_.read().type, 32U);
    EXPECT_EQ(host_.read().type, 32U);
}

TEST_F(BoardTest, ASubscriptionOrTheTraceAloneSendsNothing) {
    EXPECT_EQ(host_.ask(8, ccs, traceOn).type, 9U);
    EXPECT_EQ(host_.ask(22, secondCcs, detectBody(host_)).type, 23U);
    const Octets anotherGroup = BodyWriter().address(host_.address()).u32(3).u32(2).take();
    EXPECT_EQ(host_.ask(22, ccs, anotherGroup).type, 23U);
    expectSilence();
}

TEST_F(BoardTest, AListOfSubscriptionsStartsTheTraceToo) {
    EXPECT_EQ(host_.ask(8, ccs, traceOn).type, 9U);
    const Octets body = BodyWriter().address(host_.address()).u32(2).u32(1).u32(0).u32(2).u32(0).take();
    EXPECT_EQ(host_.ask(24, ccs, body).type, 25U);
    EXPECT_EQ(host_.read().type, 32U);
    EXPECT_EQ(host_.read().type, 32U);
}

TEST_F(BoardTest, TheFramesPlayOnceAndAgainAfterTheTraceWasOff) {
    startTrace(ccs);
    const Octets first = host_.read().body;
    host_.read();
    EXPECT_EQ(host_.ask(18, ccs, {10, 0, 0, 0}).type, 19U);  // another command does not start them again
    expectSilence();
    EXPECT_EQ(host_.ask(8, ccs, traceOff).type, 9U);
    EXPECT_EQ(host_.ask(8, ccs, traceOn).type, 9U);
    EXPECT_EQ(host_.read().body, first);
    host_.read();
}

TEST_F(BoardTest, TheLabelOfTheEventsIsTheScenarios) {
    startTrace(elsewhere);
    EXPECT_EQ(host_.read().body[0], 3);
    EXPECT_EQ(host_.read().body[0], 3);
}

TEST_F(BoardTest, EverySubscriberGetsEveryFrame) {
    Host other;
    EXPECT_EQ(other.ask(22, ccs, detectBody(other)).type, 23U);
    EXPECT_EQ(host_.ask(22, ccs, detectBody(host_)).type, 23U);
    EXPECT_EQ(host_.ask(8, ccs, traceOn).type, 9U);
    for (Host* host : {&host_, &other}) {
        EXPECT_EQ(host->read().type, 32U);
        EXPECT_EQ(host->read().type, 32U);
    }
}

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
