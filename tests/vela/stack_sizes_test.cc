// Stack sizes, and the thread parameters of callbacks, which are stack sizes too, reach the system.
#include "tests/support/test_system.h"
#include "tests/vela/events.h"
#include "vela/Thread.h"

namespace {

using vela::Thread;

// Above the system's default, below which no stack is made.
constexpr unsigned int large = 64U << 20;
constexpr unsigned int larger = 65U << 20;

// Makes the threads that it is asked for and notes the sizes of their stacks.
class StackNotes : public KSSystem {
  public:
    StackNotes() { ks_useSystem(this); }
    ~StackNotes() override { ks_useSystem(nullptr); }

    int createThread(const pthread_attr_t* attributes, void* (*entry)(void*), void* argument) override {
        std::size_t size = 0;
        pthread_attr_getstacksize(attributes, &size);
        {
            const std::lock_guard guard(lock_);
            sizes_.push_back(size);
        }
        return KSSystem::createThread(attributes, entry, argument);
    }

    std::vector<std::size_t> sizes() const {
        const std::lock_guard guard(lock_);
        return sizes_;
    }

    static std::size_t usual() {
        pthread_attr_t attributes;
        pthread_attr_init(&attributes);
        std::size_t size = 0;
        pthread_attr_getstacksize(&attributes, &size);
        pthread_attr_destroy(&attributes);
        return size;
    }

  private:
    mutable std::mutex lock_;
    std::vector<std::size_t> sizes_;
};

struct Job : Thread::Runnable {
    Signal ran;
    void* member(Thread::control*, void*) {
        ran.raise();
        return nullptr;
    }
    static void* function(Thread::control*, void* job) {
        return static_cast<Job*>(job)->member(nullptr, nullptr);
    }
};

TEST(StackSize, OfAThreadReachesTheSystem) {
    const StackNotes system;
    Job job;
    const auto member = static_cast<Thread::Member>(&Job::member);
    for (const unsigned int size : {0U, 1U, large}) {
        Thread byFunction(&Job::function, size), byMember(static_cast<Thread::Runnable*>(&job), member, size);
        byFunction.start(&job);
        byMember.start(nullptr);
        byFunction.join();
        byMember.join();
    }
    vela::AbandonedThread_create(&Job::function, &job, large);
    vela::AbandonedThread_create(static_cast<Thread::Runnable*>(&job), member, nullptr, larger);
    ASSERT_TRUE(job.ran.wait(8));
    const std::size_t usual = StackNotes::usual();
    EXPECT_THAT(system.sizes(),
                testing::ElementsAre(usual, usual, usual, usual, large, large, large, larger));
}

class ThreadParameterTest : public EventTest {};

TEST_F(ThreadParameterTest, OfACallbackIsTheStackSizeOfItsThreads) {
    const StackNotes system;
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, large);
    ccs_->asyncRegisterEvtGroup(2, &recorder_, &Recorder::onBody, larger);
    ASSERT_TRUE(sendReply());
    recorder_.entries(1);
    ASSERT_TRUE(sendTrace());
    recorder_.entries(2);
    EXPECT_THAT(system.sizes(), testing::ElementsAre(large, larger));
    end();
}

TEST_F(ThreadParameterTest, OfAHandlerForTheUnregisteredIsTheStackSizeOfItsThreads) {
    const StackNotes system;
    ccs_->asyncUnregisteredMsgType(&recorder_, &Recorder::onMsg, larger);
    ccs_->asyncUnregisteredEvtGroup(&recorder_, &Recorder::onMsg, large);
    ASSERT_TRUE(sendReply());
    recorder_.entries(1);
    ASSERT_TRUE(sendTrace());
    recorder_.entries(2);
    EXPECT_THAT(system.sizes(), testing::ElementsAre(larger, large));
    end();
}

}  // namespace
