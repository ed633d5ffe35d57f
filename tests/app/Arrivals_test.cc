#include "app/Arrivals.h"

#include <gtest/gtest.h>

#include <atomic>
#include <future>
#include <memory>
#include <thread>
#include <vector>

namespace app {
namespace {

using Place = Arrivals::Place;

TEST(Arrivals, HaveTheirTurnsInTheOrderOfArrivalWhateverTheirThreadsDo) {
    Arrivals arrivals;
    std::vector<std::unique_ptr<Place>> places;
    for (unsigned int i = 0; i < Arrivals::Most; ++i)
        places.push_back(std::make_unique<Place>(arrivals));
    std::vector<unsigned int> order;  // only whoever has the turn writes
    std::vector<std::thread> threads;
    for (unsigned int i = Arrivals::Most; i-- > 0;) {  // the last to arrive starts first
        threads.emplace_back([&, i] {
            arrivals.awaitTurn(places[i]->number());
            order.push_back(i);
            arrivals.endTurn(places[i]->number());
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    ASSERT_EQ(order.size(), Arrivals::Most);
    for (unsigned int i = 0; i < Arrivals::Most; ++i)
        EXPECT_EQ(order[i], i);
}

TEST(Arrivals, ARecordThatGoesBeforeItsTurnGivesItAway) {
    Arrivals arrivals;
    Place first(arrivals);
    auto second = std::make_unique<Place>(arrivals);
    auto third = std::make_unique<Place>(arrivals);
    Place fourth(arrivals);
    third.reset();
    second.reset();
    arrivals.endTurn(first.number());
    arrivals.awaitTurn(fourth.number());  // would wait for ever if a turn were lost
}

TEST(Arrivals, EndingATurnTwiceGivesNoOtherAway) {
    Arrivals arrivals;
    auto first = std::make_unique<Place>(arrivals);
    Place second(arrivals);
    Place third(arrivals);
    const unsigned int number = first->number();
    arrivals.endTurn(number);
    first.reset();
    arrivals.endTurn(number);
    arrivals.awaitTurn(second.number());
    std::atomic<bool> thirdWent{false};
    std::thread waiting([&] {
        arrivals.awaitTurn(third.number());
        thirdWent = true;
    });
    EXPECT_FALSE(thirdWent);
    arrivals.endTurn(second.number());
    waiting.join();
    EXPECT_TRUE(thirdWent);
}

TEST(Arrivals, TheNextRecordWaitsWhileAllPlacesAreTaken) {
    Arrivals arrivals;
    std::vector<std::unique_ptr<Place>> places;
    for (unsigned int i = 0; i < Arrivals::Most; ++i)
        places.push_back(std::make_unique<Place>(arrivals));
    std::promise<void> about;
    std::atomic<bool> in{false};
    auto late = std::async(std::launch::async, [&] {
        about.set_value();
        const Place place(arrivals);
        in = true;
    });
    about.get_future().wait();
    for (int i = 0; i < 50; ++i)
        std::this_thread::yield();
    EXPECT_FALSE(in) << "it came in while there was no place";
    places.erase(places.begin() + 50);
    late.get();
    EXPECT_TRUE(in);
}

TEST(Arrivals, RecordsThatGoUnseenBehindOneThatIsSlowLoseNobodysTurn) {
    Arrivals arrivals;
    auto slow = std::make_unique<Place>(arrivals);
    auto dropped = std::async(std::launch::async, [&] {
        for (int i = 0; i < 200; ++i)
            const Place gone(arrivals);
    });
    for (int i = 0; i < 50; ++i)
        std::this_thread::yield();
    slow.reset();
    dropped.get();
    const Place next(arrivals);
    arrivals.awaitTurn(next.number());  // would wait for ever if a turn were lost
}

TEST(Arrivals, RecordsThatNobodyDeliversAreLostUntilTheyAreClosed) {
    Arrivals arrivals;
    for (int i = 0; i < 300; ++i) {
        const Place place(arrivals);
        if (i % 3 == 0)
            place.delivered();
    }
    EXPECT_EQ(arrivals.lost(), 200U);
    arrivals.close();
    { const Place late(arrivals); }
    EXPECT_EQ(arrivals.lost(), 200U);
}

TEST(Arrivals, ManyMoreThanThereArePlacesPassThrough) {
    Arrivals arrivals;
    for (unsigned int i = 0; i < 1000; ++i) {
        const Place place(arrivals);
        arrivals.awaitTurn(place.number());
        EXPECT_EQ(place.number(), i);
        arrivals.endTurn(place.number());
    }
}

TEST(Arrivals, NobodyWaitsOnceTheyAreClosed) {
    Arrivals arrivals;
    std::vector<std::unique_ptr<Place>> places;
    for (unsigned int i = 0; i < Arrivals::Most; ++i)
        places.push_back(std::make_unique<Place>(arrivals));
    auto noPlace = std::async(std::launch::async, [&] { Place place(arrivals); });
    auto noTurn = std::async(std::launch::async, [&] { arrivals.awaitTurn(places[7]->number()); });
    arrivals.close();
    noPlace.get();
    noTurn.get();
}

TEST(Arrivals, AreWaitedForUntilNoneIsThere) {
    Arrivals arrivals;
    EXPECT_TRUE(arrivals.awaitNone(std::chrono::milliseconds(0)));
    auto place = std::make_unique<Place>(arrivals);
    EXPECT_FALSE(arrivals.awaitNone(std::chrono::milliseconds(0)));
    auto awaited = std::async(std::launch::async, [&] { return arrivals.awaitNone(std::chrono::hours(1)); });
    place.reset();
    EXPECT_TRUE(awaited.get());
}

TEST(Turn, OfARecordThatDidNotArriveComesAtOnce) {
    const vela::CCS::EvtL2Trace_t plain;
    const Turn first(&plain);
    const Turn second(&plain);
}

TEST(Turn, MayOutliveItsRecord) {
    auto rec = std::make_unique<ArrivedRecord>();
    ArrivedRecord next;
    {
        const Turn turn(rec.get());
        rec.reset();
    }
    const Turn turn(&next);  // would wait for ever if a turn were lost
}

// Last: the program-wide arrivals do not come back.
TEST(Turn, OfARecordThatCameAfterTheEndIsLate) {
    const ArrivedRecord rec;
    const vela::CCS::EvtL2Trace_t plain;
    EXPECT_FALSE(Turn(&rec).isLate());
    arrivals.end();
    EXPECT_TRUE(Turn(&rec).isLate());
    EXPECT_FALSE(Turn(&plain).isLate());
}

}  // namespace
}  // namespace app
