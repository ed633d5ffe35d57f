#include "reader/Roles.h"

#include <gtest/gtest.h>

#include <string>

namespace reader {
namespace {

using capture::Role;

class RolesTest : public ::testing::Test {
  protected:
    // A frame, or with Kind::lost an event, of whose link this role is known.
    void take(Role role, capture::Item::Kind kind = capture::Item::Kind::frame) {
        capture::Item item;
        item.kind = kind;
        Seen seen;
        seen.item = &item;
        seen.role = role;
        roles_.take(seen, [this](const capture::Item& given) { give(given); });
    }
    void giveUp() {
        roles_.giveUp([this](const capture::Item& given) { give(given); });
    }
    void give(const capture::Item& item) {
        constexpr char letters[] = {'?', 'u', 'n'};
        told_ += item.isFrame() ? letters[static_cast<std::size_t>(item.frame.role)] : '-';
    }

    std::string told_;  // a letter for each item that was given on

  private:
    Chatter chatter_{Loudness::quiet};
    Roles roles_{chatter_};
};

TEST_F(RolesTest, GivesFramesOnWithTheRoleOfTheirLink) {
    take(Role::user);
    take(Role::network);
    EXPECT_EQ(told_, "un");
}

TEST_F(RolesTest, LetsFramesWaitForTheOneThatTells) {
    take(Role::unknown);
    take(Role::unknown, capture::Item::Kind::lost);
    take(Role::unknown);
    EXPECT_EQ(told_, "");
    take(Role::network);
    EXPECT_EQ(told_, "n-nn");
}

TEST_F(RolesTest, GivesUpAtTheEnd) {
    take(Role::unknown);
    giveUp();
    EXPECT_EQ(told_, "?");
}

TEST_F(RolesTest, WaitsForAThousandAndNoMore) {
    for (int i = 0; i < 999; ++i)
        take(Role::unknown);
    EXPECT_EQ(told_, "");
    take(Role::unknown);
    EXPECT_EQ(told_.size(), 1000U);
    take(Role::unknown);
    EXPECT_EQ(told_.size(), 1001U);
}

}  // namespace
}  // namespace reader
