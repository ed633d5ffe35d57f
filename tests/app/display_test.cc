#include "app/display.h"

#include <gtest/gtest.h>

#include <atomic>
#include <iostream>
#include <streambuf>
#include <string>
#include <utility>

#include "tests/app/channels.h"
#include "tests/app/records.h"
#include "tests/support/test_system.h"

namespace app {
namespace {

using testing::CountedRecord;
using testing::dated;
using testing::Octets;
using testing::Record;

constexpr char cancelled[] = "general Exception caught in lapdmon(215)\n";

class Display : public ::testing::Test {
  protected:
    ~Display() override {
        discardQueued();
        while (sema.tryWait()) {
        }
        arrivals = std::make_shared<Arrivals>();
    }

    void arrives(Record* rec) { HANDLE_L2Trace_events(nullptr, 32, rec); }

    // Runs the display thread until so many counted records are gone.
    void displayUntilGone(int records) {
        Process.start(nullptr);
        for (int gone = destroyed_; gone < records; gone = destroyed_)
            destroyed_.wait(gone);
        Process.cancel();
        Process.join();
    }

    std::atomic<int> destroyed_ = 0;
    testing::Screen screen_;
    testing::Log log_;
};

std::string frameAt(const std::string& time) {
    return "\nDATE\nRX Frame: Time = " + time +
           "\nResponse=0    SAPI=0x00\nTEI=0x00\n    0x73  Unnumbered Acknowledgment\nHex Dump: \n00 01 73 "
           "\n";
}

TEST_F(Display, QueuesARecordAsItIsAndCountsIt) {
    Record* const rec = CountedRecord::make(destroyed_);
    arrives(rec);
    EXPECT_EQ(event_queue.queuecount(), 1);
    EXPECT_TRUE(sema.tryWait());
    EXPECT_FALSE(sema.tryWait());
    Record* queued = nullptr;
    ASSERT_TRUE(event_queue.dequeue(&queued));
    EXPECT_EQ(queued, rec);
    EXPECT_EQ(destroyed_, 0);
    EXPECT_EQ(log_.text() + screen_.text(), "");
    const std::unique_ptr<Record> gone(queued);
}

TEST_F(Display, RefusesThe101stRecordAndDestroysIt) {
    for (int i = 0; i < 100; ++i)
        arrives(CountedRecord::make(destroyed_));
    EXPECT_EQ(destroyed_, 0);
    EXPECT_EQ(log_.text(), "");

    arrives(CountedRecord::make(destroyed_));
    EXPECT_EQ(destroyed_, 1);
    EXPECT_EQ(log_.text(), "Enqueue Failed \n");
    EXPECT_EQ(screen_.text(), "");
    EXPECT_EQ(event_queue.queuecount(), 100);
    int counted = 0;
    while (sema.tryWait())
        ++counted;
    EXPECT_EQ(counted, 100);
}

TEST_F(Display, LeavesTheQueueUnlockedWhateverBecomesOfTheRecord) {
    for (int i = 0; i < 101; ++i)
        arrives(CountedRecord::make(destroyed_));
    ASSERT_TRUE(queueGuard.tryLock());
    queueGuard.unlock();
}

TEST_F(Display, ShowsRecordsInTheOrderInWhichTheyWereQueued) {
    constexpr int records = 100;
    std::string expected;
    for (int i = 0; i < records; ++i) {
        arrives(CountedRecord::make(destroyed_, static_cast<unsigned int>(i) * 250));
        expected += frameAt(std::to_string(i) + ".0");
    }
    displayUntilGone(records);
    EXPECT_EQ(dated(log_.text()), expected);
    EXPECT_EQ(screen_.text(), cancelled);
}

TEST_F(Display, ShowsRecordsThatComeWhileItWaits) {
    Process.start(nullptr);
    std::string expected;
    for (int i = 0; i < 5; ++i) {
        arrives(CountedRecord::make(destroyed_, static_cast<unsigned int>(i)));
        destroyed_.wait(i);
        expected += frameAt("0." + std::to_string(i * 4));
    }
    Process.cancel();
    Process.join();
    EXPECT_EQ(dated(log_.text()), expected);
}

TEST_F(Display, DestroysARecordOfAnotherKindToo) {
    Record* const rec = CountedRecord::make(destroyed_);
    rec->Label = 3;
    arrives(rec);
    displayUntilGone(1);
    EXPECT_EQ(screen_.text(), std::string("ERROR - received unexpected rtc event\n") + cancelled);
    EXPECT_EQ(log_.text(), "");
}

TEST_F(Display, IgnoresACountWithoutARecord) {
    sema.post();
    arrives(CountedRecord::make(destroyed_));
    displayUntilGone(1);
    EXPECT_EQ(dated(log_.text()), frameAt("0.0"));
}

TEST_F(Display, EndsWhenItIsCancelledAndReportsIt) {
    Process.start(nullptr);
    Process.cancel();
    Process.join();
    EXPECT_EQ(screen_.text(), cancelled);
    EXPECT_EQ(log_.text(), "");
}

TEST_F(Display, LeavesTheQueueUnlockedWhenItIsCancelled) {
    for (int i = 0; i < 50; ++i)
        arrives(CountedRecord::make(destroyed_));
    Process.start(nullptr);
    Process.cancel();
    Process.join();
    ASSERT_TRUE(queueGuard.tryLock());
    queueGuard.unlock();
}

TEST_F(Display, DiscardsTheRecordsThatAreStillQueued) {
    for (int i = 0; i < 50; ++i)
        arrives(CountedRecord::make(destroyed_));
    discardQueued();
    EXPECT_EQ(destroyed_, 50);
    EXPECT_TRUE(event_queue.isempty());
}

TEST_F(Display, LooksForARecordEvery10Milliseconds) {
    SleeplessSystem system;
    std::atomic<int> naps = 0;
    system.insteadOfNapping = [&] {
        ++naps;
        naps.notify_all();
    };
    Process.start(nullptr);
    for (int seen = naps; seen < 5; seen = naps)
        naps.wait(seen);
    Process.cancel();
    Process.join();
    for (const long nap : system.naps())
        EXPECT_EQ(nap, 10000);
}

TEST_F(Display, EndsBeforeTheRecordThatItFindsWhenItIsCancelled) {
    SleeplessSystem system;
    system.insteadOfNapping = [this, first = true]() mutable {
        if (!std::exchange(first, false))
            return;
        arrives(CountedRecord::make(destroyed_));
        Process.cancel();
    };
    Process.start(nullptr);
    Process.join();
    EXPECT_EQ(event_queue.queuecount(), 1);
    EXPECT_EQ(destroyed_, 0);
    EXPECT_EQ(log_.text(), "");
}

// Notes, when something is written to it, whether the queue is locked.
class LockObserver : public std::streambuf {
  public:
    LockObserver() : before_(std::cout.rdbuf(this)) {}
    ~LockObserver() override { std::cout.rdbuf(before_); }
    LockObserver(const LockObserver&) = delete;
    LockObserver& operator=(const LockObserver&) = delete;

    std::atomic<bool> wasLocked = false;

  protected:
    int_type overflow(int_type character) override { return character; }
    std::streamsize xsputn(const char*, std::streamsize size) override {
        wasLocked = !queueGuard.tryLock();
        if (!wasLocked)
            queueGuard.unlock();
        return size;
    }

  private:
    std::streambuf* before_;
};

TEST_F(Display, HoldsTheQueueLockedWhileItShowsARecord) {
    Record* const rec = CountedRecord::make(destroyed_);
    rec->Label = 3;  // is reported on the screen
    arrives(rec);
    const LockObserver screen;
    Process.start(nullptr);
    for (int gone = destroyed_; gone < 1; gone = destroyed_)
        destroyed_.wait(gone);
    EXPECT_TRUE(screen.wasLocked);
    Process.cancel();
    Process.join();
}

}  // namespace
}  // namespace app
