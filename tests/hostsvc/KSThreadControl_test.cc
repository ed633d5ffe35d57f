#include "hostsvc/KSThreadControl.h"

#include <gmock/gmock.h>
#include <pthread.h>

#include <optional>
#include <stdexcept>
#include <string>

#include "hostsvc/KSMutex.h"
#include "tests/hostsvc/story.h"

namespace {

// A control of its own, with routines that note their names.
class KSThreadControlTest : public testing::Test {
  protected:
    KSThreadControlTest() { control_.emplace(status_, lock_); }

    void push(Act& routine) { control_->pushCleanup(act, static_cast<void*>(&routine)); }

    std::atomic<KSThreadStatus> status_{KSThreadStatus::running};
    KSMutex lock_;
    std::string ran_;
    Act a_ = [this] { ran_ += 'a'; };
    Act b_ = [this] { ran_ += 'b'; };
    Act c_ = [this] { ran_ += 'c'; };
    Act fails_ = [] { throw std::runtime_error("cleanup"); };
    std::optional<KSThreadControl> control_;
};

TEST_F(KSThreadControlTest, PoppingAnEmptyStackDoesNothing) {
    EXPECT_EQ(control_->popCleanup(1), 0);
    EXPECT_EQ(control_->popCleanup(0), 0);
}

TEST_F(KSThreadControlTest, PoppingTakesTheNewestAndTellsWhetherThereAreMore) {
    push(a_);
    push(b_);
    push(c_);
    EXPECT_NE(control_->popCleanup(1), 0);
    EXPECT_EQ(ran_, "c");
    EXPECT_NE(control_->popCleanup(0), 0);
    EXPECT_EQ(ran_, "c");
    EXPECT_EQ(control_->popCleanup(1), 0);
    EXPECT_EQ(ran_, "ca");
}

TEST_F(KSThreadControlTest, AMemberRoutineRunsOnItsObjectWithItsArgument) {
    struct Object : KSRunnable {
        void* note(void* arg) {
            seen = arg;
            return nullptr;
        }
        void* seen = nullptr;
    } object;
    int argument = 0;
    control_->pushCleanup(static_cast<KSRunnable*>(&object),
                          static_cast<void* (KSRunnable::*)(void*)>(&Object::note), &argument);
    EXPECT_EQ(control_->popCleanup(1), 0);
    EXPECT_EQ(object.seen, &argument);
}

TEST_F(KSThreadControlTest, ARoutineThatThrowsIsReportedTakenOffAndPassedOn) {
    push(a_);
    push(fails_);
    testing::internal::CaptureStderr();
    EXPECT_THROW(control_->popCleanup(1), std::runtime_error);
    EXPECT_EQ(testing::internal::GetCapturedStderr(),
              "ERROR: in ~KSThread::control::popCleanup, cleanup threw exception\n");
    EXPECT_EQ(control_->popCleanup(1), 0);
    EXPECT_EQ(ran_, "a");
}

TEST_F(KSThreadControlTest, DestructionRunsWhatIsLeftAndUnlocksTheLock) {
    push(a_);
    push(b_);
    lock_.lock();
    control_.reset();
    EXPECT_EQ(ran_, "ba");
    EXPECT_TRUE(lock_.tryLock());
    lock_.unlock();
}

TEST_F(KSThreadControlTest, DestructionGoesOnAfterARoutineThatThrows) {
    push(a_);
    push(fails_);
    testing::internal::CaptureStderr();
    control_.reset();
    EXPECT_NE(testing::internal::GetCapturedStderr(), "");
    EXPECT_EQ(ran_, "a");
}

TEST_F(KSThreadControlTest, TestCancelReturnsWhileTheStatusIsRunning) {
    push(a_);
    control_->testCancel();
    EXPECT_EQ(ran_, "");
}

TEST_F(KSThreadControlTest, TestCancelOnAThreadOfAnyMakeRunsTheCleanUpsAndReleasesTheLock) {
    push(a_);
    push(b_);
    lock_.lock();
    status_ = KSThreadStatus::stopped;
    Act after = [this] { ran_ += "went on"; };
    pthread_t thread{};
    Act body = [&] {
        control_->testCancel();
        after();
    };
    ASSERT_EQ(pthread_create(&thread, nullptr, act, &body), 0);
    lock_.lock();
    EXPECT_EQ(ran_, "ba");
    lock_.unlock();
    pthread_join(thread, nullptr);
    EXPECT_EQ(ran_, "ba");
}

}  // namespace
