#include "capture/Frame.h"

#include <gtest/gtest.h>

namespace capture {
namespace {

TEST(VariantTest, ANameLeadsToItsVariantAndBack) {
    for (const char* name : {"4ess", "5ess", "dms100", "ntt", "net5", "ni2"}) {
        EXPECT_NE(variantNamed(name), Variant::unknown) << name;
        EXPECT_EQ(variantName(variantNamed(name)), name);
    }
    EXPECT_EQ(variantNamed("net5"), Variant::net5);
    EXPECT_EQ(variantNamed("4ess"), Variant::att4ess);
}

TEST(VariantTest, AnyOtherNameIsUnknown) {
    EXPECT_EQ(variantNamed("NET5"), Variant::unknown);
    EXPECT_EQ(variantNamed(""), Variant::unknown);
    EXPECT_EQ(variantName(Variant::unknown), "");
}

TEST(PlaceTest, ALineAndAPacketAreNamedAsToolsDo) {
    EXPECT_EQ(toString({"day.log", 17, Place::Unit::line}), "day.log:17");
    EXPECT_EQ(toString({"-", 3, Place::Unit::packet}), "-: packet 3");
}

}  // namespace
}  // namespace capture
