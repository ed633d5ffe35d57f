#include "app/operator.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <string>
#include <utility>
#include <vector>

namespace app {
namespace {

// Standard input is a pipe; pauses take no time and are noted.
class OperatorTest : public testing::Test {
  protected:
    OperatorTest() : input_(dup(STDIN_FILENO)) { pauses.clear(); }
    ~OperatorTest() override {
        dup2(input_, STDIN_FILENO);
        close(input_);
    }

    void types(const std::string& text) {
        std::array<int, 2> ends{};
        ASSERT_EQ(pipe2(ends.data(), O_CLOEXEC), 0);
        ASSERT_EQ(write(ends[1], text.data(), text.size()), static_cast<ssize_t>(text.size()));
        ASSERT_EQ(dup2(ends[0], STDIN_FILENO), STDIN_FILENO);
        close(ends[0]);
        close(ends[1]);
    }
    // What awaitQuit has left unread.
    static std::string unread() {
        std::string text(100, ' ');
        text.resize(
            static_cast<std::size_t>(std::max<ssize_t>(read(STDIN_FILENO, text.data(), text.size()), 0)));
        return text;
    }

    static int noteThePause(pollfd* waited, nfds_t count, int timeoutMs) {
        if (timeoutMs < 0)
            return poll(waited, count, timeoutMs);
        pauses.push_back(timeoutMs);
        return 0;
    }
    static inline std::vector<int> pauses;

  private:
    int input_;
};

TEST_F(OperatorTest, QEndsTheTraceAtOnce) {
    types("q\n");
    EXPECT_EQ(awaitQuit(noteThePause), Ending::asked);
    EXPECT_EQ(pauses, std::vector<int>());
    EXPECT_EQ(unread(), "\n");
}

TEST_F(OperatorTest, EachOtherCharacterIsFollowedByAPauseOf10Seconds) {
    types("x\nq\n");
    EXPECT_EQ(awaitQuit(noteThePause), Ending::asked);
    EXPECT_EQ(pauses, (std::vector<int>{10000, 10000}));
    EXPECT_EQ(unread(), "\n");
}

TEST_F(OperatorTest, ACapitalQIsAnotherCharacter) {
    types("Qq");
    EXPECT_EQ(awaitQuit(noteThePause), Ending::asked);
    EXPECT_EQ(pauses, (std::vector<int>{10000}));
}

}  // namespace
}  // namespace app
