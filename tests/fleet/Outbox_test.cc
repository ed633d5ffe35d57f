#include "fleet/ship/Outbox.h"

#include <gtest/gtest.h>

#include <string>

#include "FakeCarrier.h"
#include "fleet/Nats.h"

namespace {

using namespace std::chrono_literals;
using fleet::Outbox;
using fleet::OutboxRules;
using fleet::Parcel;
using fleet_tests::FakeCarrier;

class OutboxTest : public testing::Test {
  protected:
    static Parcel parcel(std::uint64_t first, std::size_t frames = 1) {
        Parcel made;
        made.address = {"s", "h", "b", "d"};
        made.run = 7;
        made.first = first;
        made.frames.resize(frames);
        for (fleet::ParcelFrame& frame : made.frames)
            frame.item.time = 1;
        return made;
    }

    // So that nothing is sent again for want of time.
    static OutboxRules patient() {
        OutboxRules rules;
        rules.patience = rules.pause = std::chrono::hours(1);
        return rules;
    }
    static OutboxRules impatient() {
        OutboxRules rules;
        rules.patience = rules.pause = 0ms;
        return rules;
    }

    Outbox outbox(const OutboxRules& rules) {
        return {rules, [this](std::size_t dChannel, const fleet::SafeUpTo& upTo) {
                    safe_ += std::to_string(dChannel) + ":" + std::to_string(upTo.next) + ";";
                }};
    }

    FakeCarrier carrier_;
    std::string safe_;
};

TEST_F(OutboxTest, WhatIsAnsweredIsSafe) {
    Outbox outbox = this->outbox(patient());
    outbox.add(0, parcel(1, 3));
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(carrier_.sent, "1/3;");
    EXPECT_EQ(safe_, "");
    carrier_.accept(carrier_.tokens[0]);
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(safe_, "0:4;");
    EXPECT_TRUE(outbox.isEmpty());
    EXPECT_EQ(outbox.figures().kept, 1U);
}

TEST_F(OutboxTest, AParcelIsSafeWhenThoseOfItsDChannelBeforeItAre) {
    Outbox outbox = this->outbox(patient());
    outbox.add(0, parcel(1));
    outbox.add(0, parcel(2));
    outbox.add(1, parcel(1));
    outbox.pump(carrier_, 0ms);
    carrier_.accept(carrier_.tokens[1]);
    carrier_.accept(carrier_.tokens[2]);
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(safe_, "1:2;");
    EXPECT_EQ(outbox.waiting(0), 2U);
    carrier_.accept(carrier_.tokens[0]);
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(safe_, "1:2;0:3;");
}

TEST_F(OutboxTest, WhatIsNotAnsweredInTimeIsSentAgain) {
    Outbox outbox = this->outbox(impatient());
    outbox.add(0, parcel(1));
    outbox.pump(carrier_, 0ms);
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(carrier_.sent, "1/1;1/1;");
    EXPECT_EQ(outbox.figures().unanswered, 1U);
    // Both answers may come.
    carrier_.accept(carrier_.tokens[0]);
    carrier_.accept(carrier_.tokens[1]);
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(safe_, "0:2;");
    EXPECT_TRUE(outbox.isEmpty());
}

TEST_F(OutboxTest, WhatIsRefusedIsSentAgainAndTheRefusalIsTold) {
    Outbox outbox = this->outbox(impatient());
    outbox.add(0, parcel(1));
    outbox.pump(carrier_, 0ms);
    carrier_.refuse(carrier_.tokens[0]);
    outbox.pump(carrier_, 0ms);
    EXPECT_TRUE(outbox.figures().isFull);
    EXPECT_EQ(outbox.figures().refusal, "maximum bytes exceeded");
    EXPECT_EQ(safe_, "");
    outbox.pump(carrier_, 0ms);
    carrier_.accept(carrier_.tokens[0]);
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(safe_, "0:2;");
    EXPECT_EQ(outbox.figures().refusal, "");
}

TEST_F(OutboxTest, AnAnswerThatNamesNoParcelOrAnUnknownOneChangesNothing) {
    Outbox outbox = this->outbox(patient());
    outbox.add(0, parcel(1));
    outbox.pump(carrier_, 0ms);
    carrier_.answers.push_back({std::nullopt, false, false, false, "nobody"});
    carrier_.accept(999);
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(safe_, "");
    EXPECT_EQ(outbox.waiting(0), 1U);
}

TEST_F(OutboxTest, WithANewConnectionEverythingIsSentAgain) {
    Outbox outbox = this->outbox(patient());
    outbox.add(0, parcel(1));
    outbox.add(0, parcel(2));
    carrier_.isDown = true;
    EXPECT_THROW(outbox.pump(carrier_, 0ms), fleet::NatsError);
    carrier_.isDown = false;
    outbox.sendAllAgain();
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(carrier_.sent, "1/1;2/1;");
    outbox.sendAllAgain();
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(carrier_.sent, "1/1;2/1;1/1;2/1;");
}

TEST_F(OutboxTest, WhatIsDroppedIsNeitherSentNorSafe) {
    Outbox outbox = this->outbox(impatient());
    outbox.add(0, parcel(1));
    outbox.add(0, parcel(2));
    outbox.add(1, parcel(1));
    outbox.pump(carrier_, 0ms);
    carrier_.accept(carrier_.tokens[1]);
    outbox.pump(carrier_, 0ms);
    outbox.drop(0);
    outbox.drop(7);
    EXPECT_EQ(outbox.waiting(0), 0U);
    carrier_.accept(carrier_.tokens[0]);
    carrier_.sent.clear();
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(carrier_.sent, "1/1;") << "that of the other D channel";
    EXPECT_EQ(safe_, "");
    outbox.add(0, parcel(1));
    outbox.pump(carrier_, 0ms);
    carrier_.accept(carrier_.tokens.back());
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(safe_, "0:2;");
}

TEST_F(OutboxTest, WhatIsDroppedNeedsNoRoom) {
    OutboxRules rules = patient();
    rules.mostOctets = 100;
    Outbox outbox = this->outbox(rules);
    outbox.add(0, parcel(1));
    EXPECT_FALSE(outbox.hasRoom(0));
    outbox.drop(0);
    EXPECT_TRUE(outbox.hasRoom(0));
    EXPECT_TRUE(outbox.isEmpty());
}

TEST_F(OutboxTest, IdsCanBeMadeNew) {
    Outbox outbox = this->outbox(patient());
    outbox.add(0, parcel(1));
    outbox.endIdsWith("~5");
    outbox.add(0, parcel(2));
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(carrier_.sent, "1/1;2/1~5;");
}

TEST_F(OutboxTest, AStreamThatNumbersAsBeforeHasForgottenSomething) {
    Outbox outbox = this->outbox(patient());
    for (std::uint64_t number = 1; number <= 6; ++number)
        outbox.add(0, parcel(number));
    outbox.pump(carrier_, 0ms);
    struct Case {
        std::uint64_t sequence;
        bool isDuplicate;
        std::uint64_t forgotten;  // in all
    };
    std::size_t at = 0;
    for (const Case& each : {Case{200'001, false, 0}, Case{7, true, 0}, Case{0, false, 0},
                             Case{200'001, false, 1}, Case{5, false, 2}, Case{6, false, 2}}) {
        carrier_.answers.push_back(
            {carrier_.tokens[at++], true, each.isDuplicate, false, "", false, each.sequence});
        outbox.pump(carrier_, 0ms);
        EXPECT_EQ(outbox.figures().forgotten, each.forgotten) << at;
    }
    EXPECT_EQ(safe_, "0:2;0:3;0:4;0:5;0:6;0:7;");
}

TEST_F(OutboxTest, ALimitOfTheStreamIsNoFailure) {
    Outbox outbox = this->outbox(patient());
    outbox.add(0, parcel(1));
    outbox.pump(carrier_, 0ms);
    carrier_.refuse(carrier_.tokens[0]);
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(outbox.figures().failures, 0U);
    carrier_.answers.push_back({carrier_.tokens[0], false, false, true, "no space left on device"});
    carrier_.answers.push_back({std::nullopt, false, false, false, "nobody"});
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(outbox.figures().failures, 2U);
    EXPECT_EQ(outbox.figures().refused, 3U);
}

TEST_F(OutboxTest, OnlyWhatIsNewToTheStreamShowsThatItTakesFrames) {
    Outbox outbox = this->outbox(patient());
    outbox.add(0, parcel(1));
    outbox.add(0, parcel(2));
    outbox.pump(carrier_, 0ms);
    const auto never = outbox.newestKept();
    carrier_.answers.push_back({carrier_.tokens[0], true, true, false, ""});
    outbox.pump(carrier_, 0ms);
    EXPECT_EQ(outbox.newestKept(), never);
    carrier_.accept(carrier_.tokens[1]);
    outbox.pump(carrier_, 0ms);
    EXPECT_GT(outbox.newestKept(), never);
}

TEST_F(OutboxTest, ItHasLimitsForOneDChannelForAllAndForOctets) {
    OutboxRules rules = patient();
    rules.most = 3;
    rules.mostOfOne = 2;
    Outbox outbox = this->outbox(rules);
    outbox.add(0, parcel(1));
    outbox.add(0, parcel(2));
    EXPECT_FALSE(outbox.hasRoom(0));
    EXPECT_TRUE(outbox.hasRoom(1));
    outbox.add(1, parcel(1));
    EXPECT_FALSE(outbox.hasRoom(2));
    rules = patient();
    rules.mostOctets = 100;
    Outbox small = this->outbox(rules);
    small.add(0, parcel(1));
    EXPECT_FALSE(small.hasRoom(1));
    small.pump(carrier_, 0ms);
    carrier_.accept(carrier_.tokens[0]);
    small.pump(carrier_, 0ms);
    EXPECT_TRUE(small.hasRoom(1)) << "what is kept needs no room";
}

}  // namespace
