#include "calls/ElementRules.h"

#include <algorithm>
#include <array>
#include <bitset>

#include "isdn/Field.h"

namespace calls {

namespace {

namespace element = isdn::element;
namespace type = isdn::message;

struct Mandatory {
    std::uint8_t message;
    std::uint8_t element;
};
constexpr std::array mandatory{
    Mandatory{type::setup, element::bearerCapability},
    Mandatory{type::progress, element::progressIndicator},
    Mandatory{type::disconnect, element::cause},
    Mandatory{type::status, element::cause},
    Mandatory{type::status, element::callState},
    Mandatory{type::notify, element::notificationIndicator},
    Mandatory{type::restart, element::restartIndicator},
    Mandatory{type::restartAcknowledge, element::restartIndicator},
    Mandatory{type::userInformation, element::userUser},
    Mandatory{type::suspendReject, element::cause},
    Mandatory{type::resumeReject, element::cause},
    Mandatory{type::resumeAcknowledge, element::channelIdentification},
    Mandatory{type::holdReject, element::cause},
    Mandatory{type::retrieveReject, element::cause},
};

// Elements of codeset 0 that may be repeated (Q.931 4.5.1, 4.5.5 to 4.5.22, Q.932 8.2).
constexpr std::array<std::uint8_t, 10> repeatable{element::bearerCapability,  element::lowLayerCompatibility,
                                                  element::facility,          element::extendedFacility,
                                                  element::progressIndicator, element::notificationIndicator,
                                                  element::networkFacilities, element::transitNetwork,
                                                  element::display,           element::redirectingNumber};

bool mayRepeat(std::uint8_t id, isdn::Variant variant) {
    return std::find(repeatable.begin(), repeatable.end(), id) != repeatable.end() ||
           (id == element::callingNumber && variant == isdn::Variant::net5);
}

std::string nameOf(const isdn::Element& found, isdn::Variant variant) {
    const std::string_view name = isdn::elementName(found, variant);
    if (!name.empty())
        return std::string(name);
    constexpr std::string_view digits = "0123456789abcdef";
    return "element " + std::string{digits[found.id >> 4U], digits[found.id & 15U]} + " of codeset " +
           std::to_string(found.codeset);
}

// The standard's name for an element that is absent.
std::string nameOf(std::uint8_t id, isdn::Variant variant) {
    return std::string(isdn::elementName(0, id, variant));
}

}  // namespace

std::vector<BrokenRule> brokenElementRules(const Message& message, bool clearsFirst) {
    std::vector<BrokenRule> broken;
    const isdn::Layer3& layer3 = message.layer3;
    if (!layer3.hasType || layer3.national || layer3.type == type::segment)
        return broken;
    const std::string name(isdn::messageName(layer3));
    std::bitset<256> seen;
    for (const isdn::Element& each : layer3.elements) {
        if (each.problem == isdn::Problem::truncated || each.problem == isdn::Problem::tooShort)
            broken.push_back({&findings::elementDamaged, nameOf(each, message.variant) + " of " + name +
                                                             " is " +
                                                             std::string(isdn::nameOf(each.problem))});
        if (each.codeset != 0 || each.singleOctet())
            continue;
        if (seen.test(each.id) && !mayRepeat(each.id, message.variant))
            broken.push_back({&findings::elementRepeated,
                              nameOf(each, message.variant) + " stands in " + name + " more than once"});
        seen.set(each.id);
    }
    if (layer3.discriminator != isdn::callControl)
        return broken;
    const auto demand = [&](std::uint8_t id, bool ifFirst = false) {
        if (!seen.test(id))
            broken.push_back(
                {&findings::elementAbsent, name + " has no " + nameOf(id, message.variant), ifFirst});
    };
    for (const Mandatory& each : mandatory) {
        if (each.message == layer3.type)
            demand(each.element);
    }
    // The user may leave the channel to the network, which has to choose one (Q.931 table 3-15).
    if (layer3.type == type::setup && message.sender() == isdn::Sender::network)
        demand(element::channelIdentification);
    if (clearsFirst && (layer3.type == type::release || layer3.type == type::releaseComplete))
        demand(element::cause, true);
    if (layer3.type == type::facility && !seen.test(element::facility) &&
        !seen.test(element::extendedFacility))
        broken.push_back(
            {&findings::elementAbsent, name + " has no " + nameOf(element::facility, message.variant)});
    return broken;
}

}  // namespace calls
