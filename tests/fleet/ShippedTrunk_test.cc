// How the place of a D channel moves, and what is read again from it.
#include "fleet/ship/ShippedTrunk.h"

#include <gtest/gtest.h>

#include <fstream>

#include "FakeCarrier.h"
#include "Recordings.h"

namespace {

using namespace std::chrono_literals;
using fleet::Outbox;
using fleet::ShippedTrunk;

constexpr std::uint64_t run = 1'795'260'333'000'001;

class ShippedTrunkTest : public testing::Test {
  protected:
    ShippedTrunkTest() { dChannel_.head = {{"s", "h", "0", "1"}, "pri1", "", false}; }

    ShippedTrunk& trunk() {
        if (!trunk_) {
            if (dChannel_.log.empty())
                dChannel_.folder = folder_.path();
            trunk_.emplace(dChannel_, 0, folder_.path(), nullptr, [](const std::string&) {});
        }
        return *trunk_;
    }

    // The first number and the count of each parcel that is sent of what is there now. All of them are kept.
    std::string sent() {
        while (trunk().step(outbox_)) {
        }
        carrier_.sent.clear();
        carrier_.tokens.clear();
        outbox_.pump(carrier_, 0ms);
        for (const std::uint64_t token : carrier_.tokens)
            carrier_.accept(token);
        outbox_.pump(carrier_, 0ms);
        return carrier_.sent;
    }

    // The next frame by the place in the file.
    std::uint64_t place() {
        EXPECT_TRUE(trunk().save());
        const auto place = fleet::readPlace(folder_.file("0.1.place.json"));
        return place ? place->next : 0;
    }

    fleet_tests::Folder folder_;
    fleet_tests::Recordings recorder_{folder_.path()};
    fleet_tests::FakeCarrier carrier_;
    fleet::ShippedDChannel dChannel_;
    std::optional<ShippedTrunk> trunk_;
    ShippedTrunk::Clock::time_point now_{1h};
    Outbox outbox_{{}, [this](std::size_t, const fleet::SafeUpTo& upTo) { trunk_->safe(upTo, now_); }};
};

TEST_F(ShippedTrunkTest, ThePlaceStaysBehindWhatWasConfirmedLately) {
    recorder_.begin(run, 1);
    recorder_.frames(10);
    EXPECT_EQ(sent(), "1/10;");
    EXPECT_EQ(place(), 0U);
    now_ += 10s;
    recorder_.frames(5);
    EXPECT_EQ(sent(), "11/5;");
    trunk().settle(now_ - 11s);
    EXPECT_EQ(place(), 0U);
    trunk().settle(now_ - 10s);
    EXPECT_EQ(place(), 11U);
    trunk().settle(now_);
    EXPECT_EQ(place(), 16U);
}

TEST_F(ShippedTrunkTest, GoingBackReadsFromThePlaceOnAndCountsNothingTwice) {
    recorder_.begin(run, 1);
    recorder_.frames(10);
    recorder_.finish();
    recorder_.begin(run, 13);  // two frames are missing
    recorder_.frames(5);
    EXPECT_EQ(sent(), "1/10;0/gap;13/5;");
    trunk().settle(now_);
    EXPECT_EQ(place(), 18U);
    recorder_.frames(3);
    recorder_.finish();
    recorder_.begin(run, 21);
    recorder_.frames(4);
    EXPECT_EQ(sent(), "18/7;");
    EXPECT_TRUE(trunk().goBack(outbox_));
    EXPECT_EQ(sent(), "18/7;");
    EXPECT_EQ(trunk().frames(), 22U);
    EXPECT_EQ(trunk().gaps(), 1U);
    EXPECT_EQ(place(), 18U);
    recorder_.frames(1);
    EXPECT_EQ(sent(), "25/1;");
    EXPECT_EQ(trunk().frames(), 23U);
    trunk().settle(now_);
    EXPECT_EQ(place(), 26U);
}

TEST_F(ShippedTrunkTest, GoingBackForgetsWhatWasNotAnsweredAndWhatWasSafe) {
    recorder_.begin(run, 1);
    recorder_.frames(10);
    sent();
    recorder_.frames(1);
    while (trunk().step(outbox_)) {
    }
    EXPECT_EQ(outbox_.waiting(0), 1U);
    EXPECT_TRUE(trunk().goBack(outbox_));
    EXPECT_EQ(outbox_.waiting(0), 0U);
    trunk().settle(now_);
    EXPECT_EQ(place(), 0U) << "what was safe is in doubt";
    EXPECT_EQ(sent(), "1/11;");
}

TEST_F(ShippedTrunkTest, ALogHasAPlaceThatMovesAtOnceAndIsNotReadAgain) {
    dChannel_.log = folder_.file("x.log");
    std::ofstream(dChannel_.log) << "TX 2026-11-21T11:25:33Z 0001ff01\nTX 2026-11-21T11:25:34Z 0001ff02\n";
    EXPECT_EQ(sent(), "1/2;");
    EXPECT_EQ(place(), 3U);
    EXPECT_FALSE(trunk().goBack(outbox_));
    EXPECT_EQ(sent(), "");
}

}  // namespace
