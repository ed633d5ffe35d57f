#include "reader/RotatingFile.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>
#include <fstream>
#include <set>

#include "recording/files.h"

namespace reader {
namespace {

using Kind = capture::Item::Kind;

// Writes "[N]" for a frame of N octets and "<N>" for N lost ones, at each flush, and fails while `full` is
// set.
bool full = false;

class FakeWriter : public capture::Writer {
  public:
    explicit FakeWriter(int file) : file_(file) {}

    void write(const capture::Item& item) override {
        if (item.kind == Kind::lost)
            text_ += "<" + std::to_string(item.count) + ">";
        else
            text_ += "[" + std::to_string(item.frame.octets.size()) + "]";
    }
    void flush() override {
        if (full && !text_.empty()) {
            recording::writeAll(file_, "[");  // a disk that is full takes some of it
            throw capture::WriteError("no room", ENOSPC);
        }
        recording::writeAll(file_, text_);
        text_.clear();
    }
    void finish() override {
        flush();
        recording::writeAll(file_, ".");
    }

  private:
    int file_;
    std::string text_;
};

const Form form{"txt",
                "text",
                false,
                nullptr,
                "",
                nullptr,
                [](int file, const std::string&) -> std::unique_ptr<capture::Writer> {
                    return std::make_unique<FakeWriter>(file);
                }};

constexpr std::int64_t second = 1'000'000'000;
constexpr std::int64_t november = 1'795'260'333 * second;  // 2026-11-21 11:25:33 UTC

class RotatingFileTest : public ::testing::Test {
  protected:
    void SetUp() override {
        full = false;
        const auto* const test = ::testing::UnitTest::GetInstance()->current_test_info();
        folder_ = std::filesystem::path(::testing::TempDir()) /
                  ("rotating." + std::to_string(getpid()) + "." + test->name());
        std::filesystem::create_directories(folder_);
        rules_.folder = folder_;
        rules_.form = &form;
    }
    void TearDown() override { std::filesystem::remove_all(folder_); }

    static capture::Item frame(std::int64_t time, std::size_t size = 4) {
        static const std::vector<std::uint8_t> octets(300);
        capture::Item item;
        item.frame.octets = std::span(octets).first(size);
        item.frame.clock = capture::Clock::absolute;
        item.frame.time = time;
        return item;
    }

    // "name=contents" of each file.
    std::set<std::string> files() const {
        std::set<std::string> found;
        for (const auto& entry : std::filesystem::directory_iterator(folder_)) {
            std::ifstream file(entry.path());
            found.insert(entry.path().filename().string() + "=" +
                         std::string(std::istreambuf_iterator<char>(file), {}));
        }
        return found;
    }

    std::filesystem::path folder_;
    RotationRules rules_;
    Chatter chatter_{Loudness::quiet};
};

using Files = std::set<std::string>;

TEST_F(RotatingFileTest, IsNamedAfterItsFirstItemOnceItIsFinished) {
    RotatingFile file(rules_, "pri1", chatter_);
    file.write(frame(november));
    file.write(frame(november + 7 * second, 5));
    file.flush();
    EXPECT_EQ(files(), Files{"pri1.20261121T112533Z.txt.part=[4][5]"});
    file.finish();
    EXPECT_EQ(files(), Files{"pri1.20261121T112533Z.txt=[4][5]."});
}

TEST_F(RotatingFileTest, IsNamedAfterAFrameThoughTheRecordersStartHasNoTime) {
    RotatingFile file(rules_, "pri1", chatter_);
    capture::Item start;
    start.kind = Kind::run;
    file.write(start);
    EXPECT_EQ(files(), Files());
    file.write(frame(november));
    file.finish();
    EXPECT_EQ(files(), Files{"pri1.20261121T112533Z.txt=[0][4]."});
}

TEST_F(RotatingFileTest, NeverWritesOverAnother) {
    for (int i = 0; i < 3; ++i) {
        RotatingFile file(rules_, "t", chatter_);
        file.write(frame(november, 4 + i));
    }
    EXPECT_EQ(files(), (Files{"t.20261121T112533Z.txt=[4].", "t.20261121T112533Z.2.txt=[5].",
                              "t.20261121T112533Z.3.txt=[6]."}));
}

TEST_F(RotatingFileTest, BeginsAnewAtEachMultipleOfThePeriod) {
    rules_.period = 60;
    RotatingFile file(rules_, "t", chatter_);
    file.write(frame(november));
    file.write(frame(november + 26 * second, 5));  // 11:25:59
    file.write(frame(november + 27 * second, 6));  // 11:26:00
    file.finish();
    EXPECT_EQ(files(), (Files{"t.20261121T112533Z.txt=[4][5].", "t.20261121T112600Z.txt=[6]."}));
}

TEST_F(RotatingFileTest, KeepsTheNewestOfItsOwn) {
    rules_.kept = 2;
    std::ofstream(folder_ / "t.note.txt") << "mine";
    std::ofstream(folder_ / "t2.20200101T000000Z.txt") << "other";
    RotatingFile file(rules_, "t", chatter_);
    for (int i = 0; i < 4; ++i) {
        file.write(frame(november + i * second, 4 + i));
        file.finish();
    }
    EXPECT_EQ(files(), (Files{"t.20261121T112535Z.txt=[6].", "t.20261121T112536Z.txt=[7].", "t.note.txt=mine",
                              "t2.20200101T000000Z.txt=other"}));
}

TEST_F(RotatingFileTest, BeginsNoFileForAFrameThatIsALittleLate) {
    rules_.period = 60;
    RotatingFile file(rules_, "t", chatter_);
    file.write(frame(november + 27 * second));     // 11:26:00
    file.write(frame(november + 26 * second, 5));  // 11:25:59
    file.write(frame(november - 34 * second, 6));  // 11:24:59: the clock was set back
    file.finish();
    EXPECT_EQ(files(), (Files{"t.20261121T112600Z.txt=[4][5].", "t.20261121T112459Z.txt=[6]."}));
}

TEST_F(RotatingFileTest, EndsWithItsPeriodAlthoughNothingComes) {
    rules_.period = 60;
    RotatingFile file(rules_, "t", chatter_);
    file.write(frame(november));  // 11:25:33
    file.flush();
    constexpr std::int64_t hostSecond = november / second;
    file.passTime(hostSecond + 28);  // 11:26:01: frames of the minute before may still come
    EXPECT_EQ(files(), Files{"t.20261121T112533Z.txt.part=[4]"});
    file.passTime(hostSecond + 29);
    EXPECT_EQ(files(), Files{"t.20261121T112533Z.txt=[4]."});
}

TEST_F(RotatingFileTest, KeepsFilesThatAreNotOlderThanTheSpan) {
    rules_.span = 60;
    RotatingFile file(rules_, "t", chatter_);
    for (const int at : {0, 20, 40, 80}) {
        file.write(frame(november + at * second));
        file.finish();
    }
    // The first ended at 20, more than a minute before 81; the second has what came up to 40.
    file.write(frame(november + 81 * second));
    file.finish();
    EXPECT_EQ(files(), (Files{"t.20261121T112553Z.txt=[4].", "t.20261121T112613Z.txt=[4].",
                              "t.20261121T112653Z.txt=[4].", "t.20261121T112654Z.txt=[4]."}));
}

TEST_F(RotatingFileTest, WithAMarkIsNotRemovedByOnesWithoutAMark) {
    RotationRules marked = rules_;
    marked.mark = "kept";
    {
        RotatingFile kept(marked, "t", chatter_);
        kept.write(frame(november));
        kept.finish();
        kept.write(frame(november, 5));
    }
    rules_.kept = 1;
    RotatingFile file(rules_, "t", chatter_);
    for (const std::size_t size : {6, 7}) {
        file.write(frame(november, size));
        file.finish();
    }
    EXPECT_EQ(files(), (Files{"t.20261121T112533Z.kept.txt=[4].", "t.20261121T112533Z.2.kept.txt=[5].",
                              "t.20261121T112533Z.2.txt=[7]."}));
}

TEST_F(RotatingFileTest, KeepsTheRecordsInTheFileWhenTheDiskIsFull) {
    RotatingFile file(rules_, "t", chatter_);
    file.write(frame(november));
    file.flush();
    full = true;
    file.write(frame(november + second, 5));
    file.write(frame(november + second, 5));
    file.flush();
    EXPECT_EQ(files(), Files{"t.20261121T112533Z.txt=[4]"});  // cut back to what was whole
    EXPECT_EQ(file.lostInAll(), 2U);
    file.write(frame(november + 2 * second, 6));  // too early for another attempt
    EXPECT_EQ(file.lostInAll(), 3U);
}

TEST_F(RotatingFileTest, LeavesNothingIfNothingCouldBeWritten) {
    full = true;
    RotatingFile file(rules_, "t", chatter_);
    file.write(frame(november));
    file.flush();
    EXPECT_EQ(files(), Files{});
    EXPECT_EQ(file.lostInAll(), 1U);
}

TEST_F(RotatingFileTest, SaysHowManyAreMissingOnceItGoesOn) {
    RotatingFile file(rules_, "t", chatter_);
    file.retryEvery(std::chrono::seconds(0));
    full = true;
    file.write(frame(november));
    file.flush();
    full = false;
    file.write(frame(november + second, 5));
    file.finish();
    EXPECT_EQ(files(), Files{"t.20261121T112534Z.txt=<1>[5]."});
}

TEST(FileName, LeadsToNoOtherFolder) {
    EXPECT_EQ(recording::fileNameOf("b1.d1"), "b1.d1");
    EXPECT_EQ(recording::fileNameOf("../x/y z"), "_._x_y_z");
    EXPECT_EQ(recording::fileNameOf(""), "trunk");
    EXPECT_EQ(recording::fileNameOf(std::string("a\0b", 3)), "a_b");
}

}  // namespace
}  // namespace reader
