#include "app/protocol.h"

#include <gtest/gtest.h>

#include "tests/app/channels.h"

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

TEST(Protocol, OfType12IsReportedAsNI2AndDecodedAsVariant10) {
    const testing::Screen screen;
    const testing::Log log;
    EXPECT_EQ(reportProtocol(12), 10);
    EXPECT_EQ(screen.text(), "CCS protocol type is 12\nNI2 Switch\n");
    EXPECT_EQ(log.text(), "NI2 Switch \n");
}

TEST(Protocol, ThatCannotBeDecodedIsReportedAndNotLogged) {
    const testing::Screen screen;
    const testing::Log log;
    ::testing::internal::CaptureStderr();
    EXPECT_EQ(reportProtocol(10), std::nullopt);
    EXPECT_EQ(::testing::internal::GetCapturedStderr(),
              "Unknow Protocol -- I don't know how to interprete. Program is terminating!\n");
    EXPECT_EQ(screen.text(), "CCS protocol type is 10\n");
    EXPECT_EQ(log.text(), "");
}

}  // namespace
}  // namespace app
