// What the board answers, through the transport: expected octets as they stand on the wire.
#include "tests/softboard/three_channels.h"

namespace softboard {
namespace {

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

TEST_F(BoardTest, WithOnlyTheSubscriptionOrOnlyTheTraceNothingIsSent) {
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

}  // namespace
}  // namespace softboard
