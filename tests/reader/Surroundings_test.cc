#include "reader/Surroundings.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <map>

#include "recording/files.h"

namespace reader {
namespace {

constexpr std::int64_t second = 1'000'000'000;

// Writes the second of each frame, and comments as they are.
class FakeWriter : public capture::Writer {
  public:
    explicit FakeWriter(int file) : file_(file) {}
    void write(const capture::Item& item) override {
        const bool isComment = item.kind == capture::Item::Kind::comment;
        recording::writeAll(file_, isComment ? "<" + std::string(item.text) + ">"
                                             : " " + std::to_string(item.frame.time / second) + "/" +
                                                   std::to_string(item.frame.octets.size()));
    }
    void flush() override {}
    void finish() override {}

  private:
    int file_;
};

const Form form{"txt", "text", false, nullptr, "", nullptr, [](int file, const std::string&) {
                    return std::unique_ptr<capture::Writer>(std::make_unique<FakeWriter>(file));
                }};

class SurroundingsTest : public ::testing::Test {
  protected:
    void SetUp() override {
        folder_ = std::filesystem::path(::testing::TempDir()) /
                  ("surroundings." + std::to_string(getpid()) + "." +
                   ::testing::UnitTest::GetInstance()->current_test_info()->name());
        std::filesystem::create_directories(folder_);
        rules_.before = 5 * second;
        rules_.after = 3 * second;
        rules_.files.folder = folder_;
        rules_.files.form = &form;
        rules_.files.mark = "kept";
    }
    void TearDown() override { std::filesystem::remove_all(folder_); }

    static capture::Item frame(std::int64_t at, std::size_t size = 4) {
        static const std::vector<std::uint8_t> octets(300);
        capture::Item item;
        item.frame.octets = std::span(octets).first(size);
        item.frame.clock = capture::Clock::absolute;
        item.frame.time = at * second;
        return item;
    }
    static void pass(Surroundings& surroundings, std::int64_t from, std::int64_t to) {
        for (std::int64_t at = from; at <= to; ++at)
            surroundings.take(frame(at));
    }
    std::map<std::string, std::string> files() const {
        std::map<std::string, std::string> found;
        for (const auto& entry : std::filesystem::directory_iterator(folder_)) {
            std::ifstream file(entry.path());
            found[entry.path().filename()] = std::string(std::istreambuf_iterator<char>(file), {});
        }
        return found;
    }

    std::filesystem::path folder_;
    SurroundingsRules rules_;
    Chatter chatter_{Loudness::quiet};
};

using Files = std::map<std::string, std::string>;

TEST_F(SurroundingsTest, AreKeptFromBeforeTheTriggerUntilAfterIt) {
    Surroundings surroundings(rules_, "t", chatter_);
    pass(surroundings, 1, 20);
    surroundings.trigger("a storm");
    pass(surroundings, 21, 30);
    EXPECT_EQ(files(),
              (Files{{"t.19700101T000015Z.kept.txt",
                      "<lapdread: kept because of a storm> 15/4 16/4 17/4 18/4 19/4 20/4 21/4 22/4 23/4"}}));
}

TEST_F(SurroundingsTest, BeginWithTheFramesAskedForThoughTheRecordersStartHasNoTime) {
    Surroundings surroundings(rules_, "t", chatter_);
    capture::Item start;
    start.kind = capture::Item::Kind::run;
    surroundings.take(start);
    pass(surroundings, 1, 3);
    surroundings.trigger("early");
    pass(surroundings, 4, 20);
    surroundings.trigger("late");
    pass(surroundings, 21, 24);
    EXPECT_EQ(files(),
              (Files{{"t.19700101T000001Z.kept.txt",
                      "<lapdread: kept because of early> 0/0 1/4 2/4 3/4 4/4 5/4 6/4"},
                     {"t.19700101T000015Z.kept.txt",
                      "<lapdread: kept because of late> 15/4 16/4 17/4 18/4 19/4 20/4 21/4 22/4 23/4"}}));
}

TEST_F(SurroundingsTest, AreProlongedByATriggerWithinThem) {
    Surroundings surroundings(rules_, "t", chatter_);
    pass(surroundings, 1, 1);
    surroundings.trigger("one");
    pass(surroundings, 2, 4);
    surroundings.trigger("two");
    pass(surroundings, 5, 9);
    EXPECT_EQ(
        files(),
        (Files{
            {"t.19700101T000001Z.kept.txt",
             "<lapdread: kept because of one> 1/4 2/4 3/4 4/4<lapdread: kept because of two> 5/4 6/4 7/4"}}));
}

TEST_F(SurroundingsTest, WriteNothingWithoutATrigger) {
    Surroundings surroundings(rules_, "t", chatter_);
    surroundings.trigger("nothing has come yet");
    pass(surroundings, 1, 20);
    surroundings.finish();
    EXPECT_EQ(files(), Files());
}

TEST_F(SurroundingsTest, TakeBoundedMemory) {
    rules_.before = 1'000'000 * second;
    Surroundings surroundings(rules_, "t", chatter_);
    constexpr std::int64_t many = Surroundings::mostItems + 3;
    for (std::int64_t at = 1; at <= many; ++at)
        surroundings.take(frame(at, 0));
    surroundings.trigger("full");
    surroundings.finish();
    const Files kept = files();
    ASSERT_EQ(kept.size(), 1U);
    EXPECT_TRUE(kept.begin()->second.starts_with("<lapdread: kept because of full> 4/0 5/0 "));
    EXPECT_TRUE(kept.begin()->second.ends_with(" " + std::to_string(many) + "/0"));
}

}  // namespace
}  // namespace reader
