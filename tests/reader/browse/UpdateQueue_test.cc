#include <gtest/gtest.h>

#include <future>
#include <thread>

#include "reader/browse/Update.h"

namespace reader::browse {
namespace {

Update numbered(std::uint64_t number) {
    Update update;
    update.octets = number;
    return update;
}

TEST(UpdateQueue, GivesUpdatesInTheirOrderAndCallsForEach) {
    int calls = 0;
    UpdateQueue queue([&] { ++calls; });
    queue.put(numbered(1001));
    queue.put(numbered(1002));
    EXPECT_EQ(calls, 2);
    EXPECT_EQ(queue.take()->octets, 1001U);
    EXPECT_EQ(queue.take()->octets, 1002U);
    EXPECT_FALSE(queue.take());
}

TEST(UpdateQueue, WhoeverPutsWaitsForRoomAndNothingIsLost) {
    constexpr std::uint64_t many = 1000;
    UpdateQueue queue([] {});
    std::thread putting([&] {
        for (std::uint64_t i = 0; i < many; ++i)
            queue.put(numbered(i));
    });
    for (std::uint64_t next = 0; next < many;) {
        if (const auto update = queue.take()) {
            ASSERT_EQ(update->octets, next);
            ++next;
        } else {
            std::this_thread::yield();
        }
    }
    putting.join();
}

TEST(UpdateQueue, ClosingEndsWhoeverWaitsAndWhoeverPutsLater) {
    std::promise<void> isFull;
    UpdateQueue queue([&, count = 0]() mutable {
        constexpr int room = 32;
        if (++count == room)
            isFull.set_value();
    });
    auto putting = std::async(std::launch::async, [&] {
        for (;;)
            queue.put({});
    });
    isFull.get_future().wait();
    queue.close();
    EXPECT_THROW(putting.get(), UpdateQueue::Closed);
    EXPECT_THROW(queue.put({}), UpdateQueue::Closed);
    EXPECT_TRUE(queue.isClosed());
}

}  // namespace
}  // namespace reader::browse
