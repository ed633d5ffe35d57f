#include "calls/Life.h"

#include <algorithm>
#include <utility>

#include "calls/causes.h"
#include "isdn/words.h"

namespace calls {

namespace {

using isdn::Element;
namespace element = isdn::element;
namespace type = isdn::message;

Number numberOf(const isdn::PartyNumber& party) {
    return {std::string(party.digits), party.type, party.plan, party.presentation};
}

// When an element occurs twice, the first one counts (Q.931 4.5.1).
void learnNumber(Number& number, const Element& found) {
    if (!number.digits.empty() || found.octets.empty())
        return;
    if (const auto party = isdn::partyNumber(found))
        number = numberOf(*party);
}

// The digits of the called party come in SETUP and, one by one, in INFORMATION: each time in CALLED PARTY
// NUM, or else in KEYPAD. The first CALLED PARTY NUM gives type and plan.
void learnDigits(Life& life, const Message& message) {
    Call& call = life.call;
    const isdn::Layer3& layer3 = message.layer3;
    const bool isSetup = layer3.type == type::setup;
    if (message.from() != call.origin || life.proceeding || (!isSetup && layer3.type != type::information))
        return;
    if (isSetup && call.messages > 1)
        return;  // a repetition has the digits of the first SETUP
    const auto party = isdn::partyNumber(layer3.elements.find(element::calledNumber));
    const std::string_view keypad = isdn::keypadDigits(layer3.elements.find(element::keypad));
    const std::string_view digits = party ? party->digits : keypad;
    if (party && !std::exchange(life.numberTyped, true)) {
        std::string before = std::move(call.called.digits);  // from KEYPAD
        call.called = numberOf(*party);
        call.called.digits = std::move(before);
    }
    constexpr std::size_t most = 256;  // nobody dials a longer number
    if (call.called.digits.size() + digits.size() <= most)
        call.called.digits.append(digits);
    if (!isSetup && (party || !keypad.empty())) {
        call.overlap = true;
        call.lastDigit = message.at - call.begin.at;
    }
}

void learnBearer(Call& call, const Message& message) {
    const Element bearer = message.layer3.elements.find(element::bearerCapability);
    if (call.bearer.empty() && !bearer.octets.empty())
        isdn::appendWords(call.bearer, bearer, message.variant);
}

// "30!", without the element's name in front.
std::string wordsOf(const Element& channel, const Message& message) {
    constexpr std::string_view name = "channel ";
    std::string words;
    isdn::appendWords(words, channel, message.variant, message.sender());
    return words.starts_with(name) ? words.substr(name.size()) : words;
}

void learnChannel(Life& life, const Message& message) {
    const Element found = message.layer3.elements.find(element::channelIdentification);
    if (found.octets.empty())
        return;
    const auto channel = isdn::channelId(found);
    if (!channel)
        return;
    Call& call = life.call;
    // The D-channel indicator says that the connection has no B channel. "No channel" alone is a call that
    // waits for one.
    if (channel->dChannel && channel->channels.none())
        call.kind = Kind::signalling;
    if (message.layer3.type == type::retrieveAcknowledge || message.layer3.type == type::resumeAcknowledge)
        call.moved = channel;
    if (message.from() == call.origin) {
        if (message.layer3.type == type::setup && !call.asked) {
            call.asked = channel;
            call.askedWords = wordsOf(found, message);
        }
    } else if (!call.granted && !isClearing(message.layer3.type)) {
        call.granted = channel;
        call.grantedWords = wordsOf(found, message);
    }
}

void learnTime(std::optional<std::int64_t>& since, const Call& call, const Message& message) {
    if (!since)
        since = message.at - call.begin.at;
}

void learnTimes(Life& life, const Message& message) {
    Call& call = life.call;
    if (message.from() == call.origin)
        return;
    life.answered = true;
    if (call.beforeTrace)
        return;  // the time of SETUP is not known
    switch (message.layer3.type) {
        case type::progress:
            learnTime(call.progress, call, message);
            break;
        case type::alerting:
            learnTime(call.alerting, call, message);
            break;
        case type::connect:
            learnTime(call.connect, call, message);
            break;
        default:
            break;
    }
    learnTime(call.firstResponse, call, message);
}

std::optional<CauseGiven> causeOf(const Message& message) {
    const Element found = message.layer3.elements.find(element::cause);
    const auto cause = isdn::cause(found);
    if (!cause)
        return std::nullopt;
    CauseGiven given;
    given.frame = message.number;
    given.message = message.layer3.type;
    given.from = message.from();
    given.role = message.senderRole();
    given.codingStandard = cause->codingStandard;
    given.location = cause->location;
    given.value = cause->value;
    given.diagnostics.assign(cause->diagnostics.begin(), cause->diagnostics.end());
    isdn::appendWords(given.words, found, message.variant, message.sender());
    return given;
}

std::string nameOfDChannel(const Message& message) {
    const capture::Interface* const interface = message.frame->interface;
    return interface == nullptr ? std::string() : interface->name;
}

// Whether the message was sent before the frame that began the clearing had come: its N(R) does not
// acknowledge that frame. N(R) of another D channel of the group, or after the link was set up again, tells
// nothing about it.
bool crossesClearing(const Life& life, const Message& message) {
    if (!life.clearingNumbered || !message.layer2.hasNs() ||
        nameOfDChannel(message) != life.clearingChannel || message.numbering != life.clearingNumbering)
        return false;
    const unsigned ahead = (message.layer2.nr - life.clearingNs - 1U) & 127U;
    return ahead >= 64;
}

// Whether the message is about one terminal of a call that was offered to all: the terminal refuses, or it is
// released because another one has the call. The network may release it before it acknowledges the other
// one's CONNECT.
bool concernsOneTerminal(const Life& life, const Message& message, const std::optional<CauseGiven>& cause) {
    constexpr std::uint8_t anotherUserWasSelected = 26;  // Q.850
    if (!life.call.broadcast)
        return false;
    if (life.winner)
        return *life.winner != message.layer2.tei;
    return message.from() != life.call.origin ||
           (cause && cause->codingStandard == 0 && cause->value == anotherUserWasSelected);
}

// How much a cause of a terminal says about the user. The network passes on the cause that says most (Q.931
// 5.2.5.4); of those that say as much, the first.
unsigned weightOf(const CauseGiven& cause) {
    constexpr std::uint8_t userBusy = 17, callRejected = 21;  // Q.850
    if (cause.codingStandard != 0)
        return 0;
    return cause.value == callRejected ? 2 : cause.value == userBusy ? 1 : 0;
}

// Takes a clearing message of a call to all that is about a single terminal.
void learnOfTerminal(Life& life, const Message& message, std::optional<CauseGiven> cause) {
    if (!life.turnedAwayBy)
        life.turnedAwayBy = message.from();
    if (!cause || message.from() == life.call.origin)
        return;
    if (!life.call.causeBefore)
        life.call.causeBefore = cause;
    if (!life.refusal || weightOf(*cause) > weightOf(*life.refusal))
        life.refusal = std::move(cause);
}

void learnClearing(Life& life, const Message& message) {
    Call& call = life.call;
    const std::uint8_t messageType = message.layer3.type;
    std::optional<CauseGiven> cause = causeOf(message);
    if (!isClearing(messageType)) {
        if (cause && messageType == type::progress && !call.causeBefore)
            call.causeBefore = std::move(cause);
        return;
    }
    if (concernsOneTerminal(life, message, cause))
        return learnOfTerminal(life, message, std::move(cause));
    if (!call.clearingSeen) {
        call.clearingSeen = true;
        call.cause = std::move(cause);
        call.clearedBy = message.from() == Side::us ? ClearedBy::us : ClearedBy::peer;
        life.clearedFirst = message.from();
        life.clearingNumbered = message.layer2.hasNs();
        life.clearingNs = message.layer2.ns;
        life.clearingChannel = nameOfDChannel(message);
        life.clearingNumbering = message.numbering;
        if (life.connectAt)
            call.duration = message.at - *life.connectAt;
        return;
    }
    if (cause && call.laterCauses.size() < 16)
        call.laterCauses.push_back(std::move(*cause));
    if (life.crossingDecided || message.from() == life.clearedFirst)
        return;
    life.crossingDecided = true;
    if (messageType != type::releaseComplete && crossesClearing(life, message))
        call.clearedBy = ClearedBy::both;
}

void learnPhase(Life& life, const Message& message) {
    Call& call = life.call;
    switch (message.layer3.type) {
        case type::callProceeding:
        case type::alerting:
        case type::connect:
            life.proceeding = life.proceeding || message.from() != call.origin;
            break;
        default:
            break;
    }
    if (call.clearingSeen) {
        call.phase = Phase::clearing;
        return;
    }
    switch (message.layer3.type) {
        case type::connect:
            if (!life.connectAt)
                life.connectAt = message.at;
            [[fallthrough]];
        case type::connectAcknowledge:
        case type::retrieveAcknowledge:
        case type::resumeAcknowledge:
            call.phase = Phase::talking;
            life.answeredByUser = true;
            break;
        case type::holdAcknowledge:
            call.phase = Phase::held;
            break;
        default:
            break;
    }
}

// Who cleared a call without a message that clears it as a whole. A call to all ends so if each of its
// terminals has refused it, or was released by the network.
ClearedBy clearedByTerminals(const Life& life, EndedBy by) {
    if (by != EndedBy::release || !life.turnedAwayBy)
        return ClearedBy::nobody;
    return *life.turnedAwayBy == Side::us ? ClearedBy::us : ClearedBy::peer;
}

bool isWithoutChannel(const Call& call) {
    const auto& channel = call.channel();
    return channel && (channel->dChannel || channel->selection == isdn::ChannelId::Selection::none) &&
           channel->channels.none();
}

}  // namespace

void learn(Life& life, const Message& message) {
    Call& call = life.call;
    ++call.messages;
    if (call.frames.size() < Call::mostFrames)
        call.frames.push_back(message.number);
    if (life.ended) {
        learnClearing(life, message);
        return;
    }
    call.end = momentOf(message);
    call.lack = Lack::nothing;
    const isdn::Elements& elements = message.layer3.elements;
    learnNumber(call.calling, elements.find(element::callingNumber));
    learnNumber(call.connected, elements.find(element::connectedNumber));
    learnNumber(call.redirecting, elements.find(element::redirectingNumber));
    learnNumber(call.redirecting, elements.find(element::originalCalledNumber));
    learnDigits(life, message);
    learnBearer(call, message);
    learnChannel(life, message);
    learnTimes(life, message);
    learnClearing(life, message);
    learnPhase(life, message);
}

void conclude(Life& life, EndedBy by, const Moment& end) {
    Call& call = life.call;
    life.ended = true;
    call.phase = Phase::ended;
    call.endedBy = by;
    call.end = end;
    if (call.kind == Kind::call && isWithoutChannel(call) && life.answeredByUser)
        call.kind = Kind::signalling;
    if (!call.clearingSeen && by != EndedBy::open)
        call.clearedBy = clearedByTerminals(life, by);
    if (life.connectAt && !call.duration && by != EndedBy::open)
        call.duration = end.at - *life.connectAt;
    const bool byOrigin = life.clearedFirst == call.origin && call.clearedBy != ClearedBy::both;
    if (life.answeredByUser)
        call.outcome = Outcome::answered;
    else if (by == EndedBy::open)
        call.outcome = Outcome::open;
    else if (call.broadcast && !call.firstResponse)
        call.outcome = Outcome::noAnswer;
    else
        call.outcome = call.cause ? outcomeOf(*call.cause) : Outcome::other;
    // A caller that gives a reason, for example that a timer ran out, has not simply hung up.
    if (call.outcome == Outcome::other && byOrigin && call.clearingSeen && !call.beforeTrace)
        call.outcome = Outcome::abandoned;
}

}  // namespace calls
