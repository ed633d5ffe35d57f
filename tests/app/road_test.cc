// The road of a frame from the transport to the log, while the log stalls. On the scripted transport.
#include <gtest/gtest.h>
#include <unistd.h>

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <mutex>
#include <new>
#include <string>
#include <string_view>
#include <thread>
#include <vector>

#include "app/Arrivals.h"
#include "app/Log.h"
#include "app/display.h"
#include "decoder/lines.h"
#include "tests/app/channels.h"
#include "tests/app/records.h"
#include "tests/support/fake_norv.h"
#include "tests/support/test_system.h"

namespace {

// So many of the next allocations that may fail without an exception do fail: those of the queue's nodes.
std::atomic<int> refusedNodes = 0;

}  // namespace

void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
    if (refusedNodes > 0) {
        --refusedNodes;
        return nullptr;
    }
    try {
        return operator new(size);
    } catch (...) {
        return nullptr;
    }
}

namespace app {
namespace {

// While it lives the log takes nothing: as the display thread does in a write that stalls, it holds the
// guard.
class StalledLog {
  public:
    StalledLog() : guard_(queueGuard) {}

  private:
    const std::lock_guard<vela::Mutex> guard_;
};

// The program's log, in a file.
class RealLog {
  public:
    RealLog() {
        decoder::ofp = traceLog.open(path_.c_str());
        decoder::writeLog = [](std::string_view entry) { traceLog.write(entry); };
        decoder::file_output = true;
    }
    ~RealLog() {
        traceLog.close();
        decoder::ofp = nullptr;
        decoder::file_output = false;
        decoder::writeLog = decoder::writeToStream;
        static_cast<void>(std::remove(path_.c_str()));
    }
    RealLog(const RealLog&) = delete;
    RealLog& operator=(const RealLog&) = delete;

    // When nobody writes.
    std::string text() const {
        traceLog.flush();
        std::ifstream file(path_);
        return {std::istreambuf_iterator<char>(file), {}};
    }
    // What was written to the file so far. Any thread may call it.
    std::uintmax_t size() const { return std::filesystem::file_size(path_); }

  private:
    std::string path_ = ::testing::TempDir() + "road-" + std::to_string(getpid()) + ".log";
};

class Road : public ::testing::Test {
  protected:
    explicit Road(const vela::Lane::Bounds& bounds = {}) {
        fake_norv::reset();
        arrivals = std::make_shared<Arrivals>(bounds);
        ccs_ = std::make_unique<TracedCcs>(vela::CompDesc_t(1, 1, 1, 0x15, 0), nullptr);
        ccs_->asyncRegisterEvtGroup(vela::CCS::l2TraceGroup, vela::Handler::of<&HANDLE_L2Trace_events>(), 0,
                                    arrivals);
    }
    ~Road() override {
        ccs_.reset();
        discardQueued();
        while (sema.tryWait()) {
        }
        arrivals = std::make_shared<Arrivals>();
        EXPECT_EQ(fake_norv::outstanding(), 0U);
    }

    void send(unsigned int first, unsigned int count) {
        for (unsigned int i = first; i < first + count; ++i) {
            std::vector<std::uint8_t> body = fake_norv::words({2, 0, i, 3});
            body.insert(body.end(), {0x00, 0x01, 0x73});
            ASSERT_TRUE(fake_norv::deliver({0, 32, ccs_->getTgtDesc().getNvCompDesc(),
                                            ccs_->getMsgQueue()->getHostDesc().getNvCompDesc(), body}));
        }
        ASSERT_TRUE(fake_norv::waitForIdleReader());
    }
    // Runs the display thread until nothing that arrived is unwritten.
    void showAll() {
        arrivals->close();
        Process.start(nullptr);
        Process.cancel();
        Process.join();
        EXPECT_EQ(arrivals->unwritten(), 0U);
    }
    // The time stamps in the log, in ticks.
    std::vector<unsigned int> shown() const {
        std::vector<unsigned int> ticks;
        const std::string text = log_.text();
        const std::string mark = "Frame: Time = ";
        for (std::size_t at = text.find(mark); at != std::string::npos; at = text.find(mark, at + 1)) {
            std::size_t end = 0;
            const std::string from = text.substr(at + mark.size(), 30);
            const auto seconds = static_cast<unsigned int>(std::stoul(from, &end));
            ticks.push_back(seconds * 250 + static_cast<unsigned int>(std::stoul(from.substr(end + 1))) / 4);
        }
        return ticks;
    }
    static std::vector<unsigned int> upTo(unsigned int count) {
        std::vector<unsigned int> all(count);
        for (unsigned int i = 0; i < count; ++i)
            all[i] = i;
        return all;
    }

    testing::Screen screen_;
    RealLog log_;
    std::unique_ptr<vela::CCS> ccs_;
};

TEST_F(Road, WhileTheLogStallsTheReaderGoesOnAndNoFrameIsRefusedLostOrOutOfOrder) {
    {
        const StalledLog stalled;
        send(0, 1000);  // the reader has taken all of them
        EXPECT_EQ(arrivals->unwritten(), 1000U);
        EXPECT_EQ(arrivals->waiting(), 900U);
    }
    showAll();
    EXPECT_EQ(shown(), upTo(1000));
    EXPECT_EQ(log_.text().find("Enqueue Failed"), std::string::npos);
    EXPECT_EQ(arrivals->losses().all(), 0U);
}

TEST_F(Road, TheQueueHasRoomForEachRecordThatIsDelivered) {
    send(0, 500);  // nobody shows any
    for (std::uint64_t seen = 0; seen < queueCapacity;) {
        const std::lock_guard guard(queueGuard);
        seen = static_cast<std::uint64_t>(event_queue.queuecount());
    }
    EXPECT_EQ(arrivals->waiting(), 400U);
    showAll();
    EXPECT_EQ(shown(), upTo(500));
    EXPECT_EQ(log_.text().find("Enqueue Failed"), std::string::npos);
}

// The queue has kept no nodes of earlier records, so each of the first ones needs memory.
TEST_F(Road, AFrameForWhichTheQueueHasNoMemoryIsCountedAndTheLogSaysSo) {
    std::destroy_at(&event_queue);
    std::construct_at(&event_queue, queueCapacity);
    refusedNodes = 2;
    send(0, 5);
    showAll();
    EXPECT_EQ(refusedNodes, 0);
    EXPECT_EQ(shown(), (std::vector<unsigned int>{2, 3, 4}));
    EXPECT_EQ(log_.text().substr(0, 32), "Enqueue Failed \nEnqueue Failed \n");
    EXPECT_EQ(arrivals->lostForWantOfMeans(), 2U);
    EXPECT_TRUE(traceLog.complete());
}

TEST_F(Road, AFrameAfterWhichNothingComesIsInTheFileBeforeTheDisplaySleepsAgain) {
    send(0, 1);
    constexpr std::uintmax_t unknown = ~std::uintmax_t{0};
    std::atomic<std::uintmax_t> sizeThen = unknown;
    SleeplessSystem system;
    system.insteadOfNapping = [&] {
        if (std::uintmax_t none = unknown; arrivals->unwritten() == 0)
            sizeThen.compare_exchange_strong(none, log_.size());
        sizeThen.notify_all();
    };
    Process.start(nullptr);
    sizeThen.wait(unknown);
    Process.cancel();
    Process.join();
    EXPECT_GT(sizeThen, 0U);
}

// The second frame comes so soon after the first one is written that it is not written at once.
TEST_F(Road, AFrameThatComesSoonAfterAnotherIsInTheFileOnceNothingMoreComes) {
    send(0, 1);
    constexpr int enough = 5;
    std::atomic<int> naps = 0;
    std::uintmax_t sizeOfFirst = 0;
    std::uintmax_t sizeOfBoth = 0;
    SleeplessSystem system;
    system.insteadOfNapping = [&] {
        if (arrivals->unwritten() != 0 || naps == enough)
            return;
        if (naps == 0) {
            sizeOfFirst = log_.size();
            auto second = std::make_unique<testing::Record>();
            testing::fill(*second, testing::received, 1, {0x00, 0x01, 0x73});
            HANDLE_L2Trace_events(nullptr, 32, second.release());
        }
        sizeOfBoth = log_.size();
        ++naps;
        naps.notify_all();
    };
    Process.start(nullptr);
    for (int seen = naps; seen < enough; seen = naps)
        naps.wait(seen);
    Process.cancel();
    Process.join();
    EXPECT_GT(sizeOfFirst, 0U);
    EXPECT_GT(sizeOfBoth, sizeOfFirst);
}

TEST_F(Road, ACancelledDisplayShowsWhatHasArrivedWhenTheArrivalsAreClosed) {
    send(0, 300);
    showAll();
    EXPECT_EQ(shown(), upTo(300));
    EXPECT_EQ(screen_.text(), "general Exception caught in lapdmon(215)\n");
}

TEST_F(Road, RecordsThatComeAfterTheArrivalsWereClosedAreDroppedSilently) {
    send(0, 3);
    arrivals->close();
    send(3, 3);
    showAll();
    EXPECT_EQ(shown(), upTo(3));
    EXPECT_EQ(arrivals->losses().all(), 0U);
}

TEST_F(Road, TheEndOfTheChannelDropsTheRecordsThatWait) {
    send(0, 500);
    ccs_.reset();  // would wait for ever for deliveries whose room nobody frees
    EXPECT_EQ(arrivals->waiting(), 0U);
}

class FullRoad : public Road {
  protected:
    FullRoad() : Road({.waiting = 50}) {}
};

TEST_F(FullRoad, TheNewestFramesAreLostAndTheLogSaysWhereAndStandardErrorOnce) {
    ::testing::internal::CaptureStderr();
    for (const unsigned int first : {0U, 1000U}) {
        {
            const StalledLog stalled;
            send(first, 400);  // 100 on their way, 50 wait
            EXPECT_EQ(arrivals->losses().noRoom, first == 0 ? 250U : 500U);
        }
        Process.start(nullptr);
        while (arrivals->unwritten() != 0)
            std::this_thread::yield();
        Process.cancel();
        Process.join();
    }
    EXPECT_EQ(::testing::internal::GetCapturedStderr(),
              "lapdmon: too many frames wait for the log, the next ones are lost\n");
    std::vector<unsigned int> wanted = upTo(150);
    for (unsigned int i = 0; i < 150; ++i)
        wanted.push_back(1000 + i);
    EXPECT_EQ(shown(), wanted);
    const std::string text = log_.text();
    const std::size_t gap = text.find("Frames Lost: 250 \n");
    EXPECT_LT(text.find("Frame: Time = 0.596\n"), gap) << "behind the last of the first 150";
    EXPECT_LT(gap, text.find("Frame: Time = 4.0\n")) << "and before the next one";
    EXPECT_EQ(text.find("Frames Lost", gap + 1), std::string::npos);
    EXPECT_EQ(arrivals->missing(), 250U) << "lost after the last one";
    EXPECT_TRUE(traceLog.complete());
}

}  // namespace
}  // namespace app
