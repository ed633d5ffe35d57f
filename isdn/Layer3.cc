#include "isdn/Layer3.h"

#include <algorithm>
#include <array>

namespace isdn {

namespace {

struct MessageRow {
    std::uint8_t type;
    std::string_view name;
};

// clang-format off

// Q.931 4.4, table 4-2; HOLD and RETRIEVE are Q.932's, 0x6A and 0x72 those of its ancestors (Q.932 of 1988).
constexpr MessageRow callControlMessages[] = {
    {message::alerting, "ALERTING"},
    {message::callProceeding, "CALL PROCEEDING"},
    {message::progress, "PROGRESS"},
    {message::setup, "SETUP"},
    {message::connect, "CONNECT"},
    {message::setupAcknowledge, "SETUP ACKNOWLEDGE"},
    {message::connectAcknowledge, "CONNECT ACKNOWLEDGE"},
    {message::userInformation, "USER INFORMATION"},
    {message::suspendReject, "SUSPEND REJECT"},
    {message::resumeReject, "RESUME REJECT"},
    {message::hold, "HOLD"},
    {message::suspend, "SUSPEND"},
    {message::resume, "RESUME"},
    {message::holdAcknowledge, "HOLD ACKNOWLEDGE"},
    {message::suspendAcknowledge, "SUSPEND ACKNOWLEDGE"},
    {message::resumeAcknowledge, "RESUME ACKNOWLEDGE"},
    {message::holdReject, "HOLD REJECT"},
    {message::retrieve, "RETRIEVE"},
    {message::retrieveAcknowledge, "RETRIEVE ACKNOWLEDGE"},
    {message::retrieveReject, "RETRIEVE REJECT"},
    {message::disconnect, "DISCONNECT"},
    {message::restart, "RESTART"},
    {message::release, "RELEASE"},
    {message::restartAcknowledge, "RESTART ACKNOWLEDGE"},
    {message::releaseComplete, "RELEASE COMPLETE"},
    {message::segment, "SEGMENT"},
    {message::facility, "FACILITY"},
    {message::registration, "REGISTER"},
    {0x6A, "FACILITY ACKNOWLEDGE"},
    {message::notify, "NOTIFY"},
    {0x72, "FACILITY REJECT"},
    {message::statusEnquiry, "STATUS ENQUIRY"},
    {message::congestionControl, "CONGESTION CONTROL"},
    {message::information, "INFORMATION"},
    {message::status, "STATUS"},
};

constexpr MessageRow maintenanceMessages[] = {
    {message::serviceAcknowledge, "SERVICE ACKNOWLEDGE"},
    {message::service, "SERVICE"},
};

// clang-format on

template <std::size_t N>
consteval std::array<std::string_view, 256> byType(const MessageRow (&rows)[N]) {
    std::array<std::string_view, 256> names{};
    for (const MessageRow& row : rows) {
        if (!names[row.type].empty())
            throw "the type has a row already";
        names[row.type] = row.name;
    }
    return names;
}

constexpr auto callControlNames = byType(callControlMessages);
constexpr auto maintenanceNames = byType(maintenanceMessages);

// Consumes the call reference behind the discriminator; false if the message ends within it, or if its length
// octet is not one (Q.931 4.3: bits 8 to 5 are 0).
bool parseCallReference(Layer3& message, Octets& rest) {
    const std::uint8_t lengthOctet = rest[0];
    if ((lengthOctet & 0xF0U) != 0) {
        message.problem = Problem::invalid;
        return false;
    }
    CallReference& reference = message.callReference;
    reference.length = lengthOctet;
    message.hasCallReference = true;
    rest = rest.subspan(1);
    reference.octets = rest.first(std::min<std::size_t>(rest.size(), lengthOctet));
    rest = rest.subspan(reference.octets.size());
    if (reference.octets.size() < lengthOctet) {
        message.problem = Problem::truncated;
        return false;
    }
    if (reference.length == 0)
        return true;
    reference.flag = (reference.octets[0] & 0x80U) != 0;
    reference.value = reference.octets[0] & 0x7FU;
    for (const std::uint8_t octet : reference.octets.subspan(1))
        reference.value = reference.value << 8 | octet;
    return true;
}

// The escape to national message types (Q.931 4.4) is the octet 00; the type follows it.
bool parseType(Layer3& message, Octets& rest) {
    message.national = !rest.empty() && rest[0] == 0 && message.discriminator == callControl;
    const std::size_t octets = message.national ? 2 : 1;
    if (rest.size() < octets) {
        message.problem = Problem::truncated;
        return false;
    }
    message.type = rest[octets - 1];
    message.hasType = true;
    rest = rest.subspan(octets);
    return true;
}

// What follows the first element of a SEGMENT is a piece of another message, not elements (Q.931 annex H).
void parseElements(Layer3& message, Octets rest) {
    message.elements = Elements(rest, 0, isMaintenance(message.discriminator));
    const bool segment =
        message.discriminator == callControl && !message.national && message.type == message::segment;
    if (!segment)
        return;
    const Element first = *message.elements.begin();
    if (first.id != element::segmentedMessage || first.octets.empty())
        return;
    message.elements = Elements(first.octets);
    message.raw = rest.subspan(first.octets.size());
}

}  // namespace

void Elements::Iterator::take() {
    element_ = Element();
    if (rest_.empty())
        return;
    const std::uint8_t id = rest_[0];
    element_.id = id;
    element_.ofService = ofService_;
    element_.codeset = next_;
    next_ = locked_;
    std::size_t size = 1;
    if (!element_.singleOctet()) {
        const std::size_t announced = rest_.size() > 1 ? 2U + rest_[1] : 2U;
        size = std::min(announced, rest_.size());
        if (size < announced)
            element_.problem = Problem::truncated;
        element_.contents =
            rest_.subspan(std::min<std::size_t>(2, size), size - std::min<std::size_t>(2, size));
    } else if (element_.shift()) {
        const std::uint8_t codeset = id & 7U;
        const bool locking = (id & 8U) == 0;
        // A locking shift never leads to a lower codeset (Q.931 4.5.3); such a one is ignored.
        if (locking && codeset > locked_)
            locked_ = codeset;
        else if (locking)
            element_.problem = Problem::invalid;
        next_ = locking ? locked_ : codeset;
    }
    element_.octets = rest_.first(size);
    rest_ = rest_.subspan(size);
}

Element Elements::find(std::uint8_t id, std::uint8_t codeset) const {
    for (const Element& element : *this) {
        if (element.id == id && element.codeset == codeset)
            return element;
    }
    return {};
}

Layer3 parseLayer3(Octets information) {
    Layer3 message;
    message.octets = information;
    if (information.empty()) {
        message.problem = Problem::tooShort;
        return message;
    }
    message.discriminator = information[0];
    Octets rest = information.subspan(1);
    message.header = information.first(1);
    if (message.discriminator != callControl && !isMaintenance(message.discriminator)) {
        message.problem = Problem::unknown;
        message.raw = rest;
        return message;
    }
    if (rest.empty()) {
        message.problem = Problem::truncated;
        return message;
    }
    const bool whole = parseCallReference(message, rest) && parseType(message, rest);
    message.header = information.first(information.size() - rest.size());
    if (!whole)
        message.raw = rest;
    else
        parseElements(message, rest);
    return message;
}

std::string_view messageName(std::uint8_t discriminator, std::uint8_t type) {
    if (discriminator == callControl)
        return callControlNames[type];
    return isMaintenance(discriminator) ? maintenanceNames[type] : std::string_view();
}

std::string_view protocolName(std::uint8_t discriminator) {
    if (discriminator == callControl)
        return "call control";
    return isMaintenance(discriminator) ? "maintenance" : std::string_view();
}

}  // namespace isdn
