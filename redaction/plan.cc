#include "redaction/plan.h"

#include <algorithm>
#include <utility>

#include "isdn/Field.h"
#include "isdn/Layer2.h"
#include "isdn/Layer3.h"
#include "isdn/values.h"
#include "redaction/PlanBuilder.h"

namespace redaction {

namespace {

using isdn::Element;
using isdn::Octets;
namespace element = isdn::element;

// Blanks the octets after the last action indicator. There are at most two of them; if neither the first nor
// the second says that it is the last, only the first is kept.
void planTeiMessage(Octets information, PlanBuilder& to) {
    constexpr std::uint8_t teiManagement = 0x0F;
    constexpr std::size_t header = 4, most = 2;
    const isdn::TeiMessage message = isdn::parseTeiMessage(information);
    if (message.entity != teiManagement || isdn::teiMessageName(message.type).empty()) {
        // The type becomes FF, which is unknown as well.
        to.blank(behind(information, 1), 0, message.entity == teiManagement ? allBits : std::uint8_t{0});
        return;
    }
    if (information.size() <= header)
        return;
    const bool ends = (message.actions.back() & 1U) != 0 && message.actions.size() <= most;
    to.blank(behind(information, header + (ends ? message.actions.size() : 1)));
}

// Keeps a frame reject in the standard's form (Q.921 5.8.5): the rejected control field, V(S) with a bit that
// is 0, V(R) with C/R, and four bits that say why. Blanks any other one, in such a way that its form stays
// wrong.
void planFrameReject(Octets information, PlanBuilder& to) {
    constexpr std::size_t size = 5, sent = 2, why = 4;
    const bool isSound =
        information.size() >= size && (information[sent] & 1U) == 0 && (information[why] & 0xF0U) == 0;
    if (isSound)
        to.blank(behind(information, size));
    else
        to.blank(information, 0, allBits);
}

// A parameter of the link, and how many octets its value has at most (ISO/IEC 8885, Q.921 appendix IV).
struct LinkParameter {
    std::uint8_t id;
    std::uint8_t octets;
};
constexpr LinkParameter linkParameters[] = {
    {5, 2},   // longest information, sent
    {6, 2},   // longest information, received
    {7, 1},   // window, sent
    {8, 1},   // window, received
    {9, 2},   // acknowledgement timer
    {10, 1},  // repetitions
};

// Calls take(identifier, value) for each parameter. Returns false if a length is wrong.
template <typename Take>
bool forEachParameter(Octets octets, Take take) {
    constexpr std::size_t header = 2;
    while (octets.size() >= header && octets[1] <= octets.size() - header) {
        take(octets[0], octets.subspan(header, octets[1]));
        octets = octets.subspan(header + octets[1]);
    }
    return octets.empty();
}

bool areParameters(Octets octets) {
    return forEachParameter(octets, [](std::uint8_t, Octets) {});
}

void planParameter(std::uint8_t id, Octets value, PlanBuilder& to) {
    const bool isKnown = std::ranges::any_of(linkParameters, [&](const LinkParameter& known) {
        return known.id == id && value.size() <= known.octets;
    });
    if (!isKnown)
        to.blank(value);
}

// Keeps the parameters of the link in groups of ISO/IEC 8885, and blanks user data (FF), which has no length.
// Keeps only the identifier of a group that has or contains a wrong length, and blanks everything after it.
void planIdentification(Octets information, PlanBuilder& to) {
    constexpr std::uint8_t generalPurpose = 0x82, ofLink = 0x80;
    constexpr std::size_t header = 3;
    if (information.empty() || information[0] != generalPurpose) {
        to.blank(information);
        return;
    }
    Octets rest = information.subspan(1);
    while (rest.size() >= header && rest[0] == ofLink) {
        const std::size_t size = rest[1] * std::size_t{256} + rest[2];
        if (size > rest.size() - header || !areParameters(rest.subspan(header, size))) {
            to.blank(behind(rest, 1), 0, allBits);
            return;
        }
        forEachParameter(rest.subspan(header, size),
                         [&](std::uint8_t id, Octets value) { planParameter(id, value, to); });
        rest = rest.subspan(header + size);
    }
    to.blank(behind(rest, 1));
}

// The element with the digits that the caller dials: the called number if it has digits, else the keypad.
Element dialledIn(const isdn::Layer3& message) {
    const bool dials = message.discriminator == isdn::callControl && !message.national &&
                       (message.type == isdn::message::setup || message.type == isdn::message::information);
    if (!message.hasType || !dials)
        return {};
    const Element called = message.elements.find(element::calledNumber);
    const auto number = isdn::partyNumber(called);
    const bool hasDigits = number && !number->digits.empty() && called.problem == isdn::Problem::none;
    return hasDigits ? called : message.elements.find(element::keypad);
}

void planMessage(Octets octets, PlanBuilder& to) {
    const isdn::Layer3 message = isdn::parseLayer3(octets);
    // Trunks use call references of one or two octets. A longer one, and all after it, is not trusted.
    constexpr std::size_t longestReference = 2, lengthOfReference = 2;
    if (message.callReference.length > longestReference) {
        to.blank(behind(octets, lengthOfReference));
        return;
    }
    if (message.callReference.octets.size() < message.callReference.length)
        to.blank(message.callReference.octets);
    const Element dialled = dialledIn(message);
    Octets doubtful;  // all octets from the first one that a wrong length may have put at its place
    bool isTruncated = false;
    for (const Element& each : message.elements) {
        planElement(each, message, dialled, to);
        isTruncated = each.problem == isdn::Problem::truncated;
        if (doubtful.data() != nullptr || !mayBeFollowedByDigits(each, to.variant()))
            continue;
        const bool isUnknown = isTruncated && isdn::elementName(each, to.variant()).empty();
        doubtful = behind(octets,
                          (isUnknown ? to.placeOf(each.octets) : to.endOf(each.octets)) - to.placeOf(octets));
    }
    // If a message ends within an element, a length is wrong: that of the last element, or of one before it,
    // so that digits are taken for elements. The blanked message must still end within an element.
    if (isTruncated && !doubtful.empty()) {
        constexpr std::uint8_t ofNoElement = 0x7F;
        to.dropFrom(doubtful);
        to.blank(doubtful.first(1), 0, ofNoElement);
        to.blank(behind(doubtful.first(std::min<std::size_t>(doubtful.size(), 2)), 1), 0, allBits);
        to.blank(behind(doubtful, 2));
    }
    // Keep the length octet of a call reference even if it is wrong, so that the error can still be seen.
    const bool wrongLength = message.problem == isdn::Problem::invalid;
    to.blank(behind(message.raw, wrongLength ? 1 : 0));
}

void planLink(Octets frame, PlanBuilder& to) {
    const isdn::Layer2 link = isdn::parseLayer2(frame);
    const bool isSound = link.problem == isdn::Problem::none;
    if (isSound && link.carriesMessage())
        planMessage(link.information, to);
    else if (isSound && link.carriesTeiMessage())
        planTeiMessage(link.information, to);
    else if (isSound && link.type == isdn::FrameType::FRMR)
        planFrameReject(link.information, to);
    else if (isSound && link.type == isdn::FrameType::XID)
        planIdentification(link.information, to);
    else
        to.blank(link.information);
}

}  // namespace

Plan planOfFrame(Octets frame, isdn::Variant variant) {
    PlanBuilder builder(frame, variant);
    planLink(frame, builder);
    return std::move(builder).finish();
}

Plan planOfMessage(Octets message, isdn::Variant variant) {
    PlanBuilder builder(message, variant);
    planMessage(message, builder);
    return std::move(builder).finish();
}

}  // namespace redaction
