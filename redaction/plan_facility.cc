// Decides which values of a facility are replaced. Only values of a known type are kept, and only if they are
// no longer than that type allows; what a value spells does not matter.
#include <algorithm>
#include <vector>

#include "isdn/facility.h"
#include "isdn/facility_types.h"
#include "redaction/PlanBuilder.h"

namespace redaction {

namespace {

using isdn::BerProblem;
using isdn::BerType;
using isdn::BerValue;
using isdn::Octets;

Treatment treatmentOf(const BerValue& value, const BerType* type) {
    using Kind = BerType::Kind;
    constexpr std::uint32_t utf8 = 12, firstString = 18, lastString = 27;
    if (type != nullptr)
        return type->kind == Kind::digits                             ? Treatment::number
               : type->kind == Kind::text || type->kind == Kind::name ? Treatment::text
                                                                      : Treatment::octets;
    if (value.tag == isdn::berNumericString)
        return Treatment::number;
    const bool isString =
        value.tag.tagClass == isdn::BerClass::universal &&
        (value.tag.number == utf8 || (value.tag.number >= firstString && value.tag.number <= lastString));
    return isString ? Treatment::text : Treatment::octets;
}

// The most octets of a value of a type that names nobody. A longer value is blanked.
std::size_t mostOf(const BerType& type) {
    if (&type == &isdn::facility::number)  // identifiers and codes
        return 2;
    switch (type.kind) {
        case BerType::Kind::boolean:
            return 1;
        case BerType::Kind::enumerated:
            return 2;
        case BerType::Kind::integer:  // units and amounts
        case BerType::Kind::text:     // a currency
            return 3;
        default:
            return 0;
    }
}

class FacilityPlanner {
  public:
    FacilityPlanner(Octets contents, PlanBuilder& to)
        : contents_(contents),
          facility_(contents, to.variant()),
          isDamaged_(std::ranges::any_of(tree().values(),
                                         [this](const BerValue& value) { return isDamaged(value); })),
          to_(to) {}

    void run() {
        planProfile();
        const std::vector<BerValue>& values = tree().values();
        for (std::size_t i = 0; i < values.size();)
            i = planValue(i);
    }

  private:
    const isdn::BerTree& tree() const { return facility_.tree(); }

    // Keeps the one octet of the profile. Blanks further octets of it, but keeps bit 8, which ends the
    // profile.
    void planProfile() {
        const auto last =
            std::ranges::find_if(contents_, [](std::uint8_t octet) { return (octet & extensionBit) != 0; });
        const auto profile =
            std::min(contents_.size(), static_cast<std::size_t>(last - contents_.begin()) + 1);
        to_.blank(behind(contents_.first(profile), 1), extensionBit);
        if (tree().octets().empty())
            to_.blank(behind(contents_, profile));
    }

    // Returns the index of the next value to plan.
    std::size_t planValue(std::size_t index) {
        const BerValue& value = tree().values()[index];
        // The length that is wrong may be an earlier one, so unknown values of a damaged facility are
        // blanked.
        if (isDamaged_ && (isUnknown(index) || hasLongIdentifier(value)))
            return blankTo(limitAround(index), value.offset, index);
        if (hasStrangeHeader(value))
            return blankTo(limitAround(index), value.offset + 1, index);
        if (value.problem == BerProblem::noEnd || (value.constructed && value.problem == BerProblem::none))
            return index + 1;
        const BerType* const type = facility_.meanings()[index].type;
        const bool isPersonal = isdn::isPersonal(value, type);
        if (value.problem != BerProblem::none || (!isPersonal && value.length > mostOf(index)))
            to_.blank(tree().contentsOf(value));
        else if (isPersonal)
            to_.add(tree().contentsOf(value), treatmentOf(value, type));
        return index + 1;
    }

    // Known facilities have identifiers of one octet and lengths of at most three. Longer or damaged ones are
    // not trusted.
    bool hasLongIdentifier(const BerValue& value) const {
        constexpr std::uint8_t isLong = 0x1F;
        return value.offset < tree().octets().size() && (tree().octets()[value.offset] & isLong) == isLong;
    }
    bool hasStrangeHeader(const BerValue& value) const {
        constexpr std::size_t most = 4;
        switch (value.problem) {
            case BerProblem::cut:
            case BerProblem::tagTooLong:
            case BerProblem::badLength:
                return true;
            default:
                return hasLongIdentifier(value) || value.contents - value.offset > most;
        }
    }

    bool isDamaged(const BerValue& value) const {
        return value.problem != BerProblem::none || hasStrangeHeader(value);
    }
    // Whether no table knows anything of the value. Zeros count as known, because they often fill an element.
    bool isUnknown(std::size_t index) const {
        constexpr isdn::BerTag zero{};
        const isdn::BerMeaning& meaning = facility_.meanings()[index];
        return meaning.type == nullptr && meaning.name.empty() && tree().values()[index].tag != zero;
    }

    // Blanks the octets up to `end` with FF, so that they stay unreadable. Returns the index of the next
    // value.
    std::size_t blankTo(std::size_t end, std::size_t from, std::size_t index) {
        to_.blank(behind(tree().octets().first(end), from), 0, allBits);
        return firstFrom(index, end);
    }

    std::size_t mostOf(std::size_t index) const {
        const BerValue& value = tree().values()[index];
        const isdn::BerMeaning& meaning = facility_.meanings()[index];
        // An object identifier is kept if it is that of an operation or an error that a table knows.
        if (value.tag == isdn::berObjectIdentifier)
            return meaning.says.empty() ? 0 : value.length;
        if (meaning.type != nullptr)
            return redaction::mostOf(*meaning.type);
        return value.tag == isdn::berBoolean ? 1 : 0;
    }

    // The end of the innermost enclosing value with a length, which a value with a wrong length cannot pass.
    std::size_t limitAround(std::size_t index) const {
        const std::vector<BerValue>& values = tree().values();
        std::size_t end = tree().octets().size();
        for (std::size_t i = 0; i < index; ++i) {
            const BerValue& around = values[i];
            if (around.next > index && !around.indefinite)
                end = around.contents + around.length;
        }
        return end;
    }

    // The first value after `index` that begins at this place or later.
    std::size_t firstFrom(std::size_t index, std::size_t place) const {
        const std::vector<BerValue>& values = tree().values();
        ++index;
        while (index < values.size() && values[index].offset < place)
            ++index;
        return index;
    }

    Octets contents_;
    isdn::Facility facility_;
    bool isDamaged_;
    PlanBuilder& to_;
};

}  // namespace

void planFacility(Octets contents, PlanBuilder& to) { FacilityPlanner(contents, to).run(); }

}  // namespace redaction
