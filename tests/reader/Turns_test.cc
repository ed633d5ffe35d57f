#include "reader/Turns.h"

#include <gtest/gtest.h>

#include <atomic>
#include <latch>
#include <string>
#include <thread>

namespace reader {
namespace {

TEST(Turns, EndInTheOrderInWhichTheyWereRead) {
    Turns turns(2);
    std::string order;
    const auto first = turns.beginReading(true);
    turns.endReading();
    std::thread other([&] {
        const auto second = turns.beginReading(false);
        turns.endReading();
        turns.await(*second);
        order += "second";
        turns.end();
    });
    turns.await(*first);
    order += "first ";
    turns.end();
    other.join();
    EXPECT_EQ(order, "first second");
}

TEST(Turns, AreReadByOneThreadAtATimeAndHandedOnByOne) {
    constexpr int threads = 4;
    constexpr int each = 2000;
    Turns turns(threads);
    int read = 0;               // unguarded: whoever reads may change it
    std::vector<int> handedOn;  // and whoever hands on may change this
    const auto work = [&] {
        for (int i = 0; i < each; ++i) {
            const auto turn = turns.beginReading(false);
            const int mine = ++read;
            turns.endReading();
            turns.await(*turn);
            handedOn.push_back(mine);
            turns.end();
        }
    };
    std::vector<std::thread> crew;
    for (int i = 0; i < threads; ++i)
        crew.emplace_back(work);
    for (std::thread& thread : crew)
        thread.join();
    ASSERT_EQ(handedOn.size(), static_cast<std::size_t>(threads * each));
    for (std::size_t i = 0; i < handedOn.size(); ++i)
        ASSERT_EQ(handedOn[i], static_cast<int>(i) + 1);
}

TEST(Turns, AThreadThatReadsUntilItHasHandedOnMeetsNoOther) {
    Turns turns(2);
    bool isAlone = false;
    std::atomic<bool> metAnother = false;
    std::thread other([&] {
        for (int i = 0; i < 100; ++i) {
            const auto turn = turns.beginReading(false);
            metAnother = metAnother || isAlone;
            turns.endReading();
            turns.await(*turn);
            metAnother = metAnother || isAlone;
            turns.end();
        }
    });
    for (int i = 0; i < 100; ++i) {
        const auto turn = turns.beginReading(true);
        turns.await(*turn);
        isAlone = true;
        isAlone = false;
        turns.end();
        turns.endReading();
    }
    other.join();
    EXPECT_FALSE(metAnother);
}

TEST(Turns, AfterAPauseTheOwnerReadsFirst) {
    Turns turns(2);
    std::string order;
    std::latch isPaused(1);
    std::thread other([&] {
        const auto turn = turns.beginReading(false);
        turns.await(*turn);
        turns.end();
        turns.endReadingForOwner();
        isPaused.count_down();
        const auto next = turns.beginReading(false);
        order += "other";
        turns.endReading();
        turns.await(*next);
        turns.end();
    });
    isPaused.wait();
    const auto turn = turns.beginReading(true);
    order += "owner ";
    turns.endReading();
    turns.await(*turn);
    turns.end();
    other.join();
    EXPECT_EQ(order, "owner other");
}

TEST(Turns, NoneBeginsOnceTheyAreClosed) {
    Turns turns(2);
    const auto turn = turns.beginReading(true);
    std::thread other([&] { EXPECT_FALSE(turns.beginReading(false)); });
    turns.await(*turn);
    turns.close();
    turns.end();
    turns.endReading();
    other.join();
    EXPECT_FALSE(turns.beginReading(true));
}

}  // namespace
}  // namespace reader
