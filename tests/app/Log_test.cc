#include "app/Log.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/file.h>
#include <sys/ioctl.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <csignal>
#include <cstdio>
#include <fstream>
#include <iostream>
#include <iterator>
#include <sstream>
#include <thread>

namespace {
// What flock reports instead of locking; 0: it locks.
int flockFails = 0;
}  // namespace

// In place of the C library's.
extern "C" int flock(int file, int operation) noexcept {
    errno = flockFails;
    return flockFails != 0 ? -1 : static_cast<int>(syscall(SYS_flock, file, operation));
}

namespace app {
namespace {

std::string contents(const std::string& path) {
    std::ostringstream text;
    text << std::ifstream(path).rdbuf();
    return text.str();
}

class LogTest : public testing::Test {
  protected:
    LogTest() {
        std::signal(SIGPIPE, SIG_IGN);
        std::signal(SIGXFSZ, SIG_IGN);
        getrlimit(RLIMIT_FSIZE, &before_);
        std::remove(path_.c_str());
        testing::internal::CaptureStderr();
    }
    ~LogTest() override {
        setrlimit(RLIMIT_FSIZE, &before_);
        std::remove(path_.c_str());
    }

    void limitFileSize(rlim_t octets) {
        rlimit limit = before_;
        limit.rlim_cur = octets;
        ASSERT_EQ(setrlimit(RLIMIT_FSIZE, &limit), 0);
    }

    void frame(char letter, std::size_t size) {
        log_.frameFollows();
        log_.write(std::string(size, letter));
    }

    // Closes the log and returns what was written to the standard error stream until then.
    std::string saidAtTheEnd() {
        log_.close();
        setrlimit(RLIMIT_FSIZE, &before_);  // standard error is a file meanwhile
        return testing::internal::GetCapturedStderr();
    }

    const std::string path_ = testing::TempDir() + "log-" + std::to_string(getpid());
    rlimit before_{};
    Log log_;
};

TEST_F(LogTest, HoldsLessThanABlockUntilTheEnd) {
    ASSERT_NE(log_.open(path_.c_str()), nullptr);
    frame('a', 4095);
    EXPECT_EQ(contents(path_), "");
    frame('b', 1);
    EXPECT_EQ(contents(path_), std::string(4095, 'a') + "b");
    frame('c', 1);
    EXPECT_EQ(saidAtTheEnd(), "");
    EXPECT_EQ(contents(path_), std::string(4095, 'a') + "bc");
    EXPECT_TRUE(log_.complete());
}

TEST_F(LogTest, RemovesAFrameThatIsInTheFileInPartAndSaysWhereFramesAreMissing) {
    ASSERT_NE(log_.open(path_.c_str()), nullptr);
    frame('a', 5000);
    limitFileSize(7000);
    frame('b', 1500);
    frame('c', 4000);  // with it the block is written; only 500 octets of it find room
    setrlimit(RLIMIT_FSIZE, &before_);
    const std::string kept = std::string(5000, 'a') + std::string(1500, 'b');
    EXPECT_EQ(contents(path_), kept);
    EXPECT_EQ(log_.lost(), 1U);
    frame('d', 5000);
    EXPECT_EQ(contents(path_), kept + "Frames Lost: 1 \n" + std::string(5000, 'd'));
    EXPECT_EQ(saidAtTheEnd(), path_ + ": File too large\n" + path_ + ": frames lost: 1\n");
    EXPECT_FALSE(log_.complete());
}

TEST_F(LogTest, SaysWhereFramesAreMissingThatWereLostBeforeTheyCameToTheLog) {
    ASSERT_NE(log_.open(path_.c_str()), nullptr);
    frame('a', 100);
    log_.framesMissing(7);
    frame('b', 100);
    EXPECT_EQ(saidAtTheEnd(), "");
    EXPECT_EQ(contents(path_), std::string(100, 'a') + "Frames Lost: 7 \n" + std::string(100, 'b'));
    EXPECT_EQ(log_.lost(), 0U);
    EXPECT_TRUE(log_.complete());
}

TEST_F(LogTest, AddsFramesLostEarlierToItsOwnWhenTheirLineCannotBeWritten) {
    ASSERT_NE(log_.open(path_.c_str()), nullptr);
    limitFileSize(1000);
    frame('a', 995);
    log_.framesMissing(7);  // its line does not fit behind the frame
    frame('b', 5000);
    setrlimit(RLIMIT_FSIZE, &before_);
    frame('c', 5000);
    EXPECT_TRUE(contents(path_) == std::string(995, 'a') + "Frames Lost: 8 \n" + std::string(5000, 'c'));
    EXPECT_EQ(saidAtTheEnd(), path_ + ": File too large\n" + path_ + ": frames lost: 1\n");
}

TEST_F(LogTest, WritesABlockBehindAGapWholeOrNotAtAll) {
    ASSERT_NE(log_.open(path_.c_str()), nullptr);
    limitFileSize(4200);
    frame('a', 5000);
    frame('b', 100);
    frame('c', 5000);
    EXPECT_EQ(log_.lost(), 3U);
    EXPECT_EQ(contents(path_), "");
    EXPECT_EQ(saidAtTheEnd(), path_ + ": File too large\n" + path_ + ": frames lost: 3\n");
}

TEST_F(LogTest, WritesAFrameWholeOrNotAtAll) {
    ASSERT_NE(log_.open(path_.c_str()), nullptr);
    frame('a', 5010);
    EXPECT_EQ(contents(path_), std::string(5010, 'a'));
    limitFileSize(10000);
    frame('b', 4995);
    EXPECT_EQ(contents(path_), std::string(5010, 'a'));
    EXPECT_EQ(saidAtTheEnd(), path_ + ": File too large\n" + path_ + ": frames lost: 1\n");
}

// Checks that each frame in the text is whole, and returns the letters of the frames. Adds the numbers in the
// lines of gaps to `said`.
std::string framesIn(const std::string& text, std::size_t size, unsigned long& said) {
    const std::string gap = "Frames Lost: ";
    std::string letters;
    for (std::size_t at = 0; at < text.size();) {
        if (text.compare(at, gap.size(), gap) == 0) {
            said += std::stoul(text.substr(at + gap.size()));
            at = text.find('\n', at) + 1;
        } else if (text.compare(at, size, std::string(size, text[at])) == 0) {
            letters += text[at];
            at += size;
        } else {
            return "no whole frame at " + std::to_string(at);
        }
    }
    return letters;
}

TEST_F(LogTest, KeepsWholeFramesAndCountsTheOthersWhereverTheFileEndsForAWhile) {
    constexpr std::size_t size = 1300;
    const std::string all = "abcdefghijklmnopqrst";
    for (rlim_t limit = 1; limit < 12 * size; limit += 61) {
        Log log;
        ASSERT_NE(log.open(path_.c_str()), nullptr);
        limitFileSize(limit);
        for (const char letter : all) {
            if (letter == 'm')
                setrlimit(RLIMIT_FSIZE, &before_);
            log.frameFollows();
            log.write(std::string(size, letter));
        }
        log.close();
        unsigned long said = 0;
        const std::string letters = framesIn(contents(path_), size, said);
        std::string kept;
        std::set_intersection(all.begin(), all.end(), letters.begin(), letters.end(),
                              std::back_inserter(kept));
        EXPECT_EQ(letters, kept) << "limit " << limit;  // in order, none twice
        EXPECT_EQ(letters.size() + log.lost(), all.size()) << "limit " << limit;
        EXPECT_EQ(said, log.lost()) << "limit " << limit;
        EXPECT_EQ(log.complete(), log.lost() == 0) << "limit " << limit;
    }
    static_cast<void>(saidAtTheEnd());
    std::cerr.clear();  // its file was under the limit as well
}

TEST_F(LogTest, AddsUpFramesThatAreMissingAtOnePlace) {
    ASSERT_NE(log_.open(path_.c_str()), nullptr);
    log_.framesMissing(7);
    log_.framesMissing(5);
    frame('a', 1);
    log_.framesMissing(3);
    EXPECT_EQ(saidAtTheEnd(), "");
    EXPECT_EQ(contents(path_), "Frames Lost: 12 \naFrames Lost: 3 \n");
}

TEST_F(LogTest, WritesWhatItHoldsWhenNothingWaits) {
    ASSERT_NE(log_.open(path_.c_str()), nullptr);
    frame('a', 1);
    log_.flush();
    EXPECT_EQ(contents(path_), "a");
    log_.flush();
    EXPECT_EQ(contents(path_), "a");
    EXPECT_EQ(saidAtTheEnd(), "");
}

TEST_F(LogTest, WritesALoneFrameAsSoonAsItHasCome) {
    ASSERT_NE(log_.open(path_.c_str()), nullptr);
    frame('a', 1);
    log_.flushIfDue();
    EXPECT_EQ(contents(path_), "a");
    EXPECT_EQ(saidAtTheEnd(), "");
}

TEST_F(LogTest, RetriesTheRestOfAFrameOnceWhenAPipeHasRefusedItAndNothingNewComes) {
    ASSERT_EQ(mkfifo(path_.c_str(), 0600), 0);
    const int reader = open(path_.c_str(), O_RDONLY | O_NONBLOCK);
    ASSERT_EQ(fcntl(reader, F_SETPIPE_SZ, 4096), 4096);
    ASSERT_NE(log_.open(path_.c_str()), nullptr);
    log_.giveUp();
    frame('a', 5000);
    std::array<char, 4096> some{};
    EXPECT_EQ(read(reader, some.data(), some.size()), 4096);
    log_.flush();
    EXPECT_EQ(read(reader, some.data(), some.size()), -1);
    frame('b', 1);
    log_.flush();
    EXPECT_EQ(read(reader, some.data(), some.size()), 905);
    close(reader);
    static_cast<void>(saidAtTheEnd());
}

TEST_F(LogTest, RefusesAFileThatAnotherLogWritesAndLeavesItAsItIs) {
    ASSERT_NE(log_.open(path_.c_str()), nullptr);
    frame('a', 5000);
    Log second;
    EXPECT_EQ(second.open(path_.c_str()), nullptr);
    EXPECT_EQ(errno, EWOULDBLOCK);
    second.close();
    EXPECT_EQ(contents(path_), std::string(5000, 'a'));
    EXPECT_EQ(saidAtTheEnd(), "");
    EXPECT_NE(second.open(path_.c_str()), nullptr);
    EXPECT_EQ(contents(path_), "");
}

TEST_F(LogTest, GoesOnWithoutALockWhereTheFileSystemHasNoneAndSaysSo) {
    flockFails = ENOLCK;
    const std::FILE* const stream = log_.open(path_.c_str());
    flockFails = 0;
    ASSERT_NE(stream, nullptr);
    frame('a', 1);
    EXPECT_EQ(saidAtTheEnd(), "lapdmon: cannot lock " + path_ +
                                  ": No locks available; make sure that no other trace writes to it\n");
    EXPECT_EQ(contents(path_), "a");
}

TEST_F(LogTest, DoesNotLockAFifo) {
    ASSERT_EQ(mkfifo(path_.c_str(), 0600), 0);
    const int reader = open(path_.c_str(), O_RDONLY | O_NONBLOCK);
    Log second;
    EXPECT_NE(log_.open(path_.c_str()), nullptr);
    EXPECT_NE(second.open(path_.c_str()), nullptr);
    close(reader);
    EXPECT_EQ(saidAtTheEnd(), "");
}

TEST_F(LogTest, GivesUpAWriteThatWaitsForAReader) {
    ASSERT_EQ(mkfifo(path_.c_str(), 0600), 0);
    const int reader = open(path_.c_str(), O_RDONLY | O_NONBLOCK);
    ASSERT_EQ(fcntl(reader, F_SETPIPE_SZ, 4096), 4096);
    ASSERT_NE(log_.open(path_.c_str()), nullptr);
    std::thread givesUpWhenThePipeIsFull([&] {
        for (int unread = 0; unread < 4096; ioctl(reader, FIONREAD, &unread))
            std::this_thread::yield();
        log_.giveUp();
    });
    frame('a', 5000);
    givesUpWhenThePipeIsFull.join();
    frame('b', 10);
    EXPECT_EQ(saidAtTheEnd(), path_ + ": given up, since nobody reads it\n" + path_ + ": frames lost: 2\n");
    close(reader);
}

TEST_F(LogTest, TakesOnlyTheNextEntryForTheFrameThatWasAnnounced) {
    ASSERT_NE(log_.open("/dev/full"), nullptr);
    frame('a', 10);
    log_.write("a line that is no frame\n");
    EXPECT_EQ(saidAtTheEnd(), "/dev/full: No space left on device\n/dev/full: frames lost: 1\n");
}

TEST_F(LogTest, CountsOnlyFramesAsLost) {
    ASSERT_NE(log_.open("/dev/full"), nullptr);
    log_.write("head\n");
    frame('a', 10);
    EXPECT_EQ(saidAtTheEnd(), "/dev/full: No space left on device\n/dev/full: frames lost: 1\n");
}

TEST_F(LogTest, GivesANewReaderOfAPipeTheRestOfTheFrameFirst) {
    ASSERT_EQ(mkfifo(path_.c_str(), 0600), 0);
    int reader = open(path_.c_str(), O_RDONLY | O_NONBLOCK);
    ASSERT_EQ(fcntl(reader, F_SETPIPE_SZ, 4096), 4096);
    ASSERT_NE(log_.open(path_.c_str()), nullptr);
    std::thread goesWhenThePipeIsFull([&] {
        for (int unread = 0; unread < 4096; ioctl(reader, FIONREAD, &unread))
            std::this_thread::yield();
        close(reader);
    });
    frame('a', 10000);
    goesWhenThePipeIsFull.join();
    EXPECT_EQ(log_.lost(), 0U);

    reader = open(path_.c_str(), O_RDONLY | O_NONBLOCK);
    fcntl(reader, F_SETFL, 0);
    std::string text;
    std::thread reads([&] {
        std::array<char, 4096> some{};
        for (ssize_t got = 1; got > 0;) {
            got = read(reader, some.data(), some.size());
            text.append(some.data(), static_cast<std::size_t>(std::max<ssize_t>(got, 0)));
        }
    });
    frame('b', 5000);
    EXPECT_EQ(saidAtTheEnd(), path_ + ": Broken pipe\n" + path_ + ": frames lost: 0\n");
    reads.join();
    close(reader);
    EXPECT_EQ(text, std::string(10000, 'a') + std::string(5000, 'b'));
}

}  // namespace
}  // namespace app
