#include "fleet/Nats.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>
#include <optional>
#include <string>
#include <vector>

#include "NatsServer.h"
#include "fleet/NatsConsumer.h"
#include "fleet/NatsPublisher.h"
#include "fleet/streams.h"
#include "fleet/subjects.h"

namespace {

using namespace std::chrono_literals;
using fleet::ConsumerRules;
using fleet::NatsConnection;
using fleet::NatsConsumer;
using fleet::NatsError;
using fleet::NatsMessage;
using fleet::NatsOptions;
using fleet::NatsPublisher;
using fleet::StreamRules;
using fleet_tests::Certificates;
using fleet_tests::NatsServer;
using testing::EndsWith;
using testing::Not;
using Reason = fleet::NatsError::Reason;

// Long enough for a machine that does much else; nothing waits so long when all is well.
constexpr auto longEnough = 30s;

StreamRules framesStream() {
    StreamRules rules;
    rules.name = fleet::centreStream;
    rules.subjects = {fleet::everySubject};
    return rules;
}

ConsumerRules allFrames() {
    ConsumerRules rules;
    rules.stream = fleet::centreStream;
    rules.durable = "store-7";
    rules.filter = fleet::subjectsOf(7);
    return rules;
}

std::string textsOf(const std::vector<NatsMessage>& messages) {
    std::string all;
    for (const NatsMessage& message : messages)
        all += std::string(message.text()) + ";";
    return all;
}

class Nats : public testing::Test {
  protected:
    Nats() { makeStream(connection, framesStream()); }

    // Sends, and returns the answer.
    NatsPublisher::Answer sent(const std::string& subject, const std::string& text, const std::string& id) {
        publisher.send(subject, text, id, 1001);
        const auto answer = publisher.answer(longEnough);
        EXPECT_TRUE(answer);
        return answer.value_or(NatsPublisher::Answer{});
    }

    NatsServer server;
    NatsConnection connection{server.options()};
    NatsPublisher publisher{connection};
};

TEST_F(Nats, AMessageIsAnsweredWhenTheStreamHasIt) {
    publisher.send("lapd.7.s.h.b.d", "one", "id1", 1001);
    publisher.send("lapd.7.s.h.b.d", "two", "id2", 1002);
    for (const std::uint64_t token : {1001, 1002}) {
        const auto answer = publisher.answer(longEnough);
        ASSERT_TRUE(answer);
        EXPECT_EQ(answer->token, token);
        EXPECT_TRUE(answer->isKept) << answer->error;
        EXPECT_FALSE(answer->isDuplicate);
    }
    EXPECT_EQ(fleet::fillingOf(connection, fleet::centreStream).messages, 2U);
    EXPECT_FALSE(publisher.answer(1ms));
}

TEST_F(Nats, AMessageThatIsSentTwiceIsKeptOnce) {
    EXPECT_FALSE(sent("lapd.7.s.h.b.d", "one", "id1").isDuplicate);
    EXPECT_EQ(sent("lapd.7.s.h.b.d", "two", "id2").sequence, 2U);
    const NatsPublisher::Answer again = sent("lapd.7.s.h.b.d", "one", "id1");
    EXPECT_EQ(again.sequence, 1U);
    EXPECT_TRUE(again.isKept);
    EXPECT_TRUE(again.isDuplicate);
    EXPECT_EQ(fleet::fillingOf(connection, fleet::centreStream).messages, 2U);
}

TEST_F(Nats, ASubjectThatNoStreamTakesIsAnsweredAtOnce) {
    const NatsPublisher::Answer answer = sent("elsewhere", "one", "id1");
    EXPECT_FALSE(answer.isKept);
    EXPECT_FALSE(answer.isAtLimit);
    EXPECT_NE(answer.error, "");
}

TEST_F(Nats, AFullStreamRefusesAndKeepsWhatItHas) {
    StreamRules small = framesStream();
    small.mostOctets = 1000;
    makeStream(connection, small);
    EXPECT_TRUE(sent("lapd.7.s.h.b.d", std::string(600, 'x'), "id1").isKept);
    const NatsPublisher::Answer refused = sent("lapd.7.s.h.b.d", std::string(600, 'y'), "id2");
    EXPECT_FALSE(refused.isKept);
    EXPECT_TRUE(refused.isFull) << refused.error;
    EXPECT_TRUE(refused.isAtLimit) << refused.error;
    EXPECT_EQ(fleet::fillingOf(connection, fleet::centreStream).messages, 1U);
    EXPECT_EQ(fleet::fillingOf(connection, fleet::centreStream).mostOctets, 1000U);
}

TEST_F(Nats, AConsumerGetsItsSubjectsInTheirOrder) {
    for (const std::string text : {"one", "two", "three"})
        connection.publish("lapd.7.s.h.b.d", text, text);
    connection.publish("lapd.8.s.h.b.d", "another partition's", "id4");
    NatsConsumer consumer(connection, allFrames());
    std::vector<NatsMessage> messages = consumer.fetch(2, longEnough);
    ASSERT_EQ(textsOf(messages), "one;two;");
    EXPECT_EQ(messages[1].subject(), "lapd.7.s.h.b.d");
    EXPECT_EQ(messages[1].sequence(), 2U);
    EXPECT_EQ(messages[1].deliveries(), 1U);
    EXPECT_EQ(messages[1].id(), "two");
    EXPECT_GT(messages[1].storedAt(), std::chrono::hours(24 * 365 * 50));
    EXPECT_EQ(consumer.waiting(), 1U);
    EXPECT_EQ(textsOf(consumer.fetch(10, longEnough)), "three;");
    EXPECT_TRUE(consumer.fetch(10, 10ms).empty());
}

TEST_F(Nats, WhatIsAcknowledgedDoesNotComeAgainAndWhatIsGivenBackDoes) {
    for (const std::string text : {"one", "two", "three", "four"})
        connection.publish("lapd.7.s.h.b.d", text, text);
    {
        NatsConsumer consumer(connection, allFrames());
        std::vector<NatsMessage> messages = consumer.fetch(4, longEnough);
        ASSERT_EQ(messages.size(), 4U);
        messages[0].acknowledge();
        messages[1].deliverAgain(0ms);
        messages[2].giveUp();
        messages[3].acknowledgeLater();
    }
    NatsConsumer again(connection, allFrames());
    std::vector<NatsMessage> messages = again.fetch(4, longEnough);
    ASSERT_EQ(textsOf(messages), "two;");
    EXPECT_EQ(messages[0].deliveries(), 2U);
    messages[0].keepWaiting();
    messages[0].acknowledge();
    EXPECT_TRUE(again.fetch(4, 10ms).empty());
}

TEST_F(Nats, AConsumerThatWasDeletedGivesNothingMoreAndTheNextOneGivesAllAgain) {
    for (const std::string text : {"one", "two"})
        connection.publish("lapd.7.s.h.b.d", text, text);
    NatsConsumer first(connection, allFrames());
    for (NatsMessage& message : first.fetch(10, longEnough))
        message.acknowledge();
    EXPECT_EQ(first.waiting(), 0U);
    EXPECT_TRUE(deleteConsumer(connection, fleet::centreStream, "store-7"));
    EXPECT_FALSE(deleteConsumer(connection, fleet::centreStream, "store-7"));
    EXPECT_TRUE(first.fetch(10, 10ms).empty());
    EXPECT_EQ(first.waiting(), std::nullopt);
    NatsConsumer again(connection, allFrames());
    EXPECT_EQ(textsOf(again.fetch(10, longEnough)), "one;two;");
}

TEST_F(Nats, WhatAStreamHasTakenSurvivesAServerThatIsKilled) {
    ASSERT_TRUE(sent("lapd.7.s.h.b.d", "one", "id1").isKept);
    server.kill();
    server.start();
    // A message that is sent while there is no connection waits in the library, or its answer does not come.
    std::optional<NatsPublisher::Answer> answer;
    while (!answer || !answer->isKept) {
        publisher.send("lapd.7.s.h.b.d", "two", "id2", 1002);
        answer = publisher.answer(1s);
    }
    EXPECT_TRUE(connection.isConnected());
    EXPECT_EQ(connection.server(), server.options().servers[0]);
    NatsConsumer consumer(connection, allFrames());
    EXPECT_EQ(textsOf(consumer.fetch(10, longEnough)), "one;two;");
}

TEST_F(Nats, AServerThatIsStartedAnewIsAnotherProcess) {
    const std::string first = connection.serverProcess();
    EXPECT_NE(first, "");
    const NatsConnection second(server.options());
    EXPECT_EQ(second.serverProcess(), first);
    server.kill();
    server.start();
    const NatsConnection third(server.options());
    EXPECT_NE(third.serverProcess(), "");
    EXPECT_NE(third.serverProcess(), first);
}

TEST_F(Nats, AServerThatSaysNothingIsNoAnswer) {
    server.freeze();
    publisher.send("lapd.7.s.h.b.d", "one", "id1", 1001);
    EXPECT_FALSE(publisher.answer(1ms));
    server.thaw();
    EXPECT_TRUE(publisher.answer(longEnough));
}

TEST_F(Nats, AFailureSaysWhy) {
    ConsumerRules rules = allFrames();
    rules.stream = "NONE";
    EXPECT_THROW(NatsConsumer(connection, rules), NatsError);
    EXPECT_THROW(fleet::fillingOf(connection, "NONE"), NatsError);
    EXPECT_THROW(deleteConsumer(connection, "NONE", "store-7"), NatsError);
    EXPECT_THROW(connection.publish("elsewhere", "x", ""), NatsError);
    StreamRules overlapping = framesStream();
    overlapping.name = "OTHER";
    try {
        makeStream(connection, overlapping);
        ADD_FAILURE() << "two streams of the same subjects";
    } catch (const NatsError& error) {
        EXPECT_NE(std::string(error.what()).find("make the stream OTHER"), std::string::npos) << error.what();
    }
}

TEST_F(Nats, AStreamMayFetchFromTheStreamsOfSites) {
    StreamRules centre;
    centre.name = "CENTRE";
    centre.sites = {"london", "leeds"};
    makeStream(connection, centre);
    makeStream(connection, centre);  // gives it the rules that it has
    EXPECT_EQ(fleet::fillingOf(connection, "CENTRE").messages, 0U);
}

NatsError refusal(const NatsOptions& options) {
    try {
        const NatsConnection connection(options);
    } catch (const NatsError& error) {
        return error;
    }
    ADD_FAILURE() << "it was let in";
    return {Reason::other, ""};
}

Reason reasonOfRefusal(const NatsOptions& options) { return refusal(options).reason; }
std::string whyRefused(const NatsOptions& options) { return refusal(options).what(); }

TEST(NatsSecurity, ACertificateOfTheFleetIsLetIn) {
    const NatsServer server(NatsServer::Security::certificates);
    NatsConnection connection(server.options());
    makeStream(connection, framesStream());
    NatsConnection shipper(server.options("shipper"));
    shipper.publish("lapd.7.s.h.b.d", "one", "id1");
    EXPECT_EQ(fleet::fillingOf(connection, fleet::centreStream).messages, 1U);
}

TEST(NatsSecurity, WrongCredentialsAreRefused) {
    const NatsServer server(NatsServer::Security::certificates);
    NatsOptions none = server.options();
    none.certificate = none.key = "";
    reasonOfRefusal(none);
    NatsOptions strangers = server.options();
    strangers.certificate = Certificates::get().strangersFile("store.pem");
    strangers.key = Certificates::get().strangersFile("store.key");
    const std::string hint = "; perhaps the server refuses the certificate: its log says why";
    EXPECT_THAT(whyRefused(strangers), EndsWith(hint));
    // A server's certificate is the fleet's, but names no user.
    NatsOptions servers = server.options("127.0.0.1");
    EXPECT_EQ(reasonOfRefusal(servers), Reason::refused);
    NatsOptions trustingOthers = server.options();
    trustingOthers.authority = Certificates::get().strangersFile("authority.pem");
    EXPECT_EQ(reasonOfRefusal(trustingOthers), Reason::refused);
    EXPECT_THAT(whyRefused(trustingOthers), Not(EndsWith(hint))) << "it is the client that refuses";
    NatsOptions missing = server.options();
    missing.certificate = "/no/such/file";
    EXPECT_THROW(NatsConnection{missing}, NatsError);
}

TEST(NatsSecurity, AShipperMayPublishFramesAndNothingElse) {
    const NatsServer server(NatsServer::Security::certificates);
    NatsConnection connection(server.options());
    makeStream(connection, framesStream());
    NatsOptions options = server.options("shipper");
    options.timeout = 2s;  // nobody answers what is not permitted, so each such request takes this long
    NatsConnection shipper(options);
    EXPECT_THROW(shipper.publish("lapd-dead.7.s.h.b.d", "x", ""), NatsError);
    EXPECT_THROW(makeStream(shipper, framesStream()), NatsError);
    EXPECT_THROW(NatsConsumer(shipper, allFrames()), NatsError);
    shipper.publish("lapd.7.s.h.b.d", "one", "id1");
}

// What the request answers if it is refused, and why; empty if it is permitted.
template <class Request>
std::string refusalOf(Request request) {
    try {
        request();
    } catch (const NatsError& error) {
        return error.reason == Reason::refused ? error.what() : std::string("not refused: ") + error.what();
    }
    return "";
}

TEST(NatsSecurity, AShipperOfASiteMayNotPublishFramesOfAnotherAndIsToldOnceForEachSubject) {
    const NatsServer server(NatsServer::Security::certificates);
    NatsConnection admin(server.options());
    makeStream(admin, framesStream());
    NatsConnection leeds(server.options("leeds"));
    NatsPublisher publisher(leeds);
    for (const std::string subject : {"lapd.7.london.h.b.d", "lapd.7.london.h.b.e"}) {
        publisher.send(subject, "one", "id1", 1001);
        std::optional<NatsPublisher::Answer> answer;
        while (!answer)
            answer = publisher.answer(10ms);
        EXPECT_EQ(answer->token, std::nullopt);
        EXPECT_FALSE(answer->isKept);
        EXPECT_EQ(answer->error, "Permissions Violation for Publish to \"" + subject + "\"");
        EXPECT_FALSE(publisher.answer(10ms));
    }
    publisher.send("lapd.7.leeds.h.b.d", "one", "id1", 1002);
    const auto answer = publisher.answer(longEnough);
    ASSERT_TRUE(answer);
    EXPECT_TRUE(answer->isKept) << answer->error;
}

TEST(NatsSecurity, AStoreMayFetchFramesAndBuryThemAndNothingElse) {
    const NatsServer server(NatsServer::Security::certificates);
    NatsConnection admin(server.options("admin"));
    makeStream(admin, framesStream());
    StreamRules dead;
    dead.name = fleet::deadStream;
    dead.subjects = {fleet::everyDeadSubject};
    makeStream(admin, dead);
    admin.publish("lapd.7.s.h.b.d", "one", "id1");
    NatsOptions options = server.options("store");
    NatsConnection store(options);
    NatsConsumer consumer(store, allFrames());
    std::vector<NatsMessage> messages = consumer.fetch(1, longEnough);
    ASSERT_EQ(textsOf(messages), "one;");
    messages[0].acknowledge();
    EXPECT_EQ(consumer.waiting(), 0U);
    EXPECT_EQ(fleet::fillingOf(store, fleet::centreStream).messages, 1U);
    store.publish("lapd-dead.7.s.h.b.d", "one", "dead/1");
    EXPECT_EQ(store.refusal(), "");

    options.timeout = 2s;  // nobody answers what is not permitted, so each such request takes this long
    NatsConnection bold(options);
    EXPECT_EQ(refusalOf([&] { deleteConsumer(bold, fleet::centreStream, "store-7"); }),
              "cannot delete the consumer store-7 of the stream LAPD: Permissions Violation for Publish to "
              "\"$JS.API.CONSUMER.DELETE.LAPD.store-7\"");
    EXPECT_NE(refusalOf([&] { makeStream(bold, framesStream()); }), "");
    EXPECT_NE(refusalOf([&] { bold.publish("lapd.7.s.h.b.d", "two", ""); }), "");
    EXPECT_EQ(consumer.waiting(), 0U) << "the consumer is still there";
    EXPECT_TRUE(deleteConsumer(admin, fleet::centreStream, "store-7"));
}

TEST(NatsSecurity, WithoutAServerThereIsNoConnection) {
    NatsOptions options;
    {
        const NatsServer server;
        options = server.options();
    }
    options.timeout = 1s;
    EXPECT_EQ(reasonOfRefusal(options), Reason::unreachable);
}

}  // namespace
