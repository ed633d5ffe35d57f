#include "app/protocol.h"

#include <gtest/gtest.h>

#include "decoder/trunks.h"

namespace app {
namespace {

TEST(Protocol, HasAVariantAndALineForTheScreenAndForTheLog) {
    const Protocol expected[] = {
        {1, 1, "4ESS Switch ", "4ESS Switch \n"},    {2, 2, "5ESS Switch ", "5ESS Switch \n"},
        {3, 3, "DMS100 Switch", "DMS100 Switch \n"}, {4, 4, "NTT Switch", "NTT Switch \n"},
        {7, 7, "NET5 Switch", "NET5 Switch \n"},     {12, 10, "NI2 Switch", "NI2 Switch \n"},
    };
    for (const Protocol& row : expected) {
        const Protocol* const found = protocolOf(row.type);
        ASSERT_NE(found, nullptr) << row.type;
        EXPECT_EQ(found->type, row.type);
        EXPECT_EQ(found->variant, row.variant);
        EXPECT_EQ(found->screenLine, row.screenLine);
        EXPECT_EQ(found->logLine, row.logLine);
    }
}

TEST(Protocol, OfAnyOtherTypeIsUnknown) {
    for (const unsigned int type : {0U, 5U, 6U, 8U, 9U, 10U, 11U, 13U, 0x10007U, 0xFFFFFFFFU})
        EXPECT_EQ(protocolOf(type), nullptr) << type;
}

}  // namespace
}  // namespace app
