// Which octets of an element name a person. What stays are codes that a table of the standards names, as long
// as the standard lets them be.
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

constexpr std::uint8_t tooLong = 0xFF;  // set in a length that is too long, it stays so

bool isDigit(std::uint8_t octet) {
    const unsigned character = octet & 0x7FU;  // bit 8 may be a parity
    return character >= '0' && character <= '9';
}

// Fields that name nobody as long as they are no longer than their standard has them, in octets. Of other
// fields of characters, or that no table describes, nothing stays; other fields have one octet.
struct Limit {
    enum class Beyond : std::uint8_t {
        all,   // a longer field is another thing
        rest,  // what is behind the limit is
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
    {"element", 2, Limit::Beyond::rest},   // that a cause is about
    {"interface", 2, Limit::Beyond::rest}, {"channel number", 31, Limit::Beyond::rest},
};

const Limit* limitOf(std::string_view field) {
    const auto* const found = std::ranges::find(limits, field, &Limit::field);
    return found == std::end(limits) ? nullptr : found;
}

// How many octets of each field with a limit have been seen. A field of one octet may repeat itself.
class Counted {
  public:
    // How many octets of the field stay.
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
        // Carriers, timers and charges are digits; octets that are none may be digits of four bits.
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

// The bits of its octet that are not the field's; none of a field of several octets.
std::uint8_t bitsBeside(const Field& field) {
    if (field.at.size() != 1)
        return 0;
    const unsigned upTo = (1U << field.high) - 1U, below = (1U << (field.low - 1U)) - 1U;
    return static_cast<std::uint8_t>(~(upTo & ~below));
}

// Blanks a field of an element so that what is around it is read as before: bit 8 says where a group ends,
// other bits of an octet are other fields, and in a display a length that is too long must stay so.
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
    // Bit 8 of a pseudonym would end the group elsewhere.
    return isOpen ? Treatment::blank : Treatment::octets;
}

// Whether a table says of each octet which code it is.
bool isOfCodes(const isdn::ElementTable& table) {
    return std::ranges::none_of(table.rows, [](const isdn::Row& row) {
        return row.isPersonal || (row.place.reader != nullptr && row.place.reader != isdn::readSlotMap);
    });
}

// Looks for digits in an element that consists of codes, where no code is one: three in a row, and all behind
// them, came there by a wrong length.
class DigitsAmongCodes {
  public:
    static constexpr std::size_t telling = 3;

    explicit DigitsAmongCodes(Octets contents) : contents_(contents) {}

    // The fields of an element in their order, as long as they are not doubtful. True once there are so many.
    bool take(const Field& field) {
        if (field.at.data() != last_)
            run_ = isDigit(field.at[0]) ? run_ + 1 : 0;
        last_ = field.at.data();
        return run_ == telling;
    }
    // The first of them, and all behind it.
    Octets found() const {
        const auto at = static_cast<std::size_t>(last_ - contents_.data());
        return contents_.subspan(at + 1 - telling);
    }

  private:
    Octets contents_;
    const std::uint8_t* last_ = nullptr;
    std::size_t run_ = 0;
};

// Elements of one octet that no table knows, or whose value has no name. A shift stays, whatever it says.
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
        bool isOpen = false;  // an octet before says that its group goes on
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

    // Zeros go on telling that there were digits.
    void blankDigits(Octets octets) {
        constexpr std::uint8_t digitBits = 0xF0;
        to_.dropFrom(octets);
        to_.blank(octets.first(DigitsAmongCodes::telling), digitBits);
        to_.blank(behind(octets, DigitsAmongCodes::telling), extensionBit);
    }
    void planCode(const Field& field) {
        // No element has this identifier, and none has the one that it becomes.
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
