#include "hostsvc/KSAbandonedThread.h"

#include <gmock/gmock.h>

#include <latch>

#include "hostsvc/KSThread.h"
#include "tests/hostsvc/story.h"
#include "tests/support/test_system.h"

namespace {

struct Seen : KSRunnable {
    void* control = this;
    void* argument = nullptr;
    std::latch done{1};

    void* body(void* itsControl, void* itsArgument) {
        control = itsControl;
        argument = itsArgument;
        done.count_down();
        return this;
    }
};

TEST(KSAbandonedThread, ThePlainBodyGetsNoControlAndItsArgument) {
    Seen seen;
    KSAbandonedThread_create(
        [](void* control, void* arg) { return static_cast<Seen*>(arg)->body(control, arg); }, &seen, 0);
    seen.done.wait();
    EXPECT_EQ(seen.control, nullptr);
    EXPECT_EQ(seen.argument, &seen);
}

TEST(KSAbandonedThread, TheMemberBodyRunsOnItsObject) {
    Seen seen;
    int argument = 0;
    KSAbandonedThread_create(static_cast<KSRunnable*>(&seen),
                             static_cast<void* (KSRunnable::*)(void*, void*)>(&Seen::body), &argument, 1);
    seen.done.wait();
    EXPECT_EQ(seen.control, nullptr);
    EXPECT_EQ(seen.argument, &argument);
}

TEST(KSAbandonedThread, AThreadThatTheSystemRefusesThrows) {
    ThreadlessSystem system;
    Act body = [] {};
    const auto plain = [](void*, void* arg) { return act(arg); };
    EXPECT_THROW(KSAbandonedThread_create(plain, &body, 0), KSThread::CreationError);
}

TEST(KSAbandonedThread, ManyMayRunAtOnce) {
    constexpr int many = 100;
    std::latch done(many);
    Act body = [&] { done.count_down(); };
    for (int i = 0; i < many; ++i)
        KSAbandonedThread_create([](void*, void* arg) { return act(arg); }, &body, 0);
    done.wait();
}

// Holds each new thread back until its creator sleeps.
class SlowStart : public SleeplessSystem {
  public:
    SlowStart() {
        insteadOfNapping = [this] {
            if (naps().size() == 3)
                napped_.count_down();
        };
    }

    int createThread(const pthread_attr_t* attributes, void* (*entry)(void*), void* argument) override {
        entry_ = entry;
        argument_ = argument;
        return KSSystem::createThread(
            attributes,
            [](void* self) {
                auto* const system = static_cast<SlowStart*>(self);
                system->napped_.wait();
                return system->entry_(system->argument_);
            },
            this);
    }

  private:
    std::latch napped_{1};
    void* (*entry_)(void*) = nullptr;
    void* argument_ = nullptr;
};

TEST(KSAbandonedThread, TheCreatorSleepsMillisecondsUntilASlowThreadHasStarted) {
    SlowStart system;
    Seen seen;
    KSAbandonedThread_create(static_cast<KSRunnable*>(&seen),
                             static_cast<void* (KSRunnable::*)(void*, void*)>(&Seen::body), nullptr, 0);
    seen.done.wait();
    EXPECT_GE(system.naps().size(), 3U);
    EXPECT_THAT(system.naps(), testing::Each(1000));
}

}  // namespace
