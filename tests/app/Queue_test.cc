#include "app/Queue.h"

#include <gtest/gtest.h>

#include <array>

namespace vela {
namespace {

using Record = CCS::EvtL2Trace_t;

TEST(Queue, HandsOutRecordsInTheOrderInWhichTheyCame) {
    std::array<Record, 3> records;
    Queue queue(3);
    for (Record& rec : records)
        EXPECT_TRUE(queue.enqueue(&rec));
    for (Record& rec : records) {
        Record* out = nullptr;
        EXPECT_TRUE(queue.dequeue(&out));
        EXPECT_EQ(out, &rec);
    }
}

TEST(Queue, RefusesWhatIsBeyondItsCapacity) {
    Record rec;
    Queue queue(100);
    for (int held = 0; held < 100; ++held) {
        EXPECT_FALSE(queue.isfull());
        EXPECT_EQ(queue.queuecount(), held);
        EXPECT_TRUE(queue.enqueue(&rec));
    }
    EXPECT_TRUE(queue.isfull());
    EXPECT_FALSE(queue.enqueue(&rec));
    EXPECT_EQ(queue.queuecount(), 100);
}

TEST(Queue, LeavesTheCallersPointerAloneWhenItIsEmpty) {
    Record rec;
    Record* out = &rec;
    Queue queue(1);
    EXPECT_TRUE(queue.isempty());
    EXPECT_FALSE(queue.dequeue(&out));
    EXPECT_EQ(out, &rec);
    EXPECT_EQ(queue.queuecount(), 0);
}

TEST(Queue, WorksAfterItWasEmptied) {
    std::array<Record, 2> records;
    Record* out = nullptr;
    Queue queue(2);
    for (int round = 0; round < 3; ++round) {
        EXPECT_TRUE(queue.enqueue(&records[0]));
        EXPECT_TRUE(queue.enqueue(&records[1]));
        EXPECT_FALSE(queue.isempty());
        EXPECT_TRUE(queue.dequeue(&out));
        EXPECT_EQ(out, &records[0]);
        EXPECT_TRUE(queue.dequeue(&out));
        EXPECT_EQ(out, &records[1]);
        EXPECT_TRUE(queue.isempty());
        EXPECT_FALSE(queue.isfull());
    }
}

TEST(Queue, DoesNotDestroyTheRecordsWhenItIsDestroyed) {
    Record rec;
    rec.Timestamp = 1001;
    {
        Queue queue(2);
        queue.enqueue(&rec);
        queue.enqueue(&rec);
    }
    EXPECT_EQ(rec.Timestamp.value(), 1001U);
}

TEST(Queue, IsDestroyedWithoutRecursionHoweverLongItIs) {
    Record rec;
    Queue queue(1000000);
    while (queue.enqueue(&rec)) {
    }
    EXPECT_TRUE(queue.isfull());
}

}  // namespace
}  // namespace vela
