#include "reader/outputs.h"

#include <gtest/gtest.h>

#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <vector>

#include "reader/errors.h"

namespace reader {
namespace {

class OutputsTest : public ::testing::Test {
  protected:
    void SetUp() override {
        folder_ = std::filesystem::path(::testing::TempDir()) /
                  ("outputs." + std::to_string(getpid()) + "." +
                   ::testing::UnitTest::GetInstance()->current_test_info()->name());
        std::filesystem::create_directories(folder_);
    }
    void TearDown() override { std::filesystem::remove_all(folder_); }

    std::string file(const std::string& name, const std::string& contents) const {
        std::ofstream(folder_ / name, std::ios::binary) << contents;
        return folder_ / name;
    }
    std::string path(const std::string& name) const { return folder_ / name; }

  private:
    std::filesystem::path folder_;
};

bool beginsWithA(std::string_view beginning) { return beginning.starts_with("A"); }

TEST_F(OutputsTest, MayBeNewOrEmptyOrOfTheForm) {
    EXPECT_NO_THROW(checkOutput(path("new"), {}, "an A", beginsWithA));
    EXPECT_NO_THROW(checkOutput(file("empty", ""), {}, "an A", beginsWithA));
    EXPECT_NO_THROW(checkOutput(file("old", "ABC"), {}, "an A", beginsWithA));
    EXPECT_NO_THROW(checkOutput("/dev/null", {}, "an A", beginsWithA));
}

TEST_F(OutputsTest, MayNotHoldSomethingElse) {
    EXPECT_THROW(checkOutput(file("other", "BCD"), {}, "an A", beginsWithA), FileError);
}

TEST_F(OutputsTest, MayNotBeAnInputByAnyName) {
    const std::vector<std::string> inputs{file("in", "A")};
    std::filesystem::create_symlink(inputs[0], path("link"));
    EXPECT_THROW(checkOutput(inputs[0], inputs, "an A", beginsWithA), FileError);
    EXPECT_THROW(checkOutput(path("link"), inputs, "an A", beginsWithA), FileError);
}

}  // namespace
}  // namespace reader
