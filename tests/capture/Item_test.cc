#include "capture/Item.h"

#include <gtest/gtest.h>

#include <set>
#include <string_view>

namespace {

using capture::Item;

TEST(Item, EveryKindHasANameOfItsOwnThatLeadsBackToIt) {
    std::set<std::string_view> names;
    for (int i = 0; i <= static_cast<int>(Item::Kind::comment); ++i) {
        const auto kind = static_cast<Item::Kind>(i);
        names.insert(capture::kindName(kind));
        EXPECT_EQ(capture::kindNamed(capture::kindName(kind)), kind);
    }
    EXPECT_EQ(names.size(), 14U);
    EXPECT_EQ(names.count(""), 0U);
}

TEST(Item, KindsHaveTheNamesThatProgramsRead) {
    EXPECT_EQ(capture::kindName(Item::Kind::frame), "frame");
    EXPECT_EQ(capture::kindName(Item::Kind::lost), "frames-lost");
    EXPECT_EQ(capture::kindName(Item::Kind::restart), "restart");
    EXPECT_EQ(capture::kindName(Item::Kind::comment), "comment");
    EXPECT_EQ(capture::kindNamed("Frames Lost"), std::nullopt);
    EXPECT_EQ(capture::kindNamed(""), std::nullopt);
}

}  // namespace
