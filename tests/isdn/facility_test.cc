// Facilities, typed from the standards: EN 300 182-1, EN 300 207-1, EN 300 359-1, EN 300 369-1, ECMA-164,
// ECMA-174, ECMA-178 and X.880.
#include "isdn/facility.h"

#include <gtest/gtest.h>

#include <sstream>

#include "tests/isdn/facility_octets.h"
#include "tests/isdn/hex.h"

namespace {

using namespace isdn;
using isdn::testing::expectEachBitOnce;
using isdn::testing::hex;

std::string words(const std::vector<std::uint8_t>& octets, Variant variant = Variant::net5) {
    std::string line;
    Facility(octets, variant).appendWords(line);
    return line;
}

struct Story {
    const char* says;
    const char* octets;
    const char* words;
};

void expectWords(std::span<const Story> stories, Variant variant = Variant::net5) {
    for (const Story& story : stories) {
        const std::vector<std::uint8_t> octets = hex(story.octets);
        EXPECT_EQ(words(octets, variant), story.words) << story.says;
        EXPECT_EQ(Facility(octets, variant).problem(), Problem::none) << story.says;
    }
}

TEST(Facility, TellsChargesInWords) {
    static const Story stories[] = {
        {"units during the call", "91 A1 12 02 01 05 02 01 22 30 0A A1 05 30 03 02 01 03 82 01 00",
         "invoke 5 charges during the call, units: units 3, subtotal"},
        {"units of two types",
         "91 A1 1A 02 01 05 02 01 22 30 12 A1 0D 30 03 02 01 03 30 06 02 01 07 02 01 02 82 01 01",
         "invoke 5 charges during the call, units: units 3 units 7 type of unit 2, total"},
        {"free of charge", "91 A1 08 02 01 05 02 01 22 81 00",
         "invoke 5 charges during the call, units: free of charge"},
        {"no information", "91 A1 08 02 01 05 02 01 21 05 00",
         "invoke 5 charges during the call, currency: no charge available"},
        {"currency at the end",
         "91 A1 1A 02 01 06 02 01 23 30 12 30 10 A1 0E 81 03 45 55 52 A2 07 81 02 04 D2 82 01 01",
         "invoke 6 charges at the end of the call, currency: EUR 1234 x 0.01"},
        {"units at the end, of a diverted call",
         "91 A1 14 02 01 06 02 01 24 30 0C 30 0A A1 05 30 03 02 01 09 82 01 03",
         "invoke 6 charges at the end of the call, units: units 9 billing call forwarding unconditional"},
        {"a charging request", "91 A1 09 02 01 01 02 01 1E 0A 01 02",
         "invoke 1 charging request: at the end of the call"},
        {"a flat rate at set-up",
         "91 A1 1D 02 01 02 02 01 1F 30 15 30 13 0A 01 02 A2 0E 81 03 45 55 52 A2 07 81 02 00 C8 82 01 01",
         "invoke 2 charges at set-up: call set-up flat rate EUR 200 x 0.01"},
    };
    expectWords(stories);
}

TEST(Facility, TellsDiversionInWords) {
    static const Story stories[] = {
        {"diverted on busy",
         "91 A1 1E 02 01 07 02 01 0F 30 16 02 01 01 0A 01 02 A1 0E A0 0C A1 0A 0A 01 02 12 05 31 32 33 34 35",
         "invoke 7 diverting leg information 2: counter 1, reason busy, diverting national 12345"},
        {"the number is restricted", "91 A1 12 02 01 07 02 01 0F 30 0A 02 01 02 0A 01 03 A1 02 81 00",
         "invoke 7 diverting leg information 2: counter 2, reason no reply, diverting presentation "
         "restricted"},
        {"the caller is told",
         "91 A1 19 02 01 07 02 01 12 30 11 0A 01 01 0A 01 02 A0 09 A1 07 0A 01 04 12 02 34 32",
         "invoke 7 diverting leg information 1: reason unconditional, caller is told, with the number, "
         "diverted to subscriber 42"},
        {"the number may be shown", "91 A1 09 02 01 07 02 01 13 01 01 FF",
         "invoke 7 diverting leg information 3: number may be shown: yes"},
        {"deflection", "91 A1 12 02 01 08 02 01 0D 30 0A 30 05 80 03 35 35 35 01 01 00",
         "invoke 8 call deflection: deflected to 555, number may be shown to the caller no"},
        {"activation for all numbers",
         "91 A1 17 02 01 09 02 01 07 30 0F 0A 01 00 0A 01 01 30 05 80 03 35 35 35 05 00",
         "invoke 9 activate diversion: unconditional, speech, forwarded to 555, served user all numbers"},
    };
    expectWords(stories);
}

TEST(Facility, TellsNamesAndTransfersOfPrivateNetworksInWords) {
    static const Story stories[] = {
        {"a calling name behind extension and interpretation",
         "9F AA 06 80 01 00 82 01 00 8B 01 00 A1 0D 02 01 08 02 01 00 80 05 41 6C 69 63 65",
         "invoke 8 calling name: Alice"},
        {"a name with its character set", "9F A1 10 02 01 08 02 01 02 A1 08 04 03 42 6F 62 02 01 01",
         "invoke 8 connected name: Bob, character set ISO 8859-1"},
        {"a name in a sequence", "9F A1 0D 02 01 08 02 01 01 30 05 80 03 42 6F 62",
         "invoke 8 called name: Bob"},
        {"a name behind an interpretation, with the profile of public networks",
         "91 8B 01 00 A1 0B 02 01 08 02 01 00 80 03 42 6F 62", "invoke 8 calling name: Bob"},
        {"a restricted name", "9F A1 08 02 01 08 02 01 00 87 00", "invoke 8 calling name: restricted"},
        {"a name that is not there", "9F A1 08 02 01 08 02 01 00 84 00",
         "invoke 8 calling name: not available"},
        {"a transfer is complete",
         "9F A1 1A 02 01 09 02 01 0C 30 12 0A 01 01 A0 0A 80 05 31 32 33 34 35 0A 01 03 0A 01 01",
         "invoke 9 call transfer: complete: secondary end, redirection 12345 network provided, alerting"},
        {"a path is proposed", "9F A1 14 02 01 0A 02 01 04 30 0C 12 03 30 30 31 80 05 31 32 33 34 35",
         "invoke 10 path replacement: propose: call identity 001, rerouteing number 12345"},
    };
    expectWords(stories);
}

TEST(Facility, TellsAnswersInWords) {
    static const Story stories[] = {
        {"a result alone", "91 A2 03 02 01 09", "return result 9"},
        {"a result with its operation", "91 A2 10 02 01 0A 30 0B 06 06 04 00 82 71 01 04 02 01 2A",
         "return result 10 transfer: link identity request: 42"},
        {"an error", "91 A3 06 02 01 09 02 01 00", "return error 9 not subscribed"},
        {"an error that nobody knows", "91 A3 06 02 01 09 02 01 63", "return error 9 99"},
        {"an error of a private network", "9F A3 07 02 01 09 02 02 03 EC",
         "return error 9 invalid rerouteing number"},
        {"an error that public networks have as well", "9F A3 06 02 01 09 02 01 05",
         "return error 9 insufficient information"},
        {"a rejected invocation", "91 A4 06 02 01 09 81 01 01", "reject 9 unrecognized operation"},
        {"a rejected component", "91 A4 05 05 00 80 01 02", "reject badly structured component"},
        {"a rejected result", "91 A4 06 02 01 09 82 01 01", "reject 9 unexpected result"},
        {"a rejected error", "91 A4 06 02 01 09 83 01 02", "reject 9 unrecognized error"},
    };
    expectWords(stories);
}

TEST(Facility, TellsWhoAskedForWhatInWords) {
    static const Story stories[] = {
        {"linked to another invocation", "91 A1 09 02 01 0B 80 01 0A 02 01 03",
         "invoke 11 linked to 10 malicious call identification"},
        {"an operation known by an object identifier", "91 A1 0E 02 01 01 06 06 04 00 82 67 01 02 02 01 11",
         "invoke 1 call completion: request on busy, linkage: 17"},
        {"an operation that nobody knows", "91 A1 06 02 01 01 02 01 63", "invoke 1 99"},
        {"an operation below zero", "91 A1 06 02 01 01 02 01 FF", "invoke 1 -1"},
        {"an object identifier that nobody knows", "91 A1 07 02 01 01 06 02 2A 03", "invoke 1 1.2.3"},
        {"two components", "91 A1 06 02 01 01 02 01 04 A2 03 02 01 07",
         "invoke 1 begin three-party; return result 7"},
        {"an invoke id of two octets", "91 A1 07 02 02 30 39 02 01 05", "invoke 12345 end three-party"},
        {"a component of indefinite length", "91 A1 80 02 01 01 02 01 04 00 00",
         "invoke 1 begin three-party"},
        {"another protocol", "92 A1 03 02 01 01", ""},
    };
    expectWords(stories);
}

TEST(Facility, AsksTheTrunkWhoseOperationsAreMeant) {
    static const Story stories[] = {
        {"a name in North America", "91 A1 0D 02 01 08 02 01 00 80 05 41 6C 69 63 65",
         "invoke 8 calling name: Alice"},
        {"a name as in private networks", "9F 8B 01 00 A1 0D 02 01 08 02 01 00 80 05 41 6C 69 63 65",
         "invoke 8 calling name: Alice"},
        {"two B-channel transfer", "9F 8B 01 02 A1 0C 02 01 01 06 07 2A 86 48 CE 15 00 08",
         "invoke 1 two B-channel transfer"},
        {"a number that means something elsewhere", "91 A1 06 02 01 01 02 01 04", "invoke 1 4"},
    };
    expectWords(stories, Variant::ni2);
    expectWords(stories, Variant::dms100);
}

// "octet bits depth name: meaning (personal)", a field a line.
std::string fieldsOf(const std::vector<std::uint8_t>& octets, Variant variant = Variant::net5) {
    static constexpr const char* kinds[] = {"value", "text", "raw", "extension", "spare", "header"};
    Fields fields;
    facilityFields(octets, variant, fields);
    std::ostringstream out;
    for (const Field& field : fields) {
        out << field.octet;
        if (field.at.size() > 1)
            out << "+" << field.at.size();
        out << " " << int{field.high} << "-" << int{field.low} << " " << int{field.depth} << " "
            << kinds[static_cast<std::size_t>(field.kind)] << " " << field.name << "=" << field.meaning
            << (field.personal ? " personal" : "") << " " << field.clause << "\n";
    }
    return out.str();
}

TEST(FacilityFields, ShowEachValueWithItsClause) {
    EXPECT_EQ(fieldsOf(hex("91 A1 12 02 01 05 02 01 22 30 0A A1 05 30 03 02 01 03 82 01 00")),
              "3 8-8 0 extension extension= Q.932 8.2.3\n"
              "3 7-6 0 spare spare= Q.932 8.2.3\n"
              "3 5-1 0 value protocol profile=remote operations Q.932 8.2.3\n"
              "4+2 8-1 0 header invoke=[1] X.880 9\n"
              "6+2 8-1 1 header invoke id=INTEGER X.880 9\n"
              "8 8-1 1 value invoke id=5 X.880 9\n"
              "9+2 8-1 1 header operation=INTEGER X.880 9\n"
              "11 8-1 1 value operation=charges during the call, units X.880 9\n"
              "12+2 8-1 1 header charge=SEQUENCE EN 300 182-1\n"
              "14+2 8-1 2 header recorded units=[1] EN 300 182-1\n"
              "16+2 8-1 3 header recorded units=SEQUENCE EN 300 182-1\n"
              "18+2 8-1 4 header units=INTEGER EN 300 182-1\n"
              "20 8-1 4 value units=3 EN 300 182-1\n"
              "21+2 8-1 2 header kind of charge=[2] EN 300 182-1\n"
              "23 8-1 2 value kind of charge=subtotal EN 300 182-1\n");
}

TEST(FacilityFields, SayWhatNamesAPerson) {
    EXPECT_EQ(fieldsOf(hex(
                  "9F AA 0D 80 01 00 A1 05 80 03 31 32 33 82 01 01 A1 0B 02 01 08 02 01 00 80 03 42 6F 62")),
              "3 8-8 0 extension extension= Q.932 8.2.3\n"
              "3 7-6 0 spare spare= Q.932 8.2.3\n"
              "3 5-1 0 value protocol profile=networking extensions Q.932 8.2.3\n"
              "4+2 8-1 0 header network facility extension=[10] ECMA-165\n"
              "6+2 8-1 1 header source=[0] ECMA-165\n"
              "8 8-1 1 value source=end exchange ECMA-165\n"
              "9+2 8-1 1 header source number=[1] ECMA-165\n"
              "11+2 8-1 2 header number of unknown plan=[0] ECMA-165\n"
              "13+3 8-1 2 text number of unknown plan=123 personal ECMA-165\n"
              "16+2 8-1 1 header destination=[2] ECMA-165\n"
              "18 8-1 1 value destination=any exchange ECMA-165\n"
              "19+2 8-1 0 header invoke=[1] X.880 9\n"
              "21+2 8-1 1 header invoke id=INTEGER X.880 9\n"
              "23 8-1 1 value invoke id=8 X.880 9\n"
              "24+2 8-1 1 header operation=INTEGER X.880 9\n"
              "26 8-1 1 value operation=calling name X.880 9\n"
              "27+2 8-1 1 header name=[0] ECMA-164\n"
              "29+3 8-1 1 text name=Bob personal ECMA-164\n");
}

TEST(FacilityFields, TakeEachStringAndNumberOfAnUnknownOperationForPersonal) {
    EXPECT_EQ(
        fieldsOf(hex("91 A1 80 02 01 01 02 01 63 30 80 12 02 34 32 02 01 07 01 01 FF 05 00 85 01 AB 06 01 2A "
                     "00 00 00 00")),
        "3 8-8 0 extension extension= Q.932 8.2.3\n"
        "3 7-6 0 spare spare= Q.932 8.2.3\n"
        "3 5-1 0 value protocol profile=remote operations Q.932 8.2.3\n"
        "4+2 8-1 0 header invoke=[1], indefinite length X.880 9\n"
        "6+2 8-1 1 header invoke id=INTEGER X.880 9\n"
        "8 8-1 1 value invoke id=1 X.880 9\n"
        "9+2 8-1 1 header operation=INTEGER X.880 9\n"
        "11 8-1 1 value operation=99 X.880 9\n"
        "12+2 8-1 1 header SEQUENCE=SEQUENCE, indefinite length X.880 9\n"
        "14+2 8-1 2 header NumericString=NumericString X.880 9\n"
        "16+2 8-1 2 text NumericString=42 personal X.880 9\n"
        "18+2 8-1 2 header INTEGER=INTEGER X.880 9\n"
        "20 8-1 2 value INTEGER=7 personal X.880 9\n"
        "21+2 8-1 2 header BOOLEAN=BOOLEAN X.880 9\n"
        "23 8-1 2 value BOOLEAN=yes X.880 9\n"
        "24+2 8-1 2 header NULL=NULL X.880 9\n"
        "26+2 8-1 2 header [5]=[5] X.880 9\n"
        "28 8-1 2 raw [5]= personal X.880 9\n"
        "29+2 8-1 2 header OBJECT IDENTIFIER=OBJECT IDENTIFIER X.880 9\n"
        "31 8-1 2 value OBJECT IDENTIFIER=1.2 X.880 9\n"
        "32+2 8-1 0 header end of contents= X.690 8.1.5\n"
        "34+2 8-1 0 header end of contents= X.690 8.1.5\n");
}

TEST(FacilityFields, ShowCharactersWhereverThereAreSome) {
    const std::string text =
        fieldsOf(hex("91 A1 16 02 01 01 02 01 63 30 0E 04 03 42 6F 62 80 03 41 6C 69 82 02 41 42"));
    EXPECT_NE(text.find("16+3 8-1 2 text OCTET STRING=Bob personal"), std::string::npos) << text;
    EXPECT_NE(text.find("21+3 8-1 2 text [0]=Ali personal"), std::string::npos) << text;
    EXPECT_NE(text.find("26+2 8-1 2 raw [2]= personal"), std::string::npos) << text;
}

TEST(FacilityFields, ShowWhatIsDamagedWholeAndTakeItForPersonal) {
    EXPECT_EQ(fieldsOf(hex("91 A1 09 02 01 01 02 01 0F 30 05 0A")),
              "3 8-8 0 extension extension= Q.932 8.2.3\n"
              "3 7-6 0 spare spare= Q.932 8.2.3\n"
              "3 5-1 0 value protocol profile=remote operations Q.932 8.2.3\n"
              "4+2 8-1 0 header invoke=[1] X.880 9\n"
              "6+2 8-1 1 header invoke id=INTEGER X.880 9\n"
              "8 8-1 1 value invoke id=1 X.880 9\n"
              "9+2 8-1 1 header operation=INTEGER X.880 9\n"
              "11 8-1 1 value operation=diverting leg information 2 X.880 9\n"
              "12+2 8-1 1 header SEQUENCE=SEQUENCE, the length reaches beyond the end EN 300 207-1\n"
              "14 8-1 1 raw what cannot be told apart= personal EN 300 207-1\n");
}

TEST(FacilityFields, ShowAnUnknownProfileRaw) {
    EXPECT_EQ(fieldsOf(hex("81 01 02")),
              "3 8-8 0 extension extension= Q.932 8.2.3\n"
              "3 7-6 0 spare spare= Q.932 8.2.3\n"
              "3 5-1 0 value protocol profile= Q.932 8.2.3\n"
              "4+2 8-1 0 raw contents= personal Q.932 8.2.3\n");
}

TEST(Facility, SaysWhatIsWrongWithItsContents) {
    const auto problem = [](const char* octets) { return Facility(hex(octets), Variant::net5).problem(); };
    EXPECT_EQ(problem(""), Problem::tooShort);
    EXPECT_EQ(problem("91"), Problem::none);
    EXPECT_EQ(problem("85 01"), Problem::unknown);
    EXPECT_EQ(problem("91 A1 05 02"), Problem::truncated);
    EXPECT_EQ(problem("91 A1 80 02 01 01"), Problem::truncated);
    EXPECT_EQ(problem("91 A1 FF"), Problem::invalid);
    EXPECT_EQ(problem("11 91 A1 03 02 01 01"), Problem::none);
}

TEST(FacilityFields, CoverEachBitOnceWhereverTheyAreCutAndWhateverOctetIsChanged) {
    for (const char* const text : isdn::testing::facilities) {
        const std::vector<std::uint8_t> whole = hex(text);
        for (std::size_t length = 0; length <= whole.size(); ++length)
            expectEachBitOnce({whole.begin(), whole.begin() + static_cast<std::ptrdiff_t>(length)});
        for (std::size_t at = 0; at < whole.size(); ++at) {
            std::vector<std::uint8_t> changed = whole;
            for (unsigned octet = 0; octet < 256; ++octet) {
                changed[at] = static_cast<std::uint8_t>(octet);
                expectEachBitOnce(changed);
            }
        }
        if (HasFailure())
            return;
    }
}

}  // namespace
