#include "hostsvc/KSThread.h"

#include <gmock/gmock.h>
#include <pthread.h>

#include <cstddef>
#include <latch>
#include <memory>
#include <stdexcept>
#include <string>

#include "tests/hostsvc/story.h"
#include "tests/support/test_system.h"

namespace {

std::size_t ownStackSize() {
    pthread_attr_t attributes;
    pthread_getattr_np(pthread_self(), &attributes);
    std::size_t size = 0;
    pthread_attr_getstacksize(&attributes, &size);
    pthread_attr_destroy(&attributes);
    return size;
}

std::size_t stackSizeWith(unsigned requested) {
    std::size_t size = 0;
    Story body = [&](KSThread::control&) -> void* {
        size = ownStackSize();
        return nullptr;
    };
    KSThread thread(tell, requested);
    thread.start(&body);
    thread.join();
    return size;
}

TEST(KSThread, TheBodyGetsTheControlAndTheArgumentAndItsResultIsKept) {
    int argument = 0;
    void* seenControl = nullptr;
    Story body = [&](KSThread::control& control) -> void* {
        seenControl = &control;
        return &argument;
    };
    KSThread thread(tell, 0);
    EXPECT_EQ(thread.getResult(), nullptr);
    thread.start(&body);
    thread.join();
    EXPECT_EQ(seenControl, thread.getControl());
    EXPECT_EQ(thread.getResult(), &argument);
}

TEST(KSThread, TheBodyGetsAnotherPointerForItsControlWhenOneIsSet) {
    int other = 0;
    KSThread thread([](void* control, void*) { return control; }, 0);
    thread.setControl(&other);
    thread.start(nullptr);
    thread.join();
    EXPECT_EQ(thread.getResult(), &other);
}

struct Base : KSRunnable {
    virtual ~Base() = default;
    virtual void* body(void* /*control*/, void* /*arg*/) { return nullptr; }
};

struct Derived : Base {
    void* body(void* /*control*/, void* arg) override {
        seen = arg;
        return this;
    }
    void* seen = nullptr;
};

TEST(KSThread, AVirtualMemberBodyRunsAsItsObjectHasIt) {
    Derived object;
    int argument = 0;
    KSThread thread(static_cast<KSRunnable*>(&object),
                    static_cast<void* (KSRunnable::*)(void*, void*)>(&Base::body), 0);
    thread.start(&argument);
    thread.join();
    EXPECT_EQ(thread.getResult(), &object);
    EXPECT_EQ(object.seen, &argument);
}

TEST(KSThread, JoiningAThreadThatWasNeverStartedReturnsAtOnce) {
    KSThread thread(tell, 0);
    thread.join();
    EXPECT_TRUE(thread.tryJoin(0, 1));
}

TEST(KSThread, StartingARunningThreadThrowsAndChangesNothing) {
    std::latch go(1);
    int result = 0;
    Story body = [&](KSThread::control& control) -> void* {
        go.wait();
        control.testCancel();
        return &result;
    };
    Story other = [](KSThread::control&) -> void* { return nullptr; };
    KSThread thread(tell, 0);
    thread.start(&body);
    EXPECT_THROW(thread.start(&other), KSThread::AlreadyActive);
    EXPECT_THROW(thread.start(&other), KSException);
    EXPECT_FALSE(thread.tryJoin(0, 1));
    go.count_down();
    thread.join();
    EXPECT_EQ(thread.getResult(), &result);
}

TEST(KSThread, AThreadThatHasEndedStartsAgainWithItsResultCleared) {
    int result = 0;
    std::latch go(1);
    Story first = [&](KSThread::control&) -> void* { return &result; };
    Story second = [&](KSThread::control&) -> void* {
        go.wait();
        return nullptr;
    };
    KSThread thread(tell, 0);
    thread.start(&first);
    thread.join();
    thread.start(&second);
    EXPECT_EQ(thread.getResult(), nullptr);
    go.count_down();
    thread.join();
}

TEST(KSThread, AStackBelowTheDefaultIsRaisedToIt) {
    const std::size_t usual = stackSizeWith(0);
    EXPECT_EQ(stackSizeWith(1), usual);
    EXPECT_EQ(stackSizeWith(65536), usual);
}

TEST(KSThread, AStackAboveTheDefaultIsHad) {
    pthread_attr_t attributes;
    pthread_attr_init(&attributes);
    std::size_t usual = 0;
    pthread_attr_getstacksize(&attributes, &usual);
    pthread_attr_destroy(&attributes);
    EXPECT_GE(stackSizeWith(static_cast<unsigned>(usual) + 0x100000U), usual + 0x100000U);
}

TEST(KSThread, AThreadThatTheSystemRefusesThrowsAndStaysStopped) {
    Story body = [](KSThread::control& control) -> void* { return &control; };
    KSThread thread(tell, 0);
    {
        ThreadlessSystem system;
        EXPECT_THROW(thread.start(&body), KSThread::CreationError);
        EXPECT_THROW(thread.start(&body), KSThread::Exception);
        EXPECT_THROW(thread.start(&body), KSResource_CreationError);
        EXPECT_THROW(thread.start(&body), KSException);
    }
    thread.join();
    thread.start(&body);
    thread.join();
    EXPECT_EQ(thread.getResult(), thread.getControl());
}

TEST(KSThread, ACancelledThreadRunsItsCleanUpsNewestFirstAndHasNoResult) {
    std::string ran;
    Act a = [&] { ran += 'a'; };
    Act b = [&] { ran += 'b'; };
    Story body = [&](KSThread::control& control) -> void* {
        control.pushCleanup(act, &a);
        control.pushCleanup(act, &b);
        return goOnUntilCancelled(control);
    };
    KSThread thread(tell, 0);
    thread.start(&body);
    thread.cancel();
    thread.join();
    EXPECT_EQ(ran, "ba");
    EXPECT_EQ(thread.getResult(), nullptr);
}

TEST(KSThread, TheCleanUpsRunBeforeJoinReturns) {
    std::latch cleaning(1);
    std::latch go(1);
    Act slow = [&] {
        cleaning.count_down();
        go.wait();
    };
    Story body = [&](KSThread::control& control) -> void* {
        control.pushCleanup(act, &slow);
        return goOnUntilCancelled(control);
    };
    KSThread thread(tell, 0);
    thread.start(&body);
    thread.cancel();
    cleaning.wait();
    EXPECT_FALSE(thread.tryJoin(0, 1));
    go.count_down();
    thread.join();
}

// The frames of a cancelled body are unwound: the join must not return before the last of them is gone.
TEST(KSThread, JoinWaitsForTheFramesOfACancelledBody) {
    std::latch unwinding(1);
    std::latch go(1);
    struct Frame {
        std::latch& unwinding;
        std::latch& go;
        std::string& order;
        ~Frame() {
            unwinding.count_down();
            go.wait();
            order += "frame ";
        }
    };
    std::string order;
    Story body = [&](KSThread::control& control) -> void* {
        try {
            const Frame frame{unwinding, go, order};
            goOnUntilCancelled(control);
        } catch (...) {
            order += "caught ";
            throw;
        }
        order += "returned ";
        return nullptr;
    };
    KSThread thread(tell, 0);
    thread.start(&body);
    thread.cancel();
    unwinding.wait();
    EXPECT_FALSE(thread.tryJoin(0, 1));
    go.count_down();
    thread.join();
    EXPECT_EQ(order, "frame caught ");
}

TEST(KSThread, ObjectsThatTheBodyUsesMayBeDestroyedRightAfterJoin) {
    struct Touch {
        int* count;
        ~Touch() { ++*count; }
    };
    for (int round = 0; round < 200; ++round) {
        auto count = std::make_unique<int>(0);
        Story body = [&](KSThread::control& control) -> void* {
            const Touch outer{count.get()};
            try {
                const Touch inner{count.get()};
                return round % 2 == 0 ? goOnUntilCancelled(control) : nullptr;
            } catch (...) {
                ++*count;
                throw;
            }
        };
        auto thread = std::make_unique<KSThread>(tell, 0);
        thread->start(&body);
        if (round % 2 == 0)
            thread->cancel();
        thread->join();
        EXPECT_EQ(*count, round % 2 == 0 ? 3 : 2);
        thread.reset();
        count.reset();
    }
}

// A second unlock for one start would release the lock of the next.
TEST(KSThread, EachStartIsAnsweredByOneUnlock) {
    KSThread thread(tell, 0);
    for (int round = 0; round < 200; ++round) {
        thread.start(&untilCancelled);
        thread.cancel();
        std::latch go(1);
        Story waits = [&](KSThread::control&) -> void* {
            go.wait();
            return nullptr;
        };
        thread.start(&waits);  // waits until the cancelled body has ended
        EXPECT_FALSE(thread.tryJoin(0, 1));
        go.count_down();
        thread.join();
        EXPECT_TRUE(thread.tryJoin(0, 1));
    }
}

TEST(KSThread, DestroyingARunningThreadCancelsItAndWaits) {
    std::string ran;
    Act a = [&] { ran += 'a'; };
    Story body = [&](KSThread::control& control) -> void* {
        control.pushCleanup(act, &a);
        return goOnUntilCancelled(control);
    };
    {
        KSThread thread(tell, 0);
        thread.start(&body);
    }
    EXPECT_EQ(ran, "a");
}

TEST(KSThread, DestroyingAThreadThatHasNotNoticedItsCancelWaitsToo) {
    for (int round = 0; round < 50; ++round) {
        auto thread = std::make_unique<KSThread>(tell, 0);
        thread->start(&untilCancelled);
        thread->cancel();
        thread.reset();
    }
}

TEST(KSThread, CleanUpsThatTheBodyLeftRunWhenTheThreadIsDestroyed) {
    std::string ran;
    Act a = [&] { ran += 'a'; };
    Story body = [&](KSThread::control& control) -> void* {
        control.pushCleanup(act, &a);
        return nullptr;
    };
    auto thread = std::make_unique<KSThread>(tell, 0);
    thread->start(&body);
    thread->join();
    EXPECT_EQ(ran, "");
    thread.reset();
    EXPECT_EQ(ran, "a");
}

TEST(KSThread, RunPassesAnExceptionOnAndLeavesTheThreadStopped) {
    int rounds = 0;
    KSThread thread(
        [](void* control, void*) -> void* {
            if (control == nullptr)
                throw std::runtime_error("body");
            return control;
        },
        0);
    thread.setControl(nullptr);
    EXPECT_THROW(thread.run(), std::runtime_error);
    thread.setControl(&rounds);
    thread.start(nullptr);
    thread.join();
    EXPECT_EQ(thread.getResult(), &rounds);
}

TEST(KSThreadDeathTest, AnExceptionOutOfTheBodyEndsTheProcess) {
    testing::FLAGS_gtest_death_test_style = "threadsafe";
    EXPECT_DEATH(
        {
            Story body = [](KSThread::control&) -> void* { throw std::runtime_error("lost in a body"); };
            KSThread thread(tell, 0);
            thread.start(&body);
            thread.join();
        },
        testing::HasSubstr("lost in a body"));
}

}  // namespace
