// A log that is read while it grows, is emptied, or is replaced.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <memory>

#include "tests/lapdlog/logs.h"

namespace lapdlog {
namespace {

using namespace testing;
using capture::Reader;
using capture::testing::Folder;
using capture::testing::itemsOf;

class FollowTest : public ::testing::Test {
  protected:
    FollowTest() {
        setenv("TZ", "UTC", 1);
        tzset();
    }

    void write(const std::string& text) const { folder_.write("day.log", text); }
    void append(const std::string& text) const {
        std::ofstream(path_, std::ios::app | std::ios::binary) << text;
    }
    void open() {
        const std::vector<capture::Form> forms = logAlone();
        reader_ = capture::openReader(path_, {.follow = true}, forms);
    }
    // What has come, in few words: "run frame frame ".
    std::string more() {
        std::string words;
        capture::Item item;
        Reader::Next next = reader_->next(item);
        for (; next == Reader::Next::item; next = reader_->next(item)) {
            const std::string shown = capture::testing::shown(item);
            words += shown.substr(0, shown.find(' ')) + " ";
        }
        return words + (next == Reader::Next::end ? "end" : "");
    }

    Folder folder_;
    std::string path_ = folder_ / "day.log";
    std::unique_ptr<Reader> reader_;
};

const std::string frame = textOf(true, 1, sabme);
const std::string other = textOf(false, 2, setup);

TEST_F(FollowTest, ALogMayGrowFromNothingOctetByOctet) {
    write("");
    open();
    EXPECT_EQ(more(), "");
    const std::string all = net5Head + frame + "Frames Lost: 3 \n" + other;
    std::string words;
    for (const char c : all) {
        append({c});
        words += more();
    }
    EXPECT_EQ(words, "run frame lost frame ");
}

TEST_F(FollowTest, AWholeFrameIsGivenAtOnce) {
    write(net5Head + frame + other.substr(0, 200));
    open();
    EXPECT_EQ(more(), "run frame ");
    append(other.substr(200));
    EXPECT_EQ(more(), "frame ");
}

TEST_F(FollowTest, AFrameOfTenOctetsComesAtOnce) {
    write(net5Head + textOf(false, 2, tenOctets));
    open();
    EXPECT_EQ(more(), "run frame ");
}

TEST_F(FollowTest, ALogThatIsEmptiedInPlaceBeginsAnew) {
    write(net5Head + frame + frame);
    open();
    EXPECT_EQ(more(), "run frame frame ");
    write(net5Head + frame);
    EXPECT_EQ(more(), "replaced run frame ");
    append(other);
    EXPECT_EQ(more(), "frame ");
}

TEST_F(FollowTest, ALogThatIsEmptiedAndLongerAgainBeginsAnew) {
    write(net5Head + frame);
    open();
    EXPECT_EQ(more(), "run frame ");
    write(net5Head + other + other + other);
    EXPECT_EQ(more(), "replaced run frame frame frame ");
}

TEST_F(FollowTest, ALogThatIsReplacedIsReadToItsEndFirst) {
    write(net5Head + frame);
    open();
    EXPECT_EQ(more(), "run frame ");
    append(frame);
    std::filesystem::rename(path_, folder_ / "day.log.1");
    write(net5Head + other);
    EXPECT_EQ(more(), "frame replaced run frame ");
}

TEST_F(FollowTest, AFrameThatTheOldLogEndsInIsCut) {
    write(net5Head + frame + other.substr(0, 100));
    open();
    EXPECT_EQ(more(), "run frame ");
    std::filesystem::rename(path_, folder_ / "day.log.1");
    EXPECT_EQ(more(), "");
    write(net5Head + other);
    EXPECT_EQ(more(), "cut replaced run frame ");
}

TEST_F(FollowTest, AnEmptyLogMayBeReplacedByAnother) {
    write("");
    open();
    EXPECT_EQ(more(), "");
    std::filesystem::rename(path_, folder_ / "day.log.1");
    write(net5Head + other);
    EXPECT_EQ(more(), "run frame ");
}

TEST_F(FollowTest, AFifoGoesOnWithAnotherWriter) {
    ASSERT_EQ(mkfifo(path_.c_str(), 0600), 0);
    int writer = ::open(path_.c_str(), O_RDWR | O_CLOEXEC);  // so that opening waits for nobody
    open();
    EXPECT_EQ(more(), "");
    const std::string text = net5Head + frame + frame.substr(0, 50);
    ASSERT_EQ(::write(writer, text.data(), text.size()), static_cast<ssize_t>(text.size()));
    EXPECT_EQ(more(), "run frame ");
    ::close(writer);
    EXPECT_EQ(more(), "");
    writer = ::open(path_.c_str(), O_WRONLY | O_CLOEXEC);
    const std::string rest = frame.substr(50) + other;
    ASSERT_EQ(::write(writer, rest.data(), rest.size()), static_cast<ssize_t>(rest.size()));
    EXPECT_EQ(more(), "frame frame ");
    ::close(writer);
}

TEST_F(FollowTest, WaitingEndsWhenTheLogHasGrown) {
    write(net5Head);
    open();
    EXPECT_EQ(more(), "run ");
    append(frame);
    reader_->wait(std::chrono::hours(1));
    EXPECT_EQ(more(), "frame ");
}

TEST(PipedLog, PausesWhileNothingIsThere) {
    int ends[2];
    ASSERT_EQ(pipe(ends), 0);
    const std::vector<capture::Form> forms = logAlone();
    const auto reader = capture::openReader("/proc/self/fd/" + std::to_string(ends[0]), {}, forms);
    capture::Item item;
    const std::string text = net5Head + frame;
    EXPECT_EQ(reader->next(item), Reader::Next::pause);
    ASSERT_EQ(::write(ends[1], text.data(), text.size()), static_cast<ssize_t>(text.size()));
    EXPECT_EQ(reader->next(item), Reader::Next::item);
    EXPECT_EQ(reader->next(item), Reader::Next::item);
    EXPECT_TRUE(item.isFrame());
    EXPECT_EQ(reader->next(item), Reader::Next::pause);
    ::close(ends[1]);
    EXPECT_EQ(reader->next(item), Reader::Next::end);
    ::close(ends[0]);
}

}  // namespace
}  // namespace lapdlog
