// How a lane ends, what its owner may say, and the lane of reports.
#include <atomic>
#include <sstream>

#include "tests/vela/lanes.h"

namespace {

using namespace lanes;  // NOLINT(google-build-using-namespace): the words of these tests

using LaneEndTest = LaneTest;

TEST_F(LaneEndTest, TheObjectsEndWaitsForDeliveriesThatWait) {
    traceInto({.atWork = 1});
    sendTraces(0, 20);
    slow_.given(1);
    slow_.letEnd(all);
    end();
    EXPECT_EQ(slow_.given(20).size(), 20U);
}

TEST_F(LaneEndTest, AClosedLaneDropsDeliveriesWithoutCountingThem) {
    traceInto({.atWork = 1});
    sendTraces(0, 3);
    lane_->close();
    sendTraces(3, 3);
    slow_.letEnd(all);
    EXPECT_EQ(slow_.given(3).size(), 3U);
    end();
    EXPECT_EQ(slow_.given(3).size(), 3U);
    EXPECT_EQ(lane_->losses().all(), 0U);
}

TEST_F(LaneEndTest, WaitingDeliveriesCanBeDropped) {
    traceInto({.atWork = 2});
    sendTraces(0, 30);
    slow_.given(2);
    EXPECT_EQ(lane_->discardWaiting(), 28U);
    EXPECT_EQ(lane_->waiting(), 0U);
    slow_.letEnd(all);
    end();
    EXPECT_EQ(slow_.given(2).size(), 2U);
}

// ---- What its owner may say.

class Gated : public Lane {
  public:
    Gated() : Lane({.atWork = 3, .waiting = 5}) {}
    void hold(unsigned int count) {
        held_ = count;
        resume();
    }
    std::atomic<unsigned int> fullTimes{0};
    std::atomic<std::uint64_t> lost{0};

  private:
    unsigned int alsoAtWork() const override { return held_; }
    void full() override { ++fullTimes; }
    void sayLost(std::uint64_t deliveries) override { lost += deliveries; }

    std::atomic<unsigned int> held_{2};
};

TEST_F(LaneEndTest, BodiesThatTheOwnerHoldsCountAsAtWork) {
    const auto gated = std::make_shared<Gated>();
    traceInto(gated);
    sendTraces(0, 4);
    EXPECT_EQ(slow_.given(1).size(), 1U);
    EXPECT_EQ(gated->waiting(), 3U);
    gated->hold(1);
    slow_.given(2);
    EXPECT_EQ(gated->waiting(), 2U);
    gated->hold(3);
    slow_.letEnd(2);
    gated->hold(0);
    slow_.letEnd(all);
    slow_.given(4);
}

TEST_F(LaneEndTest, TheOwnerIsToldOnceThatTheLaneIsFullAndHowManyWereLostWhenItIsEmptyAgain) {
    const auto gated = std::make_shared<Gated>();
    traceInto(gated);
    sendTraces(0, 9);  // one at work, five wait
    EXPECT_EQ(gated->fullTimes, 1U);
    EXPECT_EQ(gated->lost, 0U);
    gated->hold(0);
    slow_.letEnd(all);
    slow_.given(6);
    while (gated->lost == 0)
        std::this_thread::yield();
    EXPECT_EQ(gated->lost, 3U);
}

// ---- Reports of what nobody registered for.

TEST_F(LaneEndTest, ReportsHaveALaneOfTheirOwnWhoseWaitingOnesAreDroppedAtTheEnd) {
    ccs_->asyncUnregisteredEvtGroup(&slow_, &Slow::onMsg, 0);
    for (int i = 0; i < 150; ++i)
        ASSERT_TRUE(sendEvent(1001));
    slow_.given(100);
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, 0);
    ASSERT_TRUE(sendReply());
    EXPECT_EQ(recorder_.entries(1).size(), 1U);
    // The reports that are at work end when the others have been given up.
    class EndsThem : public std::stringbuf {
      public:
        explicit EndsThem(Slow& slow) : slow_(slow) {}
        std::streamsize xsputn(const char* text, std::streamsize size) override {
            slow_.letEnd(all);
            return std::stringbuf::xsputn(text, size);
        }

      private:
        Slow& slow_;
    } said(slow_);
    std::streambuf* const before = std::cerr.rdbuf(&said);
    end();
    std::cerr.rdbuf(before);
    EXPECT_EQ(said.str(), "reports that still waited at the end, lost: 50\n");
    EXPECT_EQ(slow_.given(100).size(), 100U);
}

}  // namespace
