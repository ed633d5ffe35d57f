// Numbers of calls: in one piece or digit by digit, sent again, cut, or begun before the trace.
#include "redaction/Redactor.h"

#include <gtest/gtest.h>

#include "isdn/values.h"
#include "tests/redaction/redacted.h"

namespace redaction {
namespace {

using calls::Side;
using calls::test::bearerSpeech;
using calls::test::called;
using calls::test::calling;
using calls::test::CallScript;
using calls::test::cause;
using test::Bytes;
using test::Passed;
namespace type = isdn::message;

Bytes keypad(const std::string& text) {
    Bytes element{0x2C, static_cast<std::uint8_t>(text.size())};
    element.insert(element.end(), text.begin(), text.end());
    return element;
}

// The digits of called number and keypad in each frame that has some.
std::vector<std::string> dialledIn(const std::vector<Passed>& frames) {
    std::vector<std::string> dialled;
    for (const Passed& frame : frames) {
        const isdn::Layer2 link = isdn::parseLayer2(frame.octets);
        const isdn::Layer3 message = isdn::parseLayer3(link.information);
        std::string digits;
        if (const auto number = isdn::partyNumber(message.elements.find(isdn::element::calledNumber)))
            digits += number->digits;
        digits += isdn::keypadDigits(message.elements.find(isdn::element::keypad));
        if (!digits.empty())
            dialled.push_back(digits);
    }
    return dialled;
}

std::vector<std::string> dialled(const CallScript& script, bool blankShort = false,
                                 Direction direction = Direction::redact) {
    const auto pseudonyms = makePseudonyms(test::keyOf(1), direction);
    return dialledIn(test::redacted(test::passedIn(script), *pseudonyms, isdn::Variant::net5, blankShort));
}

std::string joined(const std::vector<std::string>& pieces) {
    std::string all;
    for (const std::string& piece : pieces)
        all += piece;
    return all;
}

CallScript enBloc(const std::string& number) {
    CallScript script;
    script.us(type::setup, 1, false, {bearerSpeech(), called(number)});
    return script;
}
const std::string pseudonym = dialled(enBloc("03012345")).at(0);

TEST(Redactor, givesANumberThatIsDialledDigitByDigitThePseudonymOfTheWhole) {
    CallScript script;
    script.us(type::setup, 1, false, {bearerSpeech(), called("030")})
        .peer(type::setupAcknowledge, 1, true)
        .us(type::information, 1, false, {called("1")})
        .us(type::information, 1, false, {called("23")})
        .us(type::information, 1, false, {called("45")});
    const std::vector<std::string> pieces = dialled(script);
    ASSERT_EQ(pieces.size(), 4U);
    EXPECT_EQ(joined(pieces), pseudonym);
}

TEST(Redactor, takesDigitsOfAKeypadForTheNumberToo) {
    CallScript script;
    script.us(type::setup, 1, false, {bearerSpeech()});
    for (const char* digit : {"0", "3", "0", "1", "2", "3", "4", "5"})
        script.us(type::information, 1, false, {keypad(digit)});
    EXPECT_EQ(joined(dialled(script)), pseudonym);
}

TEST(Redactor, keepsTheNumbersOfTwoCallsApart) {
    CallScript script;
    script.us(type::setup, 1, false, {called("030")})
        .us(type::setup, 2, false, {called("0")})
        .us(type::information, 1, false, {called("12345")})
        .us(type::information, 2, false, {called("3012345")});
    const std::vector<std::string> pieces = dialled(script);
    ASSERT_EQ(pieces.size(), 4U);
    EXPECT_EQ(pieces[0] + pieces[2], pseudonym);
    EXPECT_EQ(pieces[1] + pieces[3], pseudonym);
}

TEST(Redactor, beginsANumberAnewWhenTheReferenceIsUsedAgain) {
    CallScript script;
    script.us(type::setup, 1, false, {called("9")})
        .peer(type::releaseComplete, 1, true, {cause(17)})
        .us(type::setup, 1, false, {called("030")})
        .us(type::information, 1, false, {called("12345")});
    const std::vector<std::string> pieces = dialled(script);
    EXPECT_EQ(pieces.at(1) + pieces.at(2), pseudonym);
}

TEST(Redactor, takesARepeatedSetupForTheSameNumber) {
    CallScript script;
    script.us(type::setup, 1, false, {called("030")})
        .at(4000)
        .us(type::setup, 1, false, {called("030")})
        .us(type::information, 1, false, {called("12345")});
    const std::vector<std::string> pieces = dialled(script);
    EXPECT_EQ(pieces.at(0), pieces.at(1));
    EXPECT_EQ(pieces.at(1) + pieces.at(2), pseudonym);
}

TEST(Redactor, blanksANumberThatBeganBeforeTheTrace) {
    CallScript script;
    script.us(type::information, 1, false, {called("1*2")}).us(type::information, 1, false, {called("3")});
    EXPECT_EQ(dialled(script), (std::vector<std::string>{"0*0", "0"}));
}

TEST(Redactor, blanksDigitsOfNoCall) {
    CallScript script;
    script.us(type::setup, 1, false, {called("030")})
        .us(type::information, 0, false, {keypad("1")})   // the global reference
        .us(type::information, 2, false, {keypad("2")});  // another call
    EXPECT_EQ(dialled(script), (std::vector<std::string>{pseudonym.substr(0, 3), "0", "0"}));
}

TEST(Redactor, givesAFrameThatIsSentAgainThePseudonymsItHad) {
    CallScript script;
    script.us(type::setup, 1, false, {called("030")})
        .us(type::information, 1, false, {called("1")})
        .us(type::information, 1, false, {called("2345")});
    std::vector<Passed> frames = test::passedIn(script);
    frames.push_back(frames[1]);
    frames.push_back(frames[2]);
    const auto pseudonyms = makePseudonyms(test::keyOf(1), Direction::redact);
    const std::vector<Passed> after = test::redacted(frames, *pseudonyms);
    EXPECT_EQ(after[3].octets, after[1].octets);
    EXPECT_EQ(after[4].octets, after[2].octets);
    const std::vector<std::string> pieces = dialledIn(after);
    EXPECT_EQ(pieces.at(0) + pieces.at(1) + pieces.at(2), pseudonym);
}

TEST(Redactor, blanksWhatFollowsDigitsThatMayBeMissing) {
    CallScript script;
    script.us(type::setup, 1, false, {called("030")})
        .us(type::information, 1, false, {called("1")})
        .us(type::information, 1, false, {called("2")})
        .us(type::information, 1, false, {called("3")});
    std::vector<Passed> frames = test::passedIn(script);
    frames.erase(frames.begin() + 2);
    const auto pseudonyms = makePseudonyms(test::keyOf(1), Direction::redact);
    EXPECT_EQ(dialledIn(test::redacted(frames, *pseudonyms)),
              (std::vector<std::string>{pseudonym.substr(0, 3), pseudonym.substr(3, 1), "0"}));
}

TEST(Redactor, blanksShortNumbersIfAsked) {
    EXPECT_EQ(dialled(enBloc("112"), true), std::vector<std::string>{"000"});
    EXPECT_EQ(dialled(enBloc("03012"), true), std::vector<std::string>{"00000"});
    EXPECT_EQ(dialled(enBloc("030123"), true), std::vector<std::string>{pseudonym.substr(0, 6)});
    EXPECT_NE(dialled(enBloc("112")), std::vector<std::string>{"000"});
}

TEST(Redactor, blanksAllOfANumberWhoseFirstDigitsLookShort) {
    CallScript script;
    script.us(type::setup, 1, false, {called("030")}).us(type::information, 1, false, {called("1234567")});
    EXPECT_EQ(dialled(script, true), (std::vector<std::string>{"000", "0000000"}));
}

TEST(Redactor, givesEachPartyOfAMessageTheNumbersOwnPseudonym) {
    CallScript script;
    script.us(type::setup, 1, false, {calling("03012345"), called("03012345")});
    const auto pseudonyms = makePseudonyms(test::keyOf(1), Direction::redact);
    const Bytes octets = test::redacted(test::passedIn(script), *pseudonyms)[0].octets;
    const isdn::Layer3 message = isdn::parseLayer3(isdn::parseLayer2(octets).information);
    EXPECT_EQ(isdn::partyNumber(message.elements.find(isdn::element::callingNumber))->digits, pseudonym);
    EXPECT_EQ(isdn::partyNumber(message.elements.find(isdn::element::calledNumber))->digits, pseudonym);
}

// A message cut into segments in the middle of its number (Q.931 annex H).
class Segmented : public ::testing::Test {
  protected:
    static Bytes segment(std::uint8_t octet3, const Bytes& piece) {
        Bytes rest{0x00, 0x02, octet3, type::setup};
        rest.insert(rest.end(), piece.begin(), piece.end());
        return rest;
    }
    static Bytes piece(std::size_t from, std::size_t to) {
        Bytes all = bearerSpeech();
        const Bytes number = called("03012345");
        all.insert(all.end(), number.begin(), number.end());
        return {all.begin() + static_cast<std::ptrdiff_t>(from),
                all.begin() + static_cast<std::ptrdiff_t>(to)};
    }
    static constexpr std::size_t whole = 16;

    static std::vector<Passed> redacted(const CallScript& script, Direction direction = Direction::redact) {
        const auto pseudonyms = makePseudonyms(test::keyOf(1), direction);
        return test::redacted(test::passedIn(script), *pseudonyms);
    }
};

TEST_F(Segmented, messagesAreRedactedOnceTheyAreWhole) {
    for (std::size_t cut = 1; cut < whole; ++cut) {
        CallScript script;
        script.us(type::segment, 1, false, {segment(0x82, piece(0, cut / 2))})
            .peer(type::statusEnquiry, 7, true)
            .us(type::segment, 1, false, {segment(0x01, piece(cut / 2, cut))})
            .us(type::segment, 1, false, {segment(0x00, piece(cut, whole))})
            .us(type::information, 1, false, {called("678")});
        const std::vector<Passed> after = redacted(script);
        Bytes text;
        constexpr std::size_t pieceAt = 13;
        for (const std::size_t i : {0U, 2U, 3U})
            text.insert(text.end(), after[i].octets.begin() + pieceAt, after[i].octets.end());
        EXPECT_TRUE(test::holds(text, pseudonym)) << cut;
        EXPECT_FALSE(test::holds(text, "0301")) << cut;
        EXPECT_EQ(after[1].octets, test::passedIn(script)[1].octets);
        CallScript longer = enBloc("03012345678");
        EXPECT_TRUE(test::holds(after[4].octets, dialled(longer).at(0).substr(8))) << cut;
    }
}

TEST_F(Segmented, messagesThatDoNotEndAreBlanked) {
    CallScript script;
    script.us(type::segment, 1, false, {segment(0x81, piece(0, 10))})
        .us(type::setup, 2, false, {called("030")});
    const std::vector<Passed> after = redacted(script);
    EXPECT_EQ(Bytes(after[0].octets.begin() + 13, after[0].octets.end()), Bytes(10, 0));
}

// Without its first element a SEGMENT is a message like any other.
TEST_F(Segmented, messagesThatAreNoneAreRedactedWhileTheyWait) {
    for (const std::uint8_t id : {0x28, 0x5E}) {
        CallScript script;
        script.us(type::segment, 1, false,
                  {{0xA1, 0x00, 0x02, 0x81, type::setup, id, 0x04, 'J', 'o', 'h', 'n'}});
        EXPECT_FALSE(test::holds(redacted(script)[0].octets, "John"));
    }
}

TEST_F(Segmented, messagesThatLackASegmentAreBlanked) {
    CallScript script;
    script.us(type::segment, 1, false, {segment(0x82, piece(0, 5))})
        .us(type::segment, 1, false, {segment(0x00, piece(10, whole))});
    const std::vector<Passed> after = redacted(script);
    EXPECT_EQ(Bytes(after[0].octets.begin() + 13, after[0].octets.end()), Bytes(5, 0));
    EXPECT_EQ(Bytes(after[1].octets.begin() + 13, after[1].octets.end()), Bytes(6, 0));
}

}  // namespace
}  // namespace redaction
