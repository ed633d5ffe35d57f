// Frames of a D channel redacted and restored. Lengths stay; a redacted frame has the plan of the original;
// digits of numbers are others than they were; and what was not blanked comes back.
#include <algorithm>
#include <array>
#include <cctype>

#include "isdn/values.h"
#include "tests/fuzz/fuzz.h"
#include "tests/redaction/redacted.h"

namespace {

using redaction::Direction;
using redaction::test::Passed;

constexpr std::array variants{isdn::Variant::net5, isdn::Variant::ni2,    isdn::Variant::ess4,
                              isdn::Variant::ess5, isdn::Variant::dms100, isdn::Variant::ntt};

// Six digits of a number are never where they were, unless they are those that a blanked number has.
void requireOtherDigits(const fuzz::Octets& before, const fuzz::Octets& after) {
    constexpr std::size_t digitsThatTell = 6;
    const isdn::Layer2 link = isdn::parseLayer2(before);
    if (!link.carriesMessage())
        return;
    for (const isdn::Element& element : isdn::parseLayer3(link.information).elements) {
        const auto number = isdn::partyNumber(element);
        if (!number || number->digits.size() < digitsThatTell)
            continue;
        const auto at = static_cast<std::size_t>(number->digitOctets.data() - before.data());
        for (std::size_t i = 0; i + digitsThatTell <= number->digits.size(); ++i) {
            const std::string_view six = number->digits.substr(i, digitsThatTell);
            const bool allDigits =
                std::all_of(six.begin(), six.end(), [](unsigned char c) { return std::isdigit(c) != 0; });
            const bool same =
                std::equal(six.begin(), six.end(), after.begin() + static_cast<std::ptrdiff_t>(at + i));
            fuzz::require(!allDigits || six == "000000" || !same, "six digits are others than they were");
        }
    }
}

bool isDigit(std::uint8_t octet) { return std::isdigit(octet & 0x7F) != 0; }

// Six digits in a row, with or without parity, are nowhere within an element where they were.
void requireNoDigits(const fuzz::Octets& before, const fuzz::Octets& after) {
    constexpr std::size_t digitsThatTell = 6;
    const isdn::Layer2 link = isdn::parseLayer2(before);
    if (!link.carriesMessage())
        return;
    for (const isdn::Element& element : isdn::parseLayer3(link.information).elements) {
        const bool isFacility = element.codeset == 0 && (element.id == isdn::element::facility ||
                                                         element.id == isdn::element::extendedFacility);
        if (isFacility)
            continue;  // identifiers and lengths of values may look like digits
        const auto from = static_cast<std::size_t>(element.octets.data() - before.data());
        std::size_t run = 0;
        for (std::size_t at = from; at < from + element.octets.size(); ++at) {
            const bool same = isDigit(before[at]) && after[at] == before[at] && (before[at] & 0x7F) != '0';
            run = same ? run + 1 : 0;
            fuzz::require(run < digitsThatTell, "digits stay nowhere");
        }
    }
}

bool isBlank(std::uint8_t octet) {
    return octet == 0 || octet == 0x7F || octet == 0x80 || octet == 0xFF || octet == '0' || octet == 0xB0;
}

void check(const std::vector<Passed>& frames, isdn::Variant variant, bool blankShort) {
    const redaction::Key key = redaction::test::keyOf(7);
    const auto redact = redaction::makePseudonyms(key, Direction::redact);
    const auto restore = redaction::makePseudonyms(key, Direction::restore);
    const std::vector<Passed> redacted = redaction::test::redacted(frames, *redact, variant, blankShort);
    const std::vector<Passed> restored = redaction::test::redacted(redacted, *restore, variant, blankShort);
    for (std::size_t i = 0; i < frames.size(); ++i) {
        const fuzz::Octets& before = frames[i].octets;
        const fuzz::Octets& after = redacted[i].octets;
        const fuzz::Octets& again = restored[i].octets;
        fuzz::require(before.size() == after.size() && before.size() == again.size(), "lengths stay");
        fuzz::require(redaction::planOfFrame(before, variant) == redaction::planOfFrame(after, variant),
                      "a redacted frame has the plan of the original");
        requireOtherDigits(before, after);
        requireNoDigits(before, after);
        for (std::size_t at = 0; at < before.size(); ++at)
            fuzz::require(again[at] == before[at] || (again[at] == after[at] && isBlank(after[at])),
                          "what was not blanked comes back");
    }
}

}  // namespace

// An octet that says the variant, then frames: an octet of direction, one of length, and the frame's octets.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    fuzz::Input input(data, size);
    const std::uint8_t manner = input.octet();
    std::vector<Passed> frames;
    while (!input.atEnd()) {
        Passed& frame = frames.emplace_back();
        frame.transmitted = (input.octet() & 1U) != 0;
        frame.octets.resize(input.octet());
        for (std::uint8_t& octet : frame.octets)
            octet = input.octet();
    }
    check(frames, variants[manner % variants.size()], (manner & 0x80U) != 0);
    return 0;
}
