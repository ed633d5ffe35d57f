#include "fleet/utf8.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>

namespace {

using namespace std::string_view_literals;

TEST(CleanUtf8, KeepsWhatIsValidAndReplacesWhatIsNot) {
    struct Case {
        std::string_view says, text, clean;
    };
    for (const Case& each : {
             Case{"nothing", "", ""},
             Case{"ASCII, control characters too", "a\n\x7f", "a\n\x7f"},
             Case{"two, three and four octets", "\xc3\xa9\xe2\x82\xac\xf0\x9f\x98\x80",
                  "\xc3\xa9\xe2\x82\xac\xf0\x9f\x98\x80"},
             Case{"a NUL", "a\0b"sv, "a?b"},
             Case{"an octet alone", "a\x80z\xff", "a?z?"},
             Case{"a character that is cut off", "a\xe2\x82", "a??"},
             Case{"overlong forms", "\xc0\x80\xe0\x80\x80\xf0\x80\x80\x80", "?????????"},
             Case{"a surrogate", "\xed\xa0\x80", "???"},
             Case{"beyond the last character", "\xf4\x90\x80\x80", "????"},
             Case{"the last character", "\xf4\x8f\xbf\xbf", "\xf4\x8f\xbf\xbf"},
         })
        EXPECT_EQ(fleet::cleanUtf8(each.text, 100), each.clean) << each.says;
}

TEST(CleanUtf8, CutsBetweenCharacters) {
    EXPECT_EQ(fleet::cleanUtf8("ab\xc3\xa9z", 3), "ab");
    EXPECT_EQ(fleet::cleanUtf8("ab\xc3\xa9z", 4), "ab\xc3\xa9");
    EXPECT_EQ(fleet::cleanUtf8("abc", 0), "");
}

}  // namespace
