#include "redaction/Key.h"

#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <sstream>

namespace redaction {
namespace {

class KeyFile : public ::testing::Test {
  protected:
    void SetUp() override {
        std::string name = std::filesystem::temp_directory_path() / "lapdread-key.XXXXXX";
        ASSERT_NE(mkdtemp(name.data()), nullptr);
        folder_ = name;
    }
    void TearDown() override { std::filesystem::remove_all(folder_); }

    std::string path() const { return folder_ / "key"; }
    void hold(const std::string& text) const {
        std::ofstream(path()) << text;
        ASSERT_EQ(chmod(path().c_str(), 0600), 0);
    }
    std::string held() const {
        std::ostringstream text;
        text << std::ifstream(path()).rdbuf();
        return text.str();
    }

  private:
    std::filesystem::path folder_;
};

TEST_F(KeyFile, readsBackAsItWasWritten) {
    const Key key = randomKey({.keepPrefix = 3, .blankShort = true});
    writeKey(path(), key);
    const auto read = readKey(path());
    ASSERT_TRUE(read);
    EXPECT_EQ(read->secret, key.secret);
    EXPECT_EQ(read->manner, key.manner);
}

TEST_F(KeyFile, isForItsOwnerAlone) {
    const mode_t before = umask(0);
    writeKey(path(), randomKey({}));
    umask(before);
    struct stat about {};
    ASSERT_EQ(stat(path().c_str(), &about), 0);
    EXPECT_EQ(about.st_mode & 0777U, 0600U);
}

TEST_F(KeyFile, isRefusedIfOthersMayReadOrWriteIt) {
    writeKey(path(), randomKey({}));
    for (const mode_t mode : {0640U, 0604U, 0620U, 0602U, 0666U}) {
        ASSERT_EQ(chmod(path().c_str(), mode), 0);
        EXPECT_THROW(readKey(path()), KeyError) << mode;
    }
    ASSERT_EQ(chmod(path().c_str(), 0400), 0);
    EXPECT_TRUE(readKey(path()));
}

TEST_F(KeyFile, thatDoesNotExistIsNoKey) { EXPECT_FALSE(readKey(path())); }

TEST_F(KeyFile, isNotWrittenOver) {
    hold("my diary");
    EXPECT_THROW(writeKey(path(), randomKey({})), KeyError);
    EXPECT_EQ(held(), "my diary");
}

TEST_F(KeyFile, thatHoldsNoKeyIsRefused) {
    writeKey(path(), randomKey({.keepPrefix = 2, .blankShort = false}));
    const std::string good = held();
    std::vector<std::string> bad{"", good + "\n", good.substr(1), "x" + good, good + good};
    for (std::size_t size = 0; size < good.size(); ++size)
        bad.push_back(good.substr(0, size));
    for (std::size_t i = 0; i < good.size(); ++i) {
        std::string changed = good;
        changed[i] = '?';
        bad.push_back(changed);
    }
    std::string many = good;
    many.replace(many.find("keep-prefix 2"), 13, "keep-prefix 10");
    bad.push_back(many);
    for (const std::string& text : bad) {
        hold(text);
        EXPECT_THROW(readKey(path()), KeyError) << text;
    }
    hold(good);
    EXPECT_TRUE(readKey(path()));
}

TEST_F(KeyFile, thatIsNoFileIsRefused) {
    EXPECT_THROW(readKey(std::filesystem::temp_directory_path()), KeyError);
    EXPECT_THROW(writeKey(path() + "/key", randomKey({})), KeyError);
}

TEST(Key, isAnotherOneEachTime) { EXPECT_NE(randomKey({}).secret, randomKey({}).secret); }

}  // namespace
}  // namespace redaction
