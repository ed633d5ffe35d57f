#include "redaction/plan.h"

#include <algorithm>
#include <utility>

#include "isdn/Field.h"
#include "isdn/facility.h"
#include "isdn/values.h"

namespace redaction {

namespace {

using isdn::Element;
using isdn::Field;
using isdn::Octets;
using isdn::Variant;
namespace element = isdn::element;

constexpr std::uint8_t extensionBit = 0x80;
// set in a wrong length octet that is too long, so that it stays too long
constexpr std::uint8_t tooLong = 0xFF;

class Planner {
  public:
    Planner(Octets whole, Variant variant) : whole_(whole), variant_(variant) {}

    Plan run() && { return std::move(plan_); }

    void planLink() {
        const isdn::Layer2 link = isdn::parseLayer2(whole_);
        const bool isSound = link.problem == isdn::Problem::none;
        if (isSound && link.carriesMessage())
            planMessage(link.information);
        else if (isSound && link.carriesTeiMessage())
            planTeiMessage(link.information);
        else if (isSound && link.type == isdn::FrameType::FRMR)
            add(behind(link.information, frameRejectSize), Treatment::blank);
        else if (isSound && link.type == isdn::FrameType::XID)
            planIdentification(link.information);
        else
            add(link.information, Treatment::blank);
    }

    void planMessage(Octets octets) {
        const isdn::Layer3 message = isdn::parseLayer3(octets);
        const Element dialled = dialledIn(message);
        for (const Element& each : message.elements)
            planElement(each, message, dialled);
        const isdn::CallReference& reference = message.callReference;
        if (reference.octets.size() < reference.length)
            add(reference.octets, Treatment::blank);
        // If the length of a call reference is wrong, its length octet is kept, because that shows the error.
        const bool wrongLength = message.problem == isdn::Problem::invalid;
        add(behind(message.raw, wrongLength ? 1 : 0), Treatment::blank);
    }

  private:
    static constexpr std::size_t frameRejectSize = 5;

    static Octets behind(Octets octets, std::size_t count) {
        return octets.subspan(std::min(octets.size(), count));
    }

    void add(Octets octets, Treatment treatment, std::uint8_t keptBits = 0, std::uint8_t setBits = 0) {
        if (!octets.empty())
            plan_.push_back({static_cast<std::size_t>(octets.data() - whole_.data()), octets.size(),
                             treatment, keptBits, setBits});
    }
    // Blanks a field of an element so that the fields around it are read as before: bit 8 says where a group
    // ends, the other bits of an octet are other fields, and in a display a length that is too long must stay
    // too long.
    void addDoubtful(const Field& field, const Element& each) {
        if (field.kind == Field::Kind::extension)
            return;
        const bool keepsEnd = field.name == "extension";
        add(field.at, Treatment::blank, keepsEnd ? extensionBit : bitsBeside(field),
            isDisplay(each) ? tooLong : std::uint8_t{0});
    }
    // The bits of the octet that do not belong to the field; no bits if the field has several octets.
    static std::uint8_t bitsBeside(const Field& field) {
        if (field.at.size() != 1)
            return 0;
        const unsigned upTo = (1U << field.high) - 1U, below = (1U << (field.low - 1U)) - 1U;
        return static_cast<std::uint8_t>(~(upTo & ~below));
    }

    // Octets after the last action indicator are blanked. If no indicator says that it is the last, the first
    // counts as the last.
    void planTeiMessage(Octets information) {
        constexpr std::uint8_t teiManagement = 0x0F;
        constexpr std::size_t header = 4;
        const isdn::TeiMessage message = isdn::parseTeiMessage(information);
        if (message.entity != teiManagement)
            add(behind(information, 1), Treatment::blank);
        else if (information.size() > header) {
            const bool ends = (message.actions.back() & 1U) != 0;
            add(behind(information, header + (ends ? message.actions.size() : 1)), Treatment::blank);
        }
    }

    // Plans the groups of ISO/IEC 8885. The parameters of the link are kept; user data (FF) has no length and
    // is blanked. If a length is wrong, of a group or within it, only the identifier of the group is kept,
    // and everything after it is blanked.
    void planIdentification(Octets information) {
        constexpr std::uint8_t generalPurpose = 0x82, linkParameters = 0x80;
        constexpr std::size_t header = 3;
        if (information.empty() || information[0] != generalPurpose) {
            add(information, Treatment::blank);
            return;
        }
        Octets rest = information.subspan(1);
        while (rest.size() >= header && rest[0] == linkParameters) {
            const std::size_t size = rest[1] * std::size_t{256} + rest[2];
            if (size > rest.size() - header || !areParameters(rest.subspan(header, size))) {
                add(behind(rest, 1), Treatment::blank, 0, tooLong);
                return;
            }
            rest = rest.subspan(header + size);
        }
        add(behind(rest, 1), Treatment::blank);
    }

    // Whether the octets are a sequence of identifier, length and value.
    static bool areParameters(Octets octets) {
        constexpr std::size_t header = 2;
        while (octets.size() >= header && octets[1] <= octets.size() - header)
            octets = octets.subspan(header + octets[1]);
        return octets.empty();
    }

    // The element with the digits that the caller dials: the called number if it has any, or else the keypad.
    static Element dialledIn(const isdn::Layer3& message) {
        const bool dials =
            message.discriminator == isdn::callControl && !message.national &&
            (message.type == isdn::message::setup || message.type == isdn::message::information);
        if (!message.hasType || !dials)
            return {};
        const Element called = message.elements.find(element::calledNumber);
        const auto number = isdn::partyNumber(called);
        const bool hasDigits = number && !number->digits.empty() && called.problem == isdn::Problem::none;
        return hasDigits ? called : message.elements.find(element::keypad);
    }

    void planElement(const Element& each, const isdn::Layer3& message, const Element& dialled) {
        if (each.singleOctet())
            return;
        if (each.problem != isdn::Problem::none) {
            add(each.contents, Treatment::blank);
            return;
        }
        if (each.codeset == 0 && (each.id == element::facility || each.id == element::extendedFacility)) {
            planFacility(each.contents);
            return;
        }
        fields_.clear();
        isdn::fieldsOf(each, variant_, fields_);
        const bool isDialled = each.octets.data() == dialled.octets.data();
        const bool ofInformation = message.type == isdn::message::information;
        bool isOpen = false;  // an octet before it says that its group goes on
        for (const Field& field : fields_) {
            if (field.kind == Field::Kind::extension)
                isOpen = field.value == 0;
            Treatment treatment = treatmentOf(field, each, isOpen);
            if (treatment == Treatment::number && mayBeDialled(each))
                treatment = isDialled       ? Treatment::dialled
                            : ofInformation ? Treatment::blank
                                            : Treatment::number;
            if (field.doubtful)
                addDoubtful(field, each);
            else if (names(field, each))
                add(field.at, treatment);
        }
    }

    static bool isDisplay(const Element& each) {
        constexpr std::uint8_t displayOfNational = 0x2A;  // in codeset 5
        return (each.codeset == 0 && each.id == element::display) ||
               (each.codeset == 5 && each.id == displayOfNational);
    }
    static bool mayBeDialled(const Element& each) {
        return each.codeset == 0 && (each.id == element::calledNumber || each.id == element::keypad);
    }

    // Whether raw octets that no table marks may identify a person: all may, except those of charges and
    // those beside a display.
    static bool names(const Field& field, const Element& each) {
        const bool isOpaque =
            field.kind == Field::Kind::raw && each.id != element::changeStatus && !isDisplay(each);
        return field.personal || isOpaque;
    }

    static Treatment treatmentOf(const Field& field, const Element& each, bool isOpen) {
        if (!field.personal)
            return Treatment::blank;
        if (field.kind == Field::Kind::text) {
            const bool isNumber =
                isdn::partyNumber(each) || (each.codeset == 0 && each.id == element::keypad);
            return isNumber ? Treatment::number : Treatment::text;
        }
        // A pseudonym could set bit 8 and so end the group at another octet.
        return isOpen ? Treatment::blank : Treatment::octets;
    }

    // Only the type of a value decides. Its contents must not, because the plan of the redacted frame must be
    // the same.
    void planFacility(Octets contents) {
        const isdn::Facility facility(contents, variant_);
        const isdn::BerTree& tree = facility.tree();
        // The profile has one octet. More octets of it are blanked, but the last one must still end the
        // profile.
        const auto last =
            std::ranges::find_if(contents, [](std::uint8_t octet) { return (octet & extensionBit) != 0; });
        const auto profile = std::min(contents.size(), static_cast<std::size_t>(last - contents.begin()) + 1);
        add(behind(contents.first(profile), 1), Treatment::blank, extensionBit);
        if (tree.octets().empty())
            add(behind(contents, profile), Treatment::blank);
        const std::vector<isdn::BerValue>& values = tree.values();
        for (std::size_t i = 0; i < values.size(); ++i) {
            const isdn::BerType* const type = facility.meanings()[i].type;
            if (values[i].problem == isdn::BerProblem::noEnd || !isdn::isPersonal(values[i], type))
                continue;
            const bool isWhole = values[i].problem == isdn::BerProblem::none;
            add(tree.contentsOf(values[i]), isWhole ? treatmentOf(values[i], type) : Treatment::blank);
        }
    }

    static Treatment treatmentOf(const isdn::BerValue& value, const isdn::BerType* type) {
        using Kind = isdn::BerType::Kind;
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

    Octets whole_;
    Variant variant_;
    Plan plan_;
    isdn::Fields fields_;
};

}  // namespace

Plan planOfFrame(Octets frame, Variant variant) {
    Planner planner(frame, variant);
    planner.planLink();
    return std::move(planner).run();
}

Plan planOfMessage(Octets message, Variant variant) {
    Planner planner(message, variant);
    planner.planMessage(message);
    return std::move(planner).run();
}

}  // namespace redaction
