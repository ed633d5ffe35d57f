// What names a person and what stays, element by element. What is replaced appears as x (78) or ee, what is
// blanked as 00.
#include "redaction/plan.h"

#include <gtest/gtest.h>

#include "tests/isdn/hex.h"
#include "tests/redaction/redacted.h"

namespace redaction {
namespace {

using isdn::Variant;
using isdn::testing::hex;
using test::Bytes;

std::string redactedFrame(const Bytes& octets, Variant variant) {
    test::ConstantPseudonyms pseudonyms;
    return test::textOf(test::redacted({{octets, false}}, pseudonyms, variant)[0].octets);
}

struct ElementCase {
    const char* says;
    Variant variant;
    const char* octets;
    const char* expected;
};

// clang-format off
constexpr ElementCase elementCases[] = {
    {"type and plan of a called number stay", Variant::net5,
     "70 08 a1 30 33 30 31 32 33 34", "70 08 a1 78 78 78 78 78 78 78"},
    {"presentation and screening of a calling number stay", Variant::net5,
     "6c 06 21 a3 31 32 33 34", "6c 06 21 a3 78 78 78 78"},
    {"connected number", Variant::net5, "4c 05 21 80 31 32 33", "4c 05 21 80 78 78 78"},
    {"connected number of old", Variant::ess4, "0c 05 21 80 31 32 33", "0c 05 21 80 78 78 78"},
    {"redirecting number: the reason stays", Variant::net5,
     "74 06 21 01 82 31 32 33", "74 06 21 01 82 78 78 78"},
    {"redirection number", Variant::net5, "76 05 21 80 31 32 33", "76 05 21 80 78 78 78"},
    {"original called number", Variant::dms100, "73 07 21 00 01 82 31 32 33", "73 07 21 00 01 82 78 78 78"},
    {"* and # stay", Variant::net5, "2c 05 2a 32 31 2a 23", "2c 05 2a 78 78 2a 23"},
    {"subaddress, user-specified", Variant::net5, "71 04 a0 12 34 56", "71 04 a0 ee ee ee"},
    {"subaddress, NSAP: its authority stays", Variant::net5, "6d 05 80 50 41 42 43", "6d 05 80 50 78 78 78"},
    {"subaddress behind an octet that says that its group goes on", Variant::net5,
     "71 04 20 12 34 56", "71 04 20 00 00 00"},
    {"display", Variant::net5, "28 04 4a 6f 68 6e", "28 04 78 78 78 78"},
    {"display with its kind", Variant::ni2, "28 05 b1 4a 6f 68 6e", "28 05 b1 78 78 78 78"},
    {"display of fields: tags and lengths stay", Variant::dms100,
     "28 0b 80 8d 04 4a 6f 68 6e 9e 02 31 32", "28 0b 80 8d 04 78 78 78 78 9e 02 78 78"},
    {"display of fields with a wrong length, which stays wrong", Variant::dms100,
     "28 06 80 8d 09 4a 6f 68", "28 06 80 ff ff ff ff ff"},
    {"user-user, characters", Variant::net5, "7e 05 04 54 65 73 74", "7e 05 04 78 78 78 78"},
    {"user-user, octets", Variant::net5, "7e 04 00 12 34 56", "7e 04 00 ee ee ee"},
    {"call identity", Variant::net5, "10 02 31 32", "10 02 ee ee"},
    {"service profile", Variant::ni2, "3a 04 35 35 35 31", "3a 04 78 78 78 78"},
    {"generic digits", Variant::ni2, "9e 37 04 01 21 43 65", "9e 37 04 01 ee ee ee"},
    {"unknown in codeset 4", Variant::net5, "9c 32 03 41 42 43 9c 70 03 31 32 33", "9c 32 03 00 00 00 9c 70 03 00 00 00"},
    {"unknown in codeset 5", Variant::net5, "9d 01 02 12 34", "9d 01 02 00 00"},
    {"unknown in codeset 6, locked", Variant::net5, "96 01 02 12 34 28 02 41 42", "96 01 02 00 00 28 02 00 00"},
    {"unknown in codeset 7", Variant::net5, "9f 01 02 12 34", "9f 01 02 00 00"},
    {"unknown in codeset 0", Variant::net5, "5e 02 12 34", "5e 02 00 00"},
    {"parameters of network-specific facilities", Variant::net5, "20 05 02 a1 31 81 55", "20 05 02 a1 31 81 ee"},
    {"network-specific facilities: the name of a network", Variant::net5,
     "20 05 03 a1 31 32 81", "20 05 03 a1 31 32 81"},
    {"network-specific facilities: what follows a length that is too long", Variant::net5,
     "20 0b 0c 81 35 35 35 37 36 35 34 33 32", "20 0b 0c 80 00 00 00 00 00 00 00 00 00"},
    {"network-specific facilities: no octet behind such a length stays", Variant::net5,
     "20 05 39 38 37 36 35", "20 05 39 00 00 00 00"},
    {"network-specific facilities: an extension behind such a length keeps its end", Variant::ess4,
     "20 07 39 38 37 b6 35 34 33", "20 07 39 00 00 80 00 00 00"},
    {"channel numbers that do not end: the first stays", Variant::net5,
     "18 06 a9 83 05 35 35 37", "18 06 a9 83 05 00 00 00"},
    {"channel numbers stay", Variant::net5, "18 05 a9 83 05 06 87", "18 05 a9 83 05 06 87"},
    {"an interface that does not end: its first octet stays", Variant::net5,
     "18 05 e9 05 35 35 37", "18 05 e9 05 00 00 00"},
    {"an interface of blocked channels that does not end", Variant::net5,
     "03 05 a1 05 35 35 37", "03 05 a1 05 00 00 00"},
    {"cause and location stay, and a diagnostic that has a table", Variant::net5, "08 03 82 e4 18", "08 03 82 e4 18"},
    {"diagnostic of cause 22", Variant::net5, "08 05 82 96 31 32 33", "08 05 82 96 00 00 00"},
    {"diagnostic: a timer is digits, three of them",
     Variant::net5, "08 05 82 e6 33 30 33 08 07 82 e6 33 30 33 35 36", "08 05 82 e6 33 30 33 08 07 82 e6 33 30 33 00 00"},
    {"diagnostic: a timer that is no digits", Variant::net5, "08 05 82 e6 12 34 56", "08 05 82 e6 00 00 00"},
    {"diagnostic: two elements", Variant::net5, "08 04 82 e0 18 04", "08 04 82 e0 18 04"},
    {"diagnostic: more elements, and one that there is none of",
     Variant::net5, "08 06 82 e4 18 04 1e 6c 08 03 82 e0 35", "08 06 82 e4 18 04 00 00 08 03 82 e0 7f"},
    {"diagnostic: a message, and no more", Variant::net5, "08 05 82 e5 05 35 35", "08 05 82 e5 05 00 00"},
    {"diagnostic: a carrier", Variant::net5, "08 06 82 82 a1 32 38 38", "08 06 82 82 a1 32 38 38"},
    {"diagnostic: a network with more digits than a carrier has",
     Variant::net5, "08 08 82 82 a1 31 32 33 34 35", "08 08 82 82 a1 00 00 00 00 00"},
    {"diagnostic of another coding standard", Variant::net5, "08 04 e2 90 31 32", "08 04 e2 90 00 00"},
    {"diagnostic that no table describes", Variant::net5, "08 04 82 90 31 32", "08 04 82 90 00 00"},
    {"user's diagnostic of a rejection", Variant::net5, "08 04 82 95 80 31", "08 04 82 95 80 ee"},
    {"bearer, channel, progress, low and high layer stay", Variant::net5,
     "04 03 80 90 a3 18 03 a9 83 81 1e 02 82 88 7c 02 80 90 7d 02 91 81",
     "04 03 80 90 a3 18 03 a9 83 81 1e 02 82 88 7c 02 80 90 7d 02 91 81"},
    {"octets that are too many", Variant::net5, "1e 04 82 88 31 32", "1e 04 82 88 00 00"},
    {"date and time stay", Variant::net5, "29 05 0c 05 12 0a 21", "29 05 0c 05 12 0a 21"},
    {"a carrier's code stays", Variant::ess4, "78 04 a1 32 38 38", "78 04 a1 32 38 38"},
    {"a carrier's code of five digits is none", Variant::ess4, "78 06 a1 31 32 33 34 35", "78 06 a1 00 00 00 00 00"},
    {"a carrier's code that is no digits", Variant::ess4, "78 04 a1 12 34 56", "78 04 a1 00 00 00"},
    {"the index of a closed user group", Variant::net5, "47 05 91 31 32 33 34", "47 05 91 00 00 00 00"},
    {"a slot map of four octets", Variant::net5, "18 06 a9 93 12 34 56 78", "18 06 a9 93 12 34 56 78"},
    {"a slot map of more", Variant::net5, "18 08 a9 93 12 34 56 78 01 02", "18 08 a9 93 12 34 56 78 00 00"},
    {"digits where codes are expected, and what follows them",
     Variant::net5, "7c 07 80 90 31 32 b3 34 35", "7c 07 80 90 30 30 b0 00 00"},
    {"two digits among codes may be codes", Variant::net5, "29 06 1a 0b 16 0a 31 32", "29 06 1a 0b 16 0a 31 32"},
    {"an element of one octet that nobody knows, and a value without a name",
     Variant::net5, "c1 b5 a1 b0 d2", "80 80 a1 b0 d2"},
    {"charges of so many digits are a number", Variant::ntt, "01 07 81 31 32 33 34 35 36", "01 07 81 00 00 00 00 00 00"},
    {"charges stay", Variant::ntt, "01 03 81 31 32", "01 03 81 31 32"},
    {"more of a notification", Variant::net5, "27 03 84 31 32", "27 03 84 00 00"},
    {"an element that is cut", Variant::net5, "6c 09 21 80 31 32 33", "6c 09 00 00 00 00 00"},
    {"facility: numbers of an operation that is known; its codes stay", Variant::net5,
     "1c 21 91 a1 1e 02 01 07 02 01 0f 30 16 02 01 01 0a 01 02 a1 0e a0 0c a1 0a 0a 01 02 12 05 31 32 33 34 35",
     "1c 21 91 a1 1e 02 01 07 02 01 0f 30 16 02 01 01 0a 01 02 a1 0e a0 0c a1 0a 0a 01 02 12 05 78 78 78 78 78"},
    {"facility: charges stay", Variant::net5,
     "1c 1d 91 a1 1a 02 01 06 02 01 23 30 12 30 10 a1 0e 81 03 45 55 52 a2 07 81 02 04 d2 82 01 01",
     "1c 1d 91 a1 1a 02 01 06 02 01 23 30 12 30 10 a1 0e 81 03 45 55 52 a2 07 81 02 04 d2 82 01 01"},
    {"facility: every string and number of an operation that nobody knows", Variant::net5,
     "1c 16 91 a1 13 02 01 01 02 01 63 30 0b 12 02 34 32 80 02 31 32 02 01 07",
     "1c 16 91 a1 13 02 01 01 02 01 63 30 0b 12 02 78 78 80 02 ee ee 02 01 ee"},
    {"facility: a name", Variant::net5,
     "1c 12 9f 8b 01 00 a1 0b 02 01 08 02 01 00 80 03 42 6f 62 00 00 00",
     "1c 12 9f 8b 01 00 a1 0b 02 01 08 02 01 00 80 03 78 78 78 00 00 00"},
    {"facility: what follows a wrong length", Variant::net5,
     "1c 0b 91 a1 08 02 01 01 02 09 31 32 33", "1c 0b 91 a1 08 02 01 01 02 09 00 00 00"},
    {"facility: an invoke identifier that is too long", Variant::net5,
     "1c 0b 91 a1 08 02 03 31 32 33 02 01 0d", "1c 0b 91 a1 08 02 03 00 00 00 02 01 0d"},
    {"facility: an operation that is too long", Variant::net5,
     "1c 0b 91 a1 08 02 01 01 02 03 31 32 33", "1c 0b 91 a1 08 02 01 01 02 03 00 00 00"},
    {"facility: an operation by an object identifier that no table knows", Variant::net5,
     "1c 0d 91 a1 0a 02 01 01 06 05 35 35 37 36 35", "1c 0d 91 a1 0a 02 01 01 06 05 00 00 00 00 00"},
    {"facility: BOOLEAN and NULL have one octet and none", Variant::net5,
     "1c 17 91 a1 14 02 01 01 02 01 63 30 0c 01 01 ff 01 02 31 32 05 00 05 01 31",
     "1c 17 91 a1 14 02 01 01 02 01 63 30 0c 01 01 ff 01 02 00 00 05 00 05 01 00"},
    {"facility: a currency of more than three characters", Variant::net5,
     "1c 17 91 a1 14 02 01 06 02 01 23 30 0c 30 0a a1 08 81 06 31 32 33 34 35 36",
     "1c 17 91 a1 14 02 01 06 02 01 23 30 0c 30 0a a1 08 81 06 00 00 00 00 00 00"},
    {"facility: an identifier of several octets, and the values around it that nobody knows", Variant::net5,
     "1c 12 91 a1 0d 02 01 01 02 01 63 30 05 9f 81 35 01 35 c1 00",
     "1c 12 91 a1 0d 02 01 01 02 01 63 ff ff ff ff ff ff ff ff ff"},
    {"facility: a length that is none", Variant::net5, "1c 08 91 a1 05 02 88 31 32 33", "1c 08 91 a1 05 02 ff ff ff ff"},
    {"facility: values that nobody knows beside a damage", Variant::net5,
     "1c 11 91 a1 0e 02 01 01 02 01 63 30 06 35 04 31 32 12 7f", "1c 11 91 a1 0e 02 01 01 02 01 63 ff ff ff ff ff ff ff ff"},
    {"facility of an unknown profile", Variant::net5, "1c 04 95 31 32 33", "1c 04 95 00 00 00"},
    {"facility: octets before its profile ends", Variant::net5, "1c 04 31 32 33 34", "1c 04 31 00 00 00"},
    {"extended facility", Variant::net5, "0d 04 95 31 32 33", "0d 04 95 00 00 00"},
};
// clang-format on

TEST(Plan, ofEachElement) {
    for (const ElementCase& each : elementCases) {
        std::string frame = "02 01 00 00 08 01 01 05 ";
        EXPECT_EQ(redactedFrame(hex(frame + each.octets), each.variant), frame + each.expected) << each.says;
    }
}

struct FrameCase {
    const char* says;
    const char* octets;
    const char* expected;
};

// clang-format off
constexpr FrameCase frameCases[] = {
    {"supervisory frames stay", "00 01 01 05", "00 01 01 05"},
    {"information where none belongs", "00 01 01 05 31 32", "00 01 01 05 00 00"},
    {"SAPI 16 as a whole", "42 01 00 00 08 01 01 05", "42 01 00 00 00 00 00 00"},
    {"another SAPI", "06 01 00 00 31 32", "06 01 00 00 00 00"},
    {"TEI management stays", "fe ff 03 0f 12 34 02 87", "fe ff 03 0f 12 34 02 87"},
    {"what follows a TEI message", "fe ff 03 0f 12 34 02 87 31 32", "fe ff 03 0f 12 34 02 87 00 00"},
    {"action indicators that do not end: the first stays",
     "fe ff 03 0f 12 34 05 86 32 34 36", "fe ff 03 0f 12 34 05 86 00 00 00"},
    {"another management entity", "fe ff 03 10 12 34", "fe ff 03 10 00 00"},
    {"a frame reject stays", "02 01 97 01 02 04 06 01", "02 01 97 01 02 04 06 01"},
    {"XID: the link's parameters stay, user data does not",
     "02 01 af 82 80 00 03 05 01 08 ff 31 32", "02 01 af 82 80 00 03 05 01 08 ff 00 00"},
    {"XID: a group with a wrong length, which stays wrong",
     "02 01 af 82 80 00 03 05 01 08 80 35 36 05 02 35 36",
     "02 01 af 82 80 00 03 05 01 08 80 ff ff ff ff ff ff"},
    {"XID: a group whose parameters have a wrong length",
     "02 01 af 82 80 00 0c 05 02 35 35 35 37 36 35 34 33 32 31",
     "02 01 af 82 80 ff ff ff ff ff ff ff ff ff ff ff ff ff ff"},
    {"XID: a parameter without a length", "02 01 af 82 80 00 01 35 ff 31", "02 01 af 82 80 ff ff ff ff ff"},
    {"XID of another format", "02 01 af 31 32 33", "02 01 af 00 00 00"},
    {"another protocol", "02 01 00 00 41 01 01 05 70", "02 01 00 00 41 00 00 00 00"},
    {"a call reference with a wrong length", "02 01 00 00 08 31 32 33", "02 01 00 00 08 31 00 00"},
    {"a call reference longer than what is there",
     "02 01 00 00 08 0f 35 35 35 37 36", "02 01 00 00 08 0f 00 00 00 00 00"},
    {"a call reference that is one octet longer than what is there",
     "02 01 00 00 08 05 35 35 35 37", "02 01 00 00 08 05 00 00 00 00"},
    {"a call reference of two octets stays", "02 01 00 00 08 02 35 35 05", "02 01 00 00 08 02 35 35 05"},
    {"a call reference that is longer than those of trunks, and what follows it",
     "02 01 00 00 08 05 35 35 35 37 36 05 18 03 a9 83 81", "02 01 00 00 08 05 00 00 00 00 00 00 00 00 00 00 00"},
    {"an action indicator behind the second", "fe ff 03 0f 12 34 05 86 32 35", "fe ff 03 0f 12 34 05 86 00 00"},
    {"two action indicators", "fe ff 03 0f 12 34 05 86 87", "fe ff 03 0f 12 34 05 86 87"},
    {"a TEI message of a type that nobody knows", "fe ff 03 0f 35 35 35 37", "fe ff 03 0f ff ff ff ff"},
    {"a frame reject of another form", "02 01 97 35 35 35 37 36", "02 01 97 ff ff ff ff ff"},
    {"a frame reject that is too short", "02 01 97 35 35", "02 01 97 ff ff"},
    {"what follows a frame reject", "02 01 97 01 02 04 06 01 35", "02 01 97 01 02 04 06 01 00"},
    {"XID: a parameter that nobody knows", "02 01 af 82 80 00 07 05 02 01 08 21 01 35", "02 01 af 82 80 00 07 05 02 01 08 21 01 00"},
    {"XID: a parameter that is longer than it can be", "02 01 af 82 80 00 05 05 03 35 35 35", "02 01 af 82 80 00 05 05 03 00 00 00"},
    {"a message that ends within an element keeps what is before numbers, and still ends so",
     "02 01 00 00 08 01 01 05 04 03 80 90 a3 6c 03 21 80 31 32 33 34 35 36 37",
     "02 01 00 00 08 01 01 05 04 03 80 90 a3 6c 03 21 80 78 7f ff 00 00 00 00"},
    {"a message that ends within an element of codes", "02 01 00 00 08 01 01 05 04 03 80 90 a3 18 03 a9",
     "02 01 00 00 08 01 01 05 04 03 80 90 a3 18 03 00"},
    {"a message that ends within an element that nobody knows",
     "02 01 00 00 08 01 01 05 31 32 33 34 35", "02 01 00 00 08 01 01 05 7f ff 00 00 00"},
    {"a message that ends behind an identifier", "02 01 00 00 08 01 01 05 6c 03 21 80 31 32",
     "02 01 00 00 08 01 01 05 6c 03 21 80 78 7f"},
    {"a call reference behind which the message ends", "02 01 00 00 08 02 00 01", "02 01 00 00 08 02 00 01"},
    {"a control field that nobody knows", "02 01 ff 31 32", "02 01 ff 00 00"},
    {"an address that does not end", "02 00 00 00 08 01 01 05", "02 00 00 00 00 00 00 00"},
    {"SERVICE stays", "02 01 00 00 03 02 00 00 0f 01 01 80 18 03 a9 83 81",
     "02 01 00 00 03 02 00 00 0f 01 01 80 18 03 a9 83 81"},
    {"USER INFORMATION", "02 01 00 00 08 01 01 20 7e 03 00 31 32", "02 01 00 00 08 01 01 20 7e 03 00 ee ee"},
    {"a segment without the others", "02 01 00 00 08 01 01 60 00 02 01 05 31 32",
     "02 01 00 00 08 01 01 60 00 02 01 05 00 00"},
    {"no octet", "", ""},
    {"an address alone", "02 01", "02 01"},
};
// clang-format on

TEST(Plan, ofEachFrame) {
    for (const FrameCase& each : frameCases)
        EXPECT_EQ(redactedFrame(hex(each.octets), Variant::net5), each.expected) << each.says;
}

// Whatever was wrong in a frame is still wrong in the same place once it is redacted.
TEST(Plan, ofARedactedFrameIsThatOfTheOriginal) {
    const auto requireSame = [](const std::string& before, const std::string& after, Variant variant,
                                const char* says) {
        EXPECT_EQ(planOfFrame(hex(before), variant), planOfFrame(hex(after), variant)) << says;
    };
    const std::string setup = "02 01 00 00 08 01 01 05 ";
    for (const ElementCase& each : elementCases)
        requireSame(setup + each.octets, setup + each.expected, each.variant, each.says);
    for (const FrameCase& each : frameCases)
        requireSame(each.octets, each.expected, Variant::net5, each.says);
}

}  // namespace
}  // namespace redaction
