#include "fleet/ship/LogInput.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>

#include "InputText.h"
#include "Recordings.h"

namespace {

using fleet::InputEvent;
using fleet::LogInput;
using fleet::Place;

// The log is lines of hexadecimal digits, which are followed as a log is. Frames are shown without their run,
// which is a time.
class LogInputTest : public testing::Test {
  protected:
    void write(const std::string& text, std::ios::openmode mode = std::ios::app) const {
        std::ofstream(path_, mode) << text;
    }

    std::string rest(LogInput& input) {
        std::string all;
        InputEvent event;
        while (input.next(event)) {
            std::string text = fleet_tests::textOf(event);
            if (const std::size_t slash = text.find('/'); slash != std::string::npos)
                text.erase(text[0] == '(' ? 1 : 0, slash + (text[0] == '(' ? 0 : 1));
            all += (all.empty() ? "" : " ") + text;
            run_ = event.run;
        }
        return all;
    }

    Place place(const LogInput& input, std::uint64_t next) const { return {run_, next, false, input.log()}; }

    fleet_tests::Folder folder_;
    std::string path_ = folder_.file("trunk.log");
    std::uint64_t run_ = 0;  // of the newest event
};

constexpr char one[] = "TX 2026-11-21T11:25:33Z 0001ff01\n";
constexpr char two[] = "RX 2026-11-21T11:25:34Z 0001ff02\n";
constexpr char three[] = "TX 2026-11-21T11:25:35Z 0001ff03\n";

TEST_F(LogInputTest, ALogThatIsNotThereYetIsWaitedFor) {
    LogInput input(path_, "pri1", {});
    EXPECT_EQ(rest(input), "");
    write(one);
    EXPECT_EQ(rest(input), "1:0001ff01");
    write(two);
    EXPECT_EQ(rest(input), "2:0001ff02");
    EXPECT_GT(run_, 1'600'000'000'000'000U) << "microseconds since 1970";
    ASSERT_TRUE(input.log());
    EXPECT_EQ(input.log()->hex, "0001ff01");
}

TEST_F(LogInputTest, TheSameLogIsTheSameRunAndGoesOn) {
    write(std::string(one) + two);
    LogInput first(path_, "pri1", {});
    EXPECT_EQ(rest(first), "1:0001ff01 2:0001ff02");
    const std::uint64_t run = run_;
    LogInput second(path_, "pri1", place(first, 2));
    write(three);
    EXPECT_EQ(rest(second), "(1:0001ff01) 2:0001ff02 3:0001ff03");
    EXPECT_EQ(run_, run);
}

TEST_F(LogInputTest, ALogThatWasReplacedMeanwhileEndsTheRunInAGap) {
    write(std::string(one) + two);
    LogInput first(path_, "pri1", {});
    rest(first);
    const Place left = place(first, 3);
    std::filesystem::remove(path_);
    write(two);
    LogInput second(path_, "pri1", left);
    EXPECT_EQ(rest(second), "end@3+gap 1:0001ff02");
    EXPECT_GT(run_, left.run);
}

TEST_F(LogInputTest, ALogThatIsEmptiedWhileItIsReadBeginsANewRun) {
    write(std::string(one) + two);
    LogInput input(path_, "pri1", {});
    rest(input);
    const std::uint64_t run = run_;
    write(three, std::ios::trunc);
    EXPECT_EQ(rest(input), "end@3+gap 1:0001ff03");
    EXPECT_GT(run_, run);
    EXPECT_EQ(input.log()->hex, "0001ff03");
}

TEST_F(LogInputTest, ARunWhoseEndWasShippedIsNotGoneOnWith) {
    write(one);
    LogInput first(path_, "pri1", {});
    rest(first);
    Place ended = place(first, 2);
    ended.isEnded = true;
    LogInput second(path_, "pri1", ended);
    EXPECT_EQ(rest(second), "1:0001ff01");
    EXPECT_GT(run_, ended.run);
}

TEST_F(LogInputTest, AFifoBeginsANewRunEachTimeAndWaitsForNobody) {
    ASSERT_EQ(mkfifo(path_.c_str(), 0600), 0);
    Place place;
    {
        LogInput first(path_, "pri1", {});
        EXPECT_EQ(rest(first), "");
        write(std::string(one) + two);
        EXPECT_EQ(rest(first), "1:0001ff01 2:0001ff02");
        EXPECT_FALSE(first.log());
        place = this->place(first, 3);
    }
    LogInput second(path_, "pri1", place);
    EXPECT_EQ(rest(second), "");
    write(three);
    EXPECT_EQ(rest(second), "end@3+gap 1:0001ff03");
}

}  // namespace
