#include "hostsvc/hostnames.h"

#include <gtest/gtest.h>

#include <array>

namespace {

TEST(Hostnames, ATextIsANameWhenACharacterComesAfterNine) {
    constexpr struct {
        const char* text;
        int name;
    } cases[] = {{"10.0.0.1", 0}, {"relay", 1}, {"", 0},           {"10.0.0.1:7000", 1},
                 {"10-0", 0},     {"7a", 1},    {"\xe9\xff.1", 0}, {"10 0/#", 0},
                 {";", 1},        {"9", 0}};
    for (const auto& each : cases)
        EXPECT_EQ(is_dn(each.text), each.name) << each.text;
}

TEST(Hostnames, ANumberIsDecimalOrHexadecimalBehindALowerCasePrefix) {
    constexpr struct {
        const char* text;
        int number;
    } cases[] = {{"42", 42},      {"-42", -42},       {"0", 0},          {"", 0},
                 {"7000 ", 7000}, {"0x10", 16},       {"-0x10", -16},    {"0xffff", 65535},
                 {"0X1F", 0},     {"-0X1F", 0},       {"x", 0},          {"relay", 0},
                 {"12x", 0},      {"0xffffffff", -1}, {"-0xffffffff", 1}};
    for (const auto& each : cases)
        EXPECT_EQ(stn(each.text), each.number) << each.text;
}

TEST(Hostnames, ANameBecomesItsAddress) {
    std::array<char, 16> address{};
    dntoip(address.data(), "localhost");
    EXPECT_STREQ(address.data(), "127.0.0.1");
}

TEST(Hostnames, ANameThatNobodyKnowsLeavesNothing) {
    for (const char* name : {"", "no such name"}) {
        std::array<char, 16> address{"before"};
        dntoip(address.data(), name);
        EXPECT_STREQ(address.data(), "") << name;
    }
}

TEST(Hostnames, AnAddressIsItsOwnName) {
    std::array<char, 16> address{};
    dntoip(address.data(), "255.254.253.252");
    EXPECT_STREQ(address.data(), "255.254.253.252");
}

}  // namespace
