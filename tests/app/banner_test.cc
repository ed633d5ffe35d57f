#include "app/banner.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "tests/app/channels.h"

namespace app {
namespace {

using ::testing::MatchesRegex;

TEST(Banner, IsTheSameOnTheScreenAndInTheLog) {
    const testing::Screen screen;
    const testing::Log log;
    telvar_header();
    EXPECT_EQ(log.text(), screen.text());
    EXPECT_THAT(screen.text(), MatchesRegex("\nOrvane KV9 ISDN Trace Utility\n"
                                            "[^\n]+\n"                              // the maker's notice
                                            "[^ \n]+ 1[.]00-Build-04 lapdmon\n"));  // the version record
}

TEST(Banner, IsOnTheScreenAloneWhenThereIsNoLog) {
    const testing::Screen screen;
    const testing::Log log;
    decoder::file_output = false;
    telvar_header();
    EXPECT_EQ(log.text(), "");
    EXPECT_THAT(screen.text(), ::testing::StartsWith("\nOrvane KV9 ISDN Trace Utility\n"));
}

}  // namespace
}  // namespace app
