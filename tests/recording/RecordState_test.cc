#include "recording/RecordState.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>

namespace recording {
namespace {

class RecordStateTest : public ::testing::Test {
  protected:
    void SetUp() override {
        folder_ = std::filesystem::path(::testing::TempDir()) /
                  ("state." + std::to_string(getpid()) + "." +
                   ::testing::UnitTest::GetInstance()->current_test_info()->name());
        std::filesystem::create_directories(folder_);
        path_ = statePath(folder_, "t");
    }
    void TearDown() override { std::filesystem::remove_all(folder_); }

    std::string written() const {
        std::ifstream file(path_);
        return {std::istreambuf_iterator<char>(file), {}};
    }

    std::filesystem::path folder_;
    std::string path_;
};

RecordState example() {
    RecordState state;
    state.trunk = "b1 \"d1\"";
    state.run = 1'795'260'333'000'001;
    state.next = 1001;
    state.besides = 2;
    state.log = RecordedLog{"/var/log/x.log", 1003, 1004, -5, 1006, "00017f"};
    state.files = {{"t.20261121T112533Z.pcapng", 7, 1},
                   {"t.20261121T122533Z.pcapng", 1'795'260'333'000'001, 900}};
    return state;
}

TEST_F(RecordStateTest, IsWrittenAsThePageDescribes) {
    EXPECT_EQ(writeState(example(), path_), std::nullopt);
    EXPECT_EQ(
        written(),
        "{\"v\":1,\n"
        "\"trunk\":\"b1 \\\"d1\\\"\",\n"
        "\"run\":1795260333000001,\n"
        "\"next\":1001,\n"
        "\"besides\":2,\n"
        "\"log\":{\"device\":1003,\"first\":{\"hex\":\"00017f\",\"ticks\":1006,\"time\":-5},\"inode\":1004,"
        "\"path\":\"/var/log/x.log\"},\n"
        "\"files\":[\n"
        "{\"name\":\"t.20261121T112533Z.pcapng\",\"run\":7,\"first\":1},\n"
        "{\"name\":\"t.20261121T122533Z.pcapng\",\"run\":1795260333000001,\"first\":900}\n"
        "]}\n");
    EXPECT_FALSE(std::filesystem::exists(path_ + ".new"));
}

TEST_F(RecordStateTest, IsReadAsItWasWritten) {
    const RecordState state = example();
    EXPECT_EQ(writeState(state, path_), std::nullopt);
    const auto read = readState(path_);
    ASSERT_TRUE(read);
    EXPECT_EQ(read->trunk, state.trunk);
    EXPECT_EQ(read->run, state.run);
    EXPECT_EQ(read->next, state.next);
    EXPECT_EQ(read->besides, state.besides);
    ASSERT_TRUE(read->log);
    EXPECT_EQ(read->log->path, state.log->path);
    EXPECT_TRUE(read->log->holdsTheSameAs(*state.log));
    ASSERT_EQ(read->files.size(), 2U);
    EXPECT_EQ(read->files[1].name, state.files[1].name);
    EXPECT_EQ(read->files[1].run, state.files[1].run);
    EXPECT_EQ(read->files[1].first, 900U);
}

TEST_F(RecordStateTest, MayHaveNoLogAndNoFiles) {
    RecordState state;
    state.trunk = "\xff";  // no UTF-8
    EXPECT_EQ(writeState(state, path_), std::nullopt);
    const auto read = readState(path_);
    ASSERT_TRUE(read);
    EXPECT_FALSE(read->log);
    EXPECT_TRUE(read->files.empty());
}

TEST_F(RecordStateTest, IsEmptyIfThereIsNoFile) { EXPECT_FALSE(readState(path_)); }

TEST_F(RecordStateTest, ThatIsCutOffIsRefusedWithTheFilesName) {
    EXPECT_EQ(writeState(example(), path_), std::nullopt);
    const std::string whole = written();
    for (std::size_t size = 0; size + 2 < whole.size(); ++size) {
        std::ofstream(path_) << whole.substr(0, size);
        try {
            readState(path_);
            ADD_FAILURE() << size;
        } catch (const std::runtime_error& error) {
            EXPECT_TRUE(std::string(error.what()).starts_with(path_ + ": ")) << error.what();
        }
    }
}

TEST_F(RecordStateTest, ThatCannotBeWrittenLeavesTheOldOne) {
    EXPECT_EQ(writeState(example(), path_), std::nullopt);
    const std::string before = written();
    std::filesystem::create_directory(path_ + ".new");  // in the way
    EXPECT_EQ(writeState(RecordState(), path_), "cannot write " + path_ + ": Is a directory");
    EXPECT_EQ(written(), before);
}

TEST(RecordedLog, IsAnotherOneIfAnythingButItsPathDiffers) {
    const RecordedLog log{"a", 1, 2, 3, 4, "05"};
    EXPECT_TRUE(log.holdsTheSameAs({"b", 1, 2, 3, 4, "05"}));
    const RecordedLog others[] = {{"a", 9, 2, 3, 4, "05"}, {"a", 1, 9, 3, 4, "05"}, {"a", 1, 2, 9, 4, "05"},
                                  {"a", 1, 2, 3, 9, "05"}, {"a", 1, 2, 3, 4, "09"}, {"a", 1, 2, 3, {}, "05"}};
    for (const RecordedLog& other : others)
        EXPECT_FALSE(log.holdsTheSameAs(other));
}

TEST(Run, IsNumberedBehindAllBeforeThoughTheClockWasSetBack) {
    RecordState state = example();
    state.run = UINT64_MAX / 2;
    beginRun(state, std::nullopt);
    EXPECT_EQ(state.run, UINT64_MAX / 2 + 1);
    EXPECT_EQ(state.next, 1U);
    EXPECT_EQ(state.besides, 0U);
    EXPECT_FALSE(state.log);
}

}  // namespace
}  // namespace recording
