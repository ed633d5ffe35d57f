#include "softboard/player.h"

#include <gtest/gtest.h>

namespace softboard {
namespace {

using std::chrono::milliseconds;

const auto frames =
    std::make_shared<const Frames>(Frames{{true, 10, {1}}, {false, 12, {2}}, {true, 62, {3}}});
const Player::Time now{std::chrono::hours(1)};

TEST(PlayerTest, AtRecordedRateAFrameIsDueWhenItsTicksOfFourMillisecondsHavePassed) {
    Player player(frames, {Rate::Kind::recorded, 0}, false);
    player.start(now);
    EXPECT_EQ(player.due(), now + milliseconds(40));
    EXPECT_EQ(player.next(now).ticks, 10U);
    EXPECT_EQ(player.due(), now + milliseconds(48));
    player.next(now);
    EXPECT_EQ(player.due(), now + milliseconds(248));
}

TEST(PlayerTest, AtARateFramesComeEvenlyWhateverTheirRecordedTimes) {
    Player player(frames, {Rate::Kind::perSecond, 4}, false);
    player.start(now);
    EXPECT_EQ(player.due(), now);
    EXPECT_EQ(player.next(now).ticks, 10U);
    EXPECT_EQ(player.due(), now + milliseconds(250));
    player.next(now + milliseconds(900));
    EXPECT_EQ(player.due(), now + milliseconds(500));
}

TEST(PlayerTest, AtFullRateAFrameIsDueWhenTheOneBeforeHasGone) {
    Player player(frames, {Rate::Kind::max, 0}, false);
    player.start(now);
    EXPECT_EQ(player.due(), now);
    player.next(now + milliseconds(3));
    EXPECT_EQ(player.due(), now + milliseconds(3));
}

TEST(PlayerTest, AfterTheLastFrameItHasStopped) {
    Player player(frames, {Rate::Kind::max, 0}, false);
    player.start(now);
    EXPECT_EQ(player.next(now).frame->octets[0], 1);
    EXPECT_EQ(player.next(now).frame->octets[0], 2);
    EXPECT_TRUE(player.playing());
    EXPECT_EQ(player.next(now).frame->octets[0], 3);
    EXPECT_FALSE(player.playing());
}

TEST(PlayerTest, ALoopBeginsAgainASecondAfterTheLastFrame) {
    Player player(frames, {Rate::Kind::recorded, 0}, true);
    player.start(now);
    for (int i = 0; i < 3; ++i) {
        player.next(now);
    }
    EXPECT_TRUE(player.playing());
    EXPECT_EQ(player.due(), now + milliseconds((62 + 250 + 10) * 4));
    EXPECT_EQ(player.next(now).ticks, 322U);
}

TEST(PlayerTest, ItBeginsWithTheFirstFrameEachTimeItIsStarted) {
    Player player(frames, {Rate::Kind::recorded, 0}, true);
    player.start(now);
    player.next(now);
    player.start(now + milliseconds(5));  // it plays already
    EXPECT_EQ(player.next(now).ticks, 12U);
    player.stop();
    EXPECT_FALSE(player.playing());
    player.start(now + milliseconds(8));
    EXPECT_EQ(player.due(), now + milliseconds(48));
    EXPECT_EQ(player.next(now).ticks, 10U);
}

TEST(PlayerTest, WithoutFramesThereIsNothingToPlay) {
    Player player(std::make_shared<const Frames>(), {Rate::Kind::max, 0}, true);
    player.start(now);
    EXPECT_FALSE(player.playing());
}

}  // namespace
}  // namespace softboard
