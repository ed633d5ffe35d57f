// Decides which octets of an element are replaced. Only codes that a table of the standards names are kept,
// and only if they are no longer than the standard allows.
#include <algorithm>
#include <array>
#include <iterator>
#include <string_view>

#include "isdn/Field.h"
#include "isdn/Table.h"
#include "isdn/readers.h"
#include "isdn/values.h"
#include "redaction/PlanBuilder.h"

namespace redaction {

namespace {

using isdn::Element;
using isdn::Field;
using isdn::Octets;
using isdn::Variant;
namespace element = isdn::element;

constexpr std::uint8_t tooLong = 0xFF;  // replaces a length that is too long, so that it still is

bool isDigit(std::uint8_t octet) {
    const unsigned character = octet & 0x7FU;  // bit 8 may be a parity
    return character >= '0' && character <= '9';
}

// The fields of several octets that may be kept, and how many octets the standard allows them. Other fields
// of characters, and fields that no table describes, are blanked; all other fields have one octet.
struct Limit {
    enum class Beyond : std::uint8_t {
        all,   // a field that is too long is blanked as a whole
        rest,  // its octets after the limit are blanked
    };

    std::string_view field;
    std::size_t octets;
    Beyond beyond;
};
constexpr Limit limits[] = {
    {"network", 4, Limit::Beyond::all},    // a carrier has three or four digits
    {"timer", 3, Limit::Beyond::rest},     // "303"; some equipment adds characters
    {"charges", 5, Limit::Beyond::all},    // fewer than the digits of a number
    {"slot map", 4, Limit::Beyond::rest},  // of 2048 kbit/s
    {"element", 2, Limit::Beyond::rest},   // elements that the diagnostic of a cause names
    {"interface", 2, Limit::Beyond::rest}, {"channel number", 31, Limit::Beyond::rest},
};

const Limit* limitOf(std::string_view field) {
    const auto* const found = std::ranges::find(limits, field, &Limit::field);
    return found == std::end(limits) ? nullptr : found;
}

// How many octets of each field with a limit have been seen. A field of one octet may repeat itself.
class Counted {
  public:
    // How many octets of the field are kept.
    std::size_t keptOf(const Field& field) {
        const Limit* const limit = limitOf(field.name);
        const bool hasNoTable = field.kind == Field::Kind::text || field.kind == Field::Kind::raw;
        if (limit == nullptr)
            return hasNoTable ? 0 : field.at.size();
        std::size_t& seen = seen_[static_cast<std::size_t>(limit - std::begin(limits))];
        const std::size_t left = limit->octets - std::min(seen, limit->octets);
        seen += field.at.size();
        const std::size_t size = field.at.size();
        const std::size_t kept = size <= left ? size : limit->beyond == Limit::Beyond::all ? 0 : left;
        // Carriers, timers and charges consist of digits. Octets that are no digits may be digits of four
        // bits.
        return hasNoTable && !std::ranges::all_of(field.at.first(kept), isDigit) ? 0 : kept;
    }

  private:
    std::array<std::size_t, std::size(limits)> seen_{};
};

bool isDisplay(const Element& each) {
    constexpr std::uint8_t displayOfNational = 0x2A;  // in codeset 5
    return (each.codeset == 0 && each.id == element::display) ||
           (each.codeset == 5 && each.id == displayOfNational);
}
bool isFacility(const Element& each) {
    return each.codeset == 0 && (each.id == element::facility || each.id == element::extendedFacility);
}
bool mayBeDialled(const Element& each) {
    return each.codeset == 0 && (each.id == element::calledNumber || each.id == element::keypad);
}

// The bits of the field's octet that belong to other fields; none if the field has several octets.
std::uint8_t bitsBeside(const Field& field) {
    if (field.at.size() != 1)
        return 0;
    const unsigned upTo = (1U << field.high) - 1U, below = (1U << (field.low - 1U)) - 1U;
    return static_cast<std::uint8_t>(~(upTo & ~below));
}

// Blanks a field in such a way that its neighbours are read as before: keeps bit 8, which may end a group,
// and bits that belong to other fields. In a display a length that is too long stays too long.
void blankDoubtful(const Field& field, const Element& each, PlanBuilder& to) {
    if (field.kind == Field::Kind::extension)
        return;
    const bool keepsEnd = field.name == "extension";
    to.blank(field.at, keepsEnd ? extensionBit : bitsBeside(field),
             isDisplay(each) ? tooLong : std::uint8_t{0});
}

Treatment treatmentOf(const Field& field, const Element& each, bool isOpen) {
    if (field.kind == Field::Kind::text) {
        const bool isNumber = isdn::partyNumber(each) || (each.codeset == 0 && each.id == element::keypad);
        return isNumber ? Treatment::number : Treatment::text;
    }
    // Bit 8 of a pseudonym could end the group at another octet.
    return isOpen ? Treatment::blank : Treatment::octets;
}

// Whether a table says of each octet which code it is.
bool isOfCodes(const isdn::ElementTable& table) {
    return std::ranges::none_of(table.rows, [](const isdn::Row& row) {
        return row.isPersonal || (row.place.reader != nullptr && row.place.reader != isdn::readSlotMap);
    });
}

// Looks for digits in an element that consists of codes. Three octets in a row that are digits show that a
// wrong length has put them, and all after them, into the element.
class DigitsAmongCodes {
  public:
    static constexpr std::size_t telling = 3;

    explicit DigitsAmongCodes(Octets contents) : contents_(contents) {}

    // Takes the fields of an element in order, up to the first doubtful one. Returns true at the third digit.
    bool take(const Field& field) {
        if (field.at.data() != last_)
            run_ = isDigit(field.at[0]) ? run_ + 1 : 0;
        last_ = field.at.data();
        return run_ == telling;
    }
    // The octets from the first of these digits to the end.
    Octets found() const {
        const auto at = static_cast<std::size_t>(last_ - contents_.data());
        return contents_.subspan(at + 1 - telling);
    }

  private:
    Octets contents_;
    const std::uint8_t* last_ = nullptr;
    std::size_t run_ = 0;
};

// Blanks an element of one octet if no table knows it or its value has no name. Shifts are kept.
void planSingleOctet(const Element& each, PlanBuilder& to) {
    if (each.shift())
        return;
    isdn::Fields fields;
    isdn::fieldsOf(each, to.variant(), fields);
    const bool isKnown = isdn::elementTable(each, to.variant()) != nullptr &&
                         std::ranges::none_of(fields, [](const Field& field) {
                             return field.kind == Field::Kind::value && field.meaning.empty();
                         });
    if (!isKnown)
        to.blank(each.octets, extensionBit);
}

class ElementPlanner {
  public:
    ElementPlanner(const Element& each, const isdn::Layer3& message, const Element& dialled, PlanBuilder& to)
        : each_(each),
          isDialled_(each.octets.data() == dialled.octets.data()),
          ofInformation_(message.type == isdn::message::information),
          to_(to) {}

    void run() {
        isdn::Fields fields;
        isdn::fieldsOf(each_, to_.variant(), fields);
        const isdn::ElementTable* const table = isdn::elementTable(each_, to_.variant());
        const bool ofCodes = table != nullptr && isOfCodes(*table);
        DigitsAmongCodes digits(each_.contents);
        bool isOpen = false;  // whether an earlier octet says that its group goes on
        for (const Field& field : fields) {
            if (field.kind == Field::Kind::header)
                continue;
            if (ofCodes && !field.doubtful && digits.take(field)) {
                blankDigits(digits.found());
                return;
            }
            if (field.kind == Field::Kind::extension)
                isOpen = field.value == 0;
            if (field.doubtful)
                blankDoubtful(field, each_, to_);
            else if (field.personal)
                to_.add(field.at, treatmentOf(field, isOpen));
            else
                planCode(field);
        }
    }

  private:
    Treatment treatmentOf(const Field& field, bool isOpen) const {
        const Treatment treatment = redaction::treatmentOf(field, each_, isOpen);
        if (treatment != Treatment::number || !mayBeDialled(each_))
            return treatment;
        return isDialled_ ? Treatment::dialled : ofInformation_ ? Treatment::blank : Treatment::number;
    }

    // Blanks digits by zeros, so that undoing the redaction recognises digits at the same place.
    void blankDigits(Octets octets) {
        constexpr std::uint8_t digitBits = 0xF0;
        to_.dropFrom(octets);
        to_.blank(octets.first(DigitsAmongCodes::telling), digitBits);
        to_.blank(behind(octets, DigitsAmongCodes::telling), extensionBit);
    }
    void planCode(const Field& field) {
        // Replaces an identifier that no element has by another one that no element has.
        if (field.name == "element" && field.meaning.empty()) {
            constexpr std::uint8_t ofNoElement = 0x7F;
            to_.blank(field.at, extensionBit, ofNoElement);
            return;
        }
        const std::size_t kept = counted_.keptOf(field);
        if (kept < field.at.size())
            to_.blank(behind(field.at, kept), bitsBeside(field));
    }

    const Element& each_;
    bool isDialled_;
    bool ofInformation_;
    PlanBuilder& to_;
    Counted counted_;
};

}  // namespace

void planElement(const Element& each, const isdn::Layer3& message, const Element& dialled, PlanBuilder& to) {
    if (each.singleOctet())
        planSingleOctet(each, to);
    else if (each.problem != isdn::Problem::none)
        to.blank(each.contents);
    else if (isFacility(each))
        planFacility(each.contents, to);
    else
        ElementPlanner(each, message, dialled, to).run();
}

bool mayBeFollowedByDigits(const Element& each, Variant variant) {
    if (each.singleOctet())
        return false;
    const isdn::ElementTable* const table = isdn::elementTable(each, variant);
    return table == nullptr || !isOfCodes(*table);
}

}  // namespace redaction
