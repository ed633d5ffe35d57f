#include "redaction/Redactor.h"

#include <algorithm>
#include <utility>

#include "isdn/values.h"

namespace redaction {

namespace {

namespace type = isdn::message;

constexpr std::size_t fewDigits = 6;        // a number with fewer digits is short
constexpr std::size_t longestNumber = 256;  // nobody dials more digits

// `*` and `#` are no digits and are kept when a number is blanked, so that the blanked number has as many
// digits as before.
bool countsAsDigit(std::uint8_t octet) { return octet != '*' && octet != '#'; }

void blankNumber(std::span<std::uint8_t> octets) {
    std::replace_if(octets.begin(), octets.end(), countsAsDigit, std::uint8_t{'0'});
}

bool isSegment(const isdn::Layer3& message) {
    return message.discriminator == isdn::callControl && message.hasType && !message.national &&
           message.type == type::segment;
}

}  // namespace

void Redactor::expect(std::uint64_t number) {
    expected_ = number;
    heard_ = {};
}

void Redactor::heard(const calls::Message& message, const calls::Call* call) {
    if (message.number != expected_) {
        mayMiss();  // the frame was accepted late, because frames before it are missing
        return;
    }
    heard_.isAccepted = true;
    heard_.from = message.from();
    if (call != nullptr)
        heard_.call = call->number;
    if (call != nullptr && message.layer3.type == type::setup)
        for (const calls::Side side : {calls::Side::us, calls::Side::peer})
            dialled_[{call->number, side}] = {{}, losses_};
    if (message.layer3.octets.data() != message.layer2.information.data())
        heard_.whole.assign(message.layer3.octets.begin(), message.layer3.octets.end());
}

void Redactor::gone(const calls::Call& call) {
    for (const calls::Side side : {calls::Side::us, calls::Side::peer})
        dialled_.erase({call.number, side});
}

void Redactor::take(const capture::Frame& frame, const calls::Marks& marks, isdn::Variant variant,
                    std::vector<Rebuilt>& done) {
    if (marks.outOfSequence && marks.accepted.value_or(false))
        mayMiss();
    const isdn::Layer2 link = isdn::parseLayer2(frame.octets);
    const isdn::Layer3 message = link.carriesMessage() ? isdn::parseLayer3(link.information) : isdn::Layer3();
    place_ = {frame.interface, link.tei, link.ns, frame.transmitted};
    information_ = link.information;
    Rebuilt rebuilt{expected_, {frame.octets.begin(), frame.octets.end()}};
    apply(planOfFrame(frame.octets, variant), rebuilt.octets, message.type);
    const bool isOfMessage =
        isSegment(message) && link.problem == isdn::Problem::none && marks.accepted.value_or(false);
    if (!isOfMessage ||
        !takeSegment({&frame, rebuilt.octets, expected_, message, link.tei}, variant, done, rebuilt))
        done.push_back(std::move(rebuilt));
}

std::vector<std::uint8_t> Redactor::cut(isdn::Octets frame, isdn::Variant variant) {
    expect(0);
    place_ = {};
    information_ = {};
    std::vector<std::uint8_t> octets(frame.begin(), frame.end());
    apply(planOfFrame(frame, variant), octets, type::information);
    return octets;
}

// By now the analysis has either kept the segment, completed a message with it, or found that it follows no
// other segment.
bool Redactor::takeSegment(const Segment& segment, isdn::Variant variant, std::vector<Rebuilt>& done,
                           Rebuilt& rebuilt) {
    if (!heard_.isAccepted) {
        const auto header =
            isdn::segmentHeader(segment.message.elements.find(isdn::element::segmentedMessage));
        return segments_.keep(segment, header && header->first, done);
    }
    if (heard_.whole.empty()) {
        segments_.giveUp(segment, done);
        return false;
    }
    const isdn::Layer3 message = isdn::parseLayer3(heard_.whole);
    std::vector<std::uint8_t> whole = heard_.whole;
    apply(planOfMessage(heard_.whole, variant), whole, message.type);
    segments_.finish(segment, whole, done, rebuilt.octets);
    return false;
}

void Redactor::apply(const Plan& plan, std::span<std::uint8_t> octets, std::uint8_t messageType) {
    for (const Part& part : plan) {
        const std::span<std::uint8_t> at = octets.subspan(part.at, part.size);
        std::string before;
        switch (part.treatment) {
            case Treatment::blank:
                for (std::uint8_t& octet : at)
                    octet = static_cast<std::uint8_t>((octet & part.keptBits) | part.setBits);
                break;
            case Treatment::number:
                replaceNumber(at, before);
                break;
            case Treatment::dialled:
                replaceDialled(at, messageType);
                break;
            case Treatment::text:
                pseudonyms_.replaceCharacters(at, before, Pseudonyms::Characters::text);
                break;
            case Treatment::octets:
                pseudonyms_.replaceOctets(at);
                break;
        }
    }
}

// Digits in SETUP begin a number, and digits in INFORMATION continue it.
void Redactor::replaceDialled(std::span<std::uint8_t> octets, std::uint8_t messageType) {
    const bool begins = messageType == type::setup;
    std::optional<std::string> before = begins ? std::string() : digitsBefore();
    bool isKnown = before.has_value();
    if (isKnown)
        isKnown = replaceNumber(octets, *before);
    else
        blankNumber(octets);
    if (heard_.call == 0)
        return;
    if (isKnown)
        dialled_[{heard_.call, heard_.from}] = {std::move(*before), losses_};
    else
        dialled_.erase({heard_.call, heard_.from});
}

// Returns the digits of the number that came before this frame, or nothing if they are not all known.
std::optional<std::string> Redactor::digitsBefore() {
    if (!heard_.isAccepted) {
        // A frame that is sent again gets the same pseudonyms as before.
        const auto sent = sent_.find(place_);
        const bool isAgain =
            sent != sent_.end() && std::ranges::equal(sent->second.information, information_);
        return isAgain ? std::optional(sent->second.before) : std::nullopt;
    }
    const auto known = dialled_.find({heard_.call, heard_.from});
    const bool goesOn = known != dialled_.end() && known->second.losses == losses_ &&
                        known->second.digits.size() < longestNumber;
    if (!goesOn) {
        sent_.erase(place_);
        return std::nullopt;
    }
    sent_[place_] = {{information_.begin(), information_.end()}, known->second.digits};
    return known->second.digits;
}

// Returns false if the number was blanked.
bool Redactor::replaceNumber(std::span<std::uint8_t> octets, std::string& before) {
    const auto digits =
        std::ranges::count_if(before, countsAsDigit) + std::ranges::count_if(octets, countsAsDigit);
    if (blankShort_ && static_cast<std::size_t>(digits) < fewDigits) {
        blankNumber(octets);
        return false;
    }
    pseudonyms_.replaceCharacters(octets, before, Pseudonyms::Characters::number);
    return true;
}

}  // namespace redaction
