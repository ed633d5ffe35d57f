// Which values of a facility name a person. Of the values that stay, each is of a type that is known, and no
// longer than that type has them; whether a value spells something does not matter.
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

// Octets of a value of a known type that is nobody's: more are another thing.
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

    // The profile has one octet. More of them are known to nobody, but their end has to stay.
    void planProfile() {
        const auto last =
            std::ranges::find_if(contents_, [](std::uint8_t octet) { return (octet & extensionBit) != 0; });
        const auto profile =
            std::min(contents_.size(), static_cast<std::size_t>(last - contents_.begin()) + 1);
        to_.blank(behind(contents_.first(profile), 1), extensionBit);
        if (tree().octets().empty())
            to_.blank(behind(contents_, profile));
    }

    // Returns the index of the value to go on with.
    std::size_t planValue(std::size_t index) {
        const BerValue& value = tree().values()[index];
        // A wrong length is not always the one that shows it: values that nobody knows may be something else.
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

    // An identifier has one octet here, and a length at most three; of more octets, and where they are
    // damaged, nobody knows what they are.
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
    // A value of which no table knows anything. Zeros often fill an element up.
    bool isUnknown(std::size_t index) const {
        constexpr isdn::BerTag zero{};
        const isdn::BerMeaning& meaning = facility_.meanings()[index];
        return meaning.type == nullptr && meaning.name.empty() && tree().values()[index].tag != zero;
    }

    // From here on nothing can be told apart, and that stays so. Returns the index of the value behind it.
    std::size_t blankTo(std::size_t end, std::size_t from, std::size_t index) {
        to_.blank(behind(tree().octets().first(end), from), 0, allBits);
        return firstFrom(index, end);
    }

    std::size_t mostOf(std::size_t index) const {
        const BerValue& value = tree().values()[index];
        const isdn::BerMeaning& meaning = facility_.meanings()[index];
        // An operation or an error that a table knows.
        if (value.tag == isdn::berObjectIdentifier)
            return meaning.says.empty() ? 0 : value.length;
        if (meaning.type != nullptr)
            return redaction::mostOf(*meaning.type);
        return value.tag == isdn::berBoolean ? 1 : 0;
    }

    // Where the octets end that a value without a length of its own would take.
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

    // The first value behind `index` that does not begin before this place.
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
