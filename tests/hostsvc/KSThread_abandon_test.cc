// Threads that delete themselves.
#include <latch>

#include "hostsvc/KSThread.h"
#include "tests/hostsvc/story.h"

namespace {

// Tells when it is deleted.
class Mortal : public KSThread {
  public:
    explicit Mortal(std::latch& gone) : KSThread(tell, 0), gone_(gone) {}
    ~Mortal() override { gone_.count_down(); }

  private:
    std::latch& gone_;
};

TEST(AbandonedKSThread, AnAbandonedThreadDeletesItselfWhenItsBodyReturns) {
    std::latch gone(1);
    std::latch go(1);
    Story body = [&](KSThread::control&) -> void* {
        go.wait();
        return nullptr;
    };
    auto* const thread = new Mortal(gone);
    thread->start(&body);
    thread->abandon();
    EXPECT_FALSE(gone.try_wait());
    go.count_down();
    gone.wait();
}

TEST(AbandonedKSThread, AnAbandonedThreadDeletesItselfWhenItIsCancelled) {
    std::latch gone(1);
    auto* const thread = new Mortal(gone);
    thread->abandon();
    thread->start(&untilCancelled);
    thread->cancel();
    gone.wait();
}

TEST(AbandonedKSThread, AThreadThatIsAbandonedAroundItsEndIsDeletedAllTheSame) {
    Story body = [](KSThread::control&) -> void* { return nullptr; };
    for (int round = 0; round < 200; ++round) {
        std::latch gone(1);
        auto* const thread = new Mortal(gone);
        thread->start(&body);
        thread->abandon();
        gone.wait();
    }
}

TEST(AbandonedKSThread, DestroyingAnAbandonedThreadTakesItBack) {
    std::latch gone(1);
    {
        Mortal thread(gone);
        thread.start(&untilCancelled);
        thread.abandon();
    }
    EXPECT_TRUE(gone.try_wait());
}

}  // namespace
