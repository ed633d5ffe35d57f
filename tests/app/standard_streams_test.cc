#include "app/standard_streams.h"

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <csignal>
#include <cstdlib>
#include <functional>
#include <iostream>
#include <map>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

namespace app {
namespace {

// Each test is a process of its own: its streams stay as they are made.
class StandardStreamsDeathTest : public testing::Test {
  protected:
    StandardStreamsDeathTest() { GTEST_FLAG_SET(death_test_style, "threadsafe"); }
};

template <typename Body>
[[noreturn]] void decoupled(Body body) {
    std::signal(SIGPIPE, SIG_IGN);
    decoupleStandardStreams();
    body();
    std::exit(3);
}

// The reading end of a pipe that the descriptor leads to from here on.
int readsWhatIsWrittenTo(int descriptor) {
    std::array<int, 2> ends{};
    if (pipe(ends.data()) != 0 || dup2(ends[1], descriptor) != descriptor || close(ends[1]) != 0)
        _exit(7);
    return ends[0];
}

TEST_F(StandardStreamsDeathTest, AnExitWaitsForWhatWasSaid) {
    EXPECT_EXIT(decoupled([] { std::cerr << "said at " << 1001 << ", no line end"; }),
                testing::ExitedWithCode(3), "^said at 1001, no line end$");
}

TEST_F(StandardStreamsDeathTest, AnAbortWaitsForWhatWasSaid) {
    EXPECT_EXIT(decoupled([] {
                    std::cerr << "the last words" << std::endl;
                    std::abort();
                }),
                testing::KilledBySignal(SIGABRT), "the last words");
}

TEST_F(StandardStreamsDeathTest, WhatIsSaidAfterTheEndIsWrittenAtOnce) {
    EXPECT_EXIT(decoupled([] {
                    endStandardStreams();
                    std::cerr << "said behind the end\n";
                    _exit(4);
                }),
                testing::ExitedWithCode(4), "said behind the end");
}

TEST_F(StandardStreamsDeathTest, AFullPipeDoesNotStopTheProgram) {
    EXPECT_EXIT(decoupled([] {
                    readsWhatIsWrittenTo(STDOUT_FILENO);  // which nobody does
                    for (int i = 0; i < 100000; ++i)
                        std::cout << "a line of words that nobody reads" << std::endl;
                    std::cerr << "the end" << std::endl;
                }),
                testing::ExitedWithCode(3), "^the end\n$");
}

// The test reads in the same process what it writes to standard error.
std::string saidBy(const std::vector<std::function<void()>>& talkers) {
    const int end = readsWhatIsWrittenTo(STDERR_FILENO);
    std::string text;
    std::thread reads([&] {
        std::array<char, 4096> some{};
        for (ssize_t got = 0; (got = read(end, some.data(), some.size())) > 0;)
            text.append(some.data(), static_cast<std::size_t>(got));
    });
    std::vector<std::thread> threads;
    for (const auto& each : talkers)
        threads.emplace_back(each);
    for (std::thread& each : threads)
        each.join();
    endStandardStreams();
    close(STDERR_FILENO);
    reads.join();
    return text;
}

TEST_F(StandardStreamsDeathTest, LinesOfSeveralThreadsDoNotMixThoughTheyComeInPieces) {
    const auto talker = [](int thread) {
        return [thread] {
            for (int i = 0; i < 250; ++i)
                std::cerr << thread << " says " << i << " in " << 5 << " pieces" << '\n';
        };
    };
    EXPECT_EXIT(decoupled([&] {
                    std::istringstream text(saidBy({talker(0), talker(1), talker(2), talker(3)}));
                    std::map<std::string, int> next;
                    bool good = true;
                    for (std::string line; std::getline(text, line);) {
                        const std::string thread = line.substr(0, 1);
                        good &= line == thread + " says " + std::to_string(next[thread]++) + " in 5 pieces";
                    }
                    const std::map<std::string, int> all{{"0", 250}, {"1", 250}, {"2", 250}, {"3", 250}};
                    _exit(good && next == all ? 5 : 6);
                }),
                testing::ExitedWithCode(5), "");
}

TEST_F(StandardStreamsDeathTest, AForkedChildWritesItsTexts) {
    EXPECT_EXIT(decoupled([] {
                    const pid_t child = fork();
                    if (child == 0) {
                        std::cerr << "the child" << std::endl;
                        _exit(0);
                    }
                    waitpid(child, nullptr, 0);
                    std::cerr << "the end" << std::endl;
                }),
                testing::ExitedWithCode(3), "^the child\nthe end\n$");
}

}  // namespace
}  // namespace app
