#include "app/StreamWriter.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <poll.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <csignal>
#include <string>
#include <thread>

namespace app {
namespace {

using std::chrono::hours;
using std::chrono::milliseconds;

// A pipe whose reader is the test.
class Pipe {
  public:
    Pipe() {
        EXPECT_EQ(pipe2(ends_.data(), O_CLOEXEC), 0);
        EXPECT_EQ(fcntl(ends_[0], F_SETPIPE_SZ, 4096), 4096);
    }
    ~Pipe() {
        close(ends_[0]);
        close(ends_[1]);
    }
    Pipe(const Pipe&) = delete;
    Pipe& operator=(const Pipe&) = delete;

    int writer() const { return ends_[1]; }
    void goes() { close(std::exchange(ends_[0], -1)); }

    // Waits for it.
    std::string read(std::size_t size) const {
        std::string text(size, '\0');
        for (std::size_t have = 0; have < size;)
            have += static_cast<std::size_t>(
                std::max<ssize_t>(::read(ends_[0], text.data() + have, size - have), 0));
        return text;
    }
    std::string readLine() const {
        std::string line;
        while (line.empty() || line.back() != '\n')
            line += read(1);
        return line;
    }
    bool isEmpty() const {
        pollfd waited{ends_[0], POLLIN, 0};
        return poll(&waited, 1, 0) == 0;
    }
    // Until nothing more can be written.
    void awaitFull() const {
        for (pollfd waited{ends_[1], POLLOUT, 0}; poll(&waited, 1, 0) != 0;)
            std::this_thread::yield();
    }

  private:
    std::array<int, 2> ends_{-1, -1};
};

std::string textOf(char letter, std::size_t size) { return std::string(size - 1, letter) + "\n"; }

class StreamWriterTest : public testing::Test {
  protected:
    StreamWriterTest() { std::signal(SIGPIPE, SIG_IGN); }

    // Until the writer's thread waits for a reader, `first` having filled the pipe.
    void stall(StreamWriter& writer, std::size_t stream, const Pipe& pipe, const std::string& first) {
        writer.write(stream, first);
        pipe.awaitFull();
    }

    Pipe out_;
    Pipe err_;
};

TEST_F(StreamWriterTest, WritesTextsInTheOrderInWhichTheyCame) {
    StreamWriter writer({out_.writer(), err_.writer()});
    for (int i = 0; i < 1000; ++i)
        writer.write(0, std::to_string(i) + "\n");
    for (int i = 0; i < 1000; ++i)
        ASSERT_EQ(out_.readLine(), std::to_string(i) + "\n");
}

TEST_F(StreamWriterTest, KeepsTheOrderOfStreamsThatLeadToOnePlace) {
    StreamWriter writer({out_.writer(), out_.writer()});
    std::string expected;
    for (std::size_t i = 0; i < 400; ++i) {
        writer.write(i * i % 7 % 2, std::to_string(i) + "\n");
        expected += std::to_string(i) + "\n";
    }
    EXPECT_EQ(out_.read(expected.size()), expected);
}

// Each text fills the pipe, and the reader makes room for the next one just when the writer looks.
TEST_F(StreamWriterTest, KeepsTheOrderOfStreamsThatLeadToOneFullPipe) {
    constexpr std::size_t texts = 8000, size = 4096;
    StreamWriter writer({out_.writer(), out_.writer()}, texts * size);
    const auto letterOf = [](std::size_t i) { return static_cast<char>('a' + i % 26); };
    for (std::size_t i = 0; i < texts; ++i)
        writer.write(i % 2, textOf(letterOf(i), size));
    for (std::size_t i = 0; i < texts; ++i)
        ASSERT_EQ(out_.read(size), textOf(letterOf(i), size)) << i;
}

TEST_F(StreamWriterTest, WritesAllTextsForWhichThereIsRoom) {
    StreamWriter writer({out_.writer()}, 30000);
    stall(writer, 0, out_, textOf('a', 10000));
    writer.write(0, textOf('b', 10000));
    writer.write(0, textOf('c', 10000));
    EXPECT_EQ(out_.read(30000), textOf('a', 10000) + textOf('b', 10000) + textOf('c', 10000));
    writer.end(hours(1));
    EXPECT_TRUE(out_.isEmpty());
}

TEST_F(StreamWriterTest, DropsTextsForWhichThereIsNoRoomAndSaysHowManyLinesOnceTheStreamIsRead) {
    StreamWriter writer({out_.writer()}, 30000);
    stall(writer, 0, out_, textOf('a', 10000));
    writer.write(0, textOf('b', 20000));
    writer.write(0, "one\ntwo\n");  // no room
    writer.write(0, "three");
    EXPECT_EQ(out_.read(30000), textOf('a', 10000) + textOf('b', 20000));
    EXPECT_EQ(out_.readLine(), "lapdmon: nobody read this stream, lines dropped here: 3\n");
    writer.write(0, "four\n");
    EXPECT_EQ(out_.readLine(), "four\n");
}

TEST_F(StreamWriterTest, DropsNewTextsUntilTheWaitingOnesAreWritten) {
    StreamWriter writer({out_.writer()}, 20000);
    stall(writer, 0, out_, textOf('a', 10000));
    writer.write(0, textOf('b', 10000));
    writer.write(0, "lost\n");
    EXPECT_EQ(out_.read(10000), textOf('a', 10000));
    out_.awaitFull();  // with b, so that a waits no more
    writer.write(0, "lost too, though there is room\n");
    EXPECT_EQ(out_.read(10000), textOf('b', 10000));
    EXPECT_EQ(out_.readLine(), "lapdmon: nobody read this stream, lines dropped here: 2\n");
}

TEST_F(StreamWriterTest, TakesATextThatIsLargerThanTheBoundWhenNothingWaits) {
    StreamWriter writer({out_.writer()}, 100);
    writer.write(0, textOf('a', 10000));
    EXPECT_EQ(out_.read(10000), textOf('a', 10000));
}

TEST_F(StreamWriterTest, AStreamThatNobodyReadsDoesNotDelayTheOthers) {
    StreamWriter writer({out_.writer(), err_.writer()});
    stall(writer, 0, out_, textOf('a', 10000));
    writer.write(1, "here\n");
    EXPECT_EQ(err_.readLine(), "here\n");
    EXPECT_EQ(out_.read(10000), textOf('a', 10000));
}

TEST_F(StreamWriterTest, CountsLinesWhoseWriteFailedAndSaysSoWhenAWriteWorks) {
    Pipe other;
    const int swapped = dup(out_.writer());
    StreamWriter writer({swapped, err_.writer()});
    out_.goes();
    writer.write(0, "one\n");
    writer.write(0, "two\n");
    writer.write(1, "all was tried\n");
    EXPECT_EQ(err_.readLine(), "all was tried\n");
    ASSERT_EQ(dup2(other.writer(), swapped), swapped);
    writer.write(0, "three\n");
    EXPECT_EQ(other.readLine(), "lapdmon: nobody read this stream, lines dropped here: 2\n");
    EXPECT_EQ(other.readLine(), "three\n");
    writer.end(hours(1));
    close(swapped);
}

TEST_F(StreamWriterTest, TheEndWaitsUntilAllIsWritten) {
    StreamWriter writer({out_.writer()});
    stall(writer, 0, out_, textOf('a', 10000));
    std::string text;
    std::thread reads([&] { text = out_.read(10000); });
    writer.end(hours(1));
    reads.join();
    EXPECT_EQ(text, textOf('a', 10000));
}

TEST_F(StreamWriterTest, TheEndWaitsNoLongerThanItsLimit) {
    StreamWriter writer({out_.writer(), err_.writer()});
    stall(writer, 0, out_, textOf('a', 10000));
    writer.end(milliseconds(1));
    writer.write(0, "finds no room\n");
    writer.write(1, "finds room\n");
    EXPECT_EQ(err_.readLine(), "finds room\n");
}

TEST_F(StreamWriterTest, AwaitWrittenWaitsForAllText) {
    StreamWriter writer({out_.writer()});
    writer.write(0, "a\n");
    writer.awaitWritten(hours(1));
    EXPECT_FALSE(out_.isEmpty());
}

TEST_F(StreamWriterTest, AwaitWrittenWaitsNoLongerThanItsLimit) {
    StreamWriter writer({out_.writer()});
    stall(writer, 0, out_, textOf('a', 10000));
    writer.awaitWritten(milliseconds(3));
    EXPECT_EQ(out_.read(10000), textOf('a', 10000));
}

TEST_F(StreamWriterTest, AForkedChildWritesItsOwnTextsAlone) {
    StreamWriter writer({out_.writer(), err_.writer()});
    stall(writer, 0, out_, textOf('a', 10000));
    writer.beforeFork();
    const pid_t child = fork();
    if (child == 0) {
        writer.afterForkInChild(milliseconds(60000));
        writer.write(1, "the child\n");
        writer.end(hours(1));
        _exit(0);
    }
    writer.afterForkInParent();
    int status = -1;
    ASSERT_EQ(waitpid(child, &status, 0), child);
    EXPECT_EQ(status, 0);
    writer.write(1, "the parent\n");
    EXPECT_EQ(err_.readLine(), "the child\n");
    EXPECT_EQ(err_.readLine(), "the parent\n");
    EXPECT_EQ(out_.read(10000), textOf('a', 10000));
}

TEST_F(StreamWriterTest, TextsOfSeveralThreadsDoNotMix) {
    StreamWriter writer({out_.writer()});
    std::vector<std::thread> threads;
    for (const char letter : {'a', 'b', 'c', 'd'}) {
        threads.emplace_back([&writer, letter] {
            for (int i = 0; i < 100; ++i)
                writer.write(0, textOf(letter, 700));
        });
    }
    std::array<int, 4> seen{};
    for (int i = 0; i < 400; ++i) {
        const std::string line = out_.readLine();
        ASSERT_EQ(line, textOf(line[0], 700));
        ++seen.at(static_cast<std::size_t>(line[0] - 'a'));
    }
    EXPECT_EQ(seen, (std::array<int, 4>{100, 100, 100, 100}));
    for (std::thread& each : threads)
        each.join();
}

}  // namespace
}  // namespace app
