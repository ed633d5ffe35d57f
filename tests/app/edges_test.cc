// What escapes at each of the program's three edges, thrown from the system calls below them.
#include <gtest/gtest.h>

#include <functional>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "app/display.h"
#include "app/lapdmon.h"
#include "decoder/state.h"
#include "tests/app/channels.h"
#include "tests/app/records.h"
#include "tests/support/test_system.h"

namespace app {
namespace {

using testing::CountedRecord;

void throwMessage() {
    auto msg = std::make_unique<vela::Msg>(2U);
    msg->setMsgType(0x1A);
    msg->setTrans(10001);
    msg->setSrcAddr(vela::CompDesc_t(5, 1, 2, 3, 4));
    msg->setTgtAddr(vela::CompDesc_t(10, 6, 7, 8, 9));
    throw msg.release();  // NOLINT(cert-err*): that is what is caught
}
constexpr char messageCaught[] =
    "message caught\n"
    "{MsgType: 0x1a Source: {Node 0x4 Board 0x1 Processor 0x2 Component 0x3 Instance 0x5}"
    " Target: {Node 0x9 Board 0x6 Processor 0x7 Component 0x8 Instance 0xa}"
    " Size: 2 Trans: 10001 Body: {ByteData {0 0 }}}\n";

// The system as it is, but for its sleeps and what a test has a post do.
class ThrowingSystem : public SleeplessSystem {
  public:
    std::function<void()> insteadOfPosting;

    int post(sem_t* semaphore) override {
        if (insteadOfPosting)
            insteadOfPosting();
        return SleeplessSystem::post(semaphore);
    }
};

// The callback, on the thread that delivers an event.
class CallbackEdge : public ::testing::Test {
  protected:
    ~CallbackEdge() override {
        system_.insteadOfPosting = nullptr;
        discardQueued();
        while (sema.tryWait()) {
        }
    }

    void arrives() { HANDLE_L2Trace_events(nullptr, 32, CountedRecord::make(destroyed_)); }
    void expectServiceGoesOn() {
        system_.insteadOfPosting = nullptr;
        arrives();
        EXPECT_EQ(event_queue.queuecount(), 2);
        EXPECT_EQ(destroyed_, 0);
    }

    std::atomic<int> destroyed_ = 0;
    ThrowingSystem system_;
    testing::Screen screen_;
    testing::Log log_;
};

TEST_F(CallbackEdge, AThrownMessageIsReportedAndTheCallbackReturns) {
    system_.insteadOfPosting = throwMessage;
    EXPECT_NO_THROW(arrives());
    EXPECT_EQ(screen_.text(), messageCaught);
    expectServiceGoesOn();
}

TEST_F(CallbackEdge, ALayersExceptionIsReportedAndThrownOn) {
    system_.insteadOfPosting = [] { throw vela::Exception("the board is on fire"); };
    EXPECT_THROW(arrives(), vela::Exception);
    EXPECT_EQ(screen_.text(), "vela Exception caught\nthe board is on fire\n");
    expectServiceGoesOn();
}

TEST_F(CallbackEdge, AnythingElseIsReportedWithItsPlaceAndThrownOn) {
    system_.insteadOfPosting = [] { throw std::runtime_error("private"); };
    EXPECT_THROW(arrives(), std::runtime_error);
    EXPECT_EQ(screen_.text(), "general Exception caught in lapdmon(100)\n");
    expectServiceGoesOn();
}

// The display thread, in its wait for the next record.
TEST(DisplayEdge, AThrownMessageIsReportedAndEndsTheThread) {
    ThrowingSystem system;
    const testing::Screen screen;
    const testing::Log log;
    system.insteadOfNapping = [first = true]() mutable {
        if (std::exchange(first, false))
            throwMessage();
    };
    Process.start(nullptr);
    Process.join();
    EXPECT_EQ(screen.text(), messageCaught);
    EXPECT_EQ(log.text(), "");
    ASSERT_TRUE(queueGuard.tryLock());
    queueGuard.unlock();
}

}  // namespace
}  // namespace app

namespace {
int hostCleanups = 0;
}

// Takes the place of KSHostCleanup, by the linker's --wrap.  NOLINTNEXTLINE(bugprone-reserved-identifier)
extern "C" void __wrap__Z13KSHostCleanupv() { ++hostCleanups; }

namespace app {
namespace {

// main, in its first request: there is no such board.
class MainEdge : public ::testing::Test {
  protected:
    ~MainEdge() override {
        if (decoder::ofp != nullptr)
            static_cast<void>(std::fclose(std::exchange(decoder::ofp, nullptr)));
        decoder::file_output = false;
    }

    // The exit status; `thrown` is what the request throws.
    int traceThatMeets(const std::function<void()>& thrown) {
        system_.insteadOfNapping = [&, first = true, self = std::this_thread::get_id()]() mutable {
            if (std::this_thread::get_id() == self && std::exchange(first, false))
                thrown();
        };
        std::vector<std::string> words{"lapdmon", "-b9", "-f", "/dev/null"};
        std::vector<char*> argv;
        for (std::string& word : words)
            argv.push_back(word.data());
        argv.push_back(nullptr);
        return runTrace(static_cast<int>(words.size()), argv.data());
    }
    // The screen behind the banner.
    std::string report() const {
        const std::string text = screen_.text();
        const std::string banner = "Version 1.00-Build-04 lapdmon\n";
        const std::size_t end = text.find(banner);
        return end == std::string::npos ? text : text.substr(end + banner.size());
    }

    ThrowingSystem system_;
    testing::Screen screen_;
};

TEST_F(MainEdge, AThrownMessageIsReportedAndTheStatusIs0) {
    EXPECT_EQ(traceThatMeets(throwMessage), 0);
    EXPECT_EQ(report(), messageCaught);
}

TEST_F(MainEdge, TheHostServicesAreCleanedUpOnce) {
    hostCleanups = 0;
    traceThatMeets(throwMessage);
    EXPECT_EQ(hostCleanups, 1);
}

TEST_F(MainEdge, ALayersExceptionIsReportedAndTheStatusIs1) {
    EXPECT_EQ(traceThatMeets([] { throw vela::Exception("the board is on fire"); }), 1);
    EXPECT_EQ(report(), "vela Exception caught\nthe board is on fire\n");
}

TEST_F(MainEdge, AnythingElseIsReportedWithItsPlaceAndTheStatusIs1) {
    EXPECT_EQ(traceThatMeets([] { throw std::runtime_error("private"); }), 1);
    EXPECT_EQ(report(), "general Exception caught in lapdmon(749)\n");
}

}  // namespace
}  // namespace app
