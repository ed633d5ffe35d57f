#include "reader/browse/CallList.h"

#include <gtest/gtest.h>

#include "Stage.h"

namespace reader::browse {
namespace {

using testing::Stage;

constexpr auto always = Screen::Clock::time_point::max();

calls::Call callNumbered(std::uint64_t number, const std::string& called, std::int64_t duration) {
    calls::Call call;
    call.number = number;
    call.begin.frame = number;
    call.called.digits = called;
    call.duration = duration;
    call.outcome = calls::Outcome::answered;
    call.endedBy = calls::EndedBy::release;
    return call;
}

class CallListTest : public ::testing::Test {
  protected:
    CallListTest() : browser_({}), list_(browser_) {}

    void come(std::initializer_list<calls::Call> calls) {
        Update update;
        Changes changes;
        for (const calls::Call& call : calls) {
            update.calls.emplace(call.number, call);
            changes.calls.push_back(call.number);
        }
        browser_.apply(std::move(update));
        list_.changed(changes);
    }
    std::vector<std::uint64_t> shown() {
        while (list_.work(always)) {
        }
        std::vector<std::uint64_t> numbers;
        for (std::size_t i = 0; i < list_.size(); ++i)
            numbers.push_back(list_[i]);
        return numbers;
    }
    using Numbers = std::vector<std::uint64_t>;

    Browser browser_;
    CallList list_;
};

TEST_F(CallListTest, ShowsCallsInTheOrderOfTheirBeginning) {
    come({callNumbered(2, "200", 1), callNumbered(1, "100", 9)});
    EXPECT_EQ(shown(), (Numbers{1, 2}));
}

TEST_F(CallListTest, WordsMustAllBeInTheLineWhateverTheirCase) {
    come({callNumbered(1, "4021", 1), callNumbered(2, "4022", 1), callNumbered(3, "5021", 1)});
    list_.setFilter("402 ANSWERED");
    EXPECT_EQ(shown(), (Numbers{1, 2}));
    list_.setFilter("402 !4022");
    EXPECT_EQ(shown(), (Numbers{1}));
    list_.setFilter("");
    EXPECT_EQ(shown(), (Numbers{1, 2, 3}));
}

TEST_F(CallListTest, SomeWordsAskForMoreThanTheLine) {
    calls::Call failed = callNumbered(2, "200", 0);
    failed.outcome = calls::Outcome::congestion;
    calls::Call open = callNumbered(3, "300", 0);
    open.endedBy = calls::EndedBy::open;
    open.outcome = calls::Outcome::open;
    come({callNumbered(1, "100", 1), failed, open});
    browser_.marked().calls = {1};
    list_.setFilter("failed");
    EXPECT_EQ(shown(), (Numbers{2}));
    list_.setFilter("open");
    EXPECT_EQ(shown(), (Numbers{3}));
    list_.setFilter("marked");
    EXPECT_EQ(shown(), (Numbers{1}));
    list_.setFilter("!open !failed");
    EXPECT_EQ(shown(), (Numbers{1}));
}

TEST_F(CallListTest, ACallThatChangesMovesOrGoes) {
    come({callNumbered(1, "100", 10), callNumbered(2, "200", 30), callNumbered(3, "300", 20)});
    list_.setOrder(1);  // by duration, the longest first
    EXPECT_EQ(shown(), (Numbers{2, 3, 1}));
    come({callNumbered(1, "100", 40)});
    EXPECT_EQ(shown(), (Numbers{1, 2, 3}));
    EXPECT_EQ(list_.find(2), 1U);
    list_.setFilter("200");
    EXPECT_EQ(shown(), (Numbers{2}));
    come({callNumbered(2, "999", 30), callNumbered(3, "200", 20)});
    EXPECT_EQ(shown(), (Numbers{3}));
    EXPECT_FALSE(list_.find(2));
}

TEST_F(CallListTest, ACallThatHasGoneIsNotShownAnyMore) {
    come({callNumbered(1, "100", 1), callNumbered(2, "200", 1)});
    EXPECT_EQ(shown().size(), 2U);
    list_.changed({{}, {1}, false});
    EXPECT_EQ(shown(), (Numbers{2}));
}

TEST_F(CallListTest, LongWorkGoesOnInPieces) {
    constexpr std::uint64_t many = 1000;
    for (std::uint64_t i = 1; i <= many; ++i)
        come({callNumbered(i, std::to_string(i), static_cast<std::int64_t>(i % 7))});
    list_.setOrder(1);
    const auto past = Screen::Clock::time_point::min();
    EXPECT_TRUE(list_.work(past));
    const std::size_t first = list_.size();
    EXPECT_GT(first, 0U);
    EXPECT_LT(first, many);
    while (list_.work(past)) {
    }
    ASSERT_EQ(list_.size(), many);
    for (std::size_t i = 0; i + 1 < many; ++i)
        EXPECT_LT(std::pair(-browser_.trace().call(list_[i])->duration.value(), list_[i]),
                  std::pair(-browser_.trace().call(list_[i + 1])->duration.value(), list_[i + 1]));
}

}  // namespace
}  // namespace reader::browse
