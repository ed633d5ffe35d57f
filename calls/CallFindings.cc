#include "calls/CallFindings.h"

#include <algorithm>
#include <array>
#include <utility>

#include "calls/ElementRules.h"
#include "calls/findingOf.h"
#include "isdn/words.h"

namespace calls {

namespace {

namespace element = isdn::element;
namespace type = isdn::message;

constexpr std::uint8_t statusEnquiryAnswer = 30, invalidReference = 81;

std::string wordsOf(const isdn::Element& found, const Message& message) {
    std::string words;
    isdn::appendWords(words, found, message.variant, message.sender());
    return words;
}

std::string nameOf(const Message& message) {
    const std::string_view name = isdn::messageName(message.layer3);
    return name.empty() ? "message " + std::to_string(message.layer3.type) : std::string(name);
}

// The causes by which one side says that it did not understand a message (Q.850 2.2.7), and their findings.
const FindingKind* protocolFinding(std::uint8_t cause) {
    switch (cause) {
        case invalidReference:
            return &findings::unknownReference;
        case 97:
        case 99:
            return &findings::elementIgnored;
        case 96:
        case 98:
        case 100:
        case 101:
        case 111:
            return &findings::protocolError;
        default:
            return nullptr;
    }
}

}  // namespace

void CallFindings::heard(Call& call, const Message& message) {
    if (call.phase == Phase::ended) {
        checkElements(&call, message, false);
        return;
    }
    Notes& notes = notes_[call.number];
    // A transaction (REGISTER) may end without a cause (Q.932 6.3.2.3).
    // What came before the trace, or is missing in it, may have cleared the call already.
    const bool isFirst = !notes.cleared && !call.incomplete && !(call.beforeTrace && call.messages == 1);
    const bool clearsFirst = isClearing(message.layer3.type) && isFirst && call.kind != Kind::signalling;
    checkElements(&call, message, clearsFirst);
    checkDigits(call, notes, message);
    checkCause(&call, message);
    checkStatus(call, notes, message);
    demandChannel(call, notes, message);
    checkChannel(call, notes, message);
    notes.cleared = notes.cleared || isClearing(message.layer3.type);
}

void CallFindings::heardWithoutCall(const Message& message) {
    if (message.layer3.discriminator == isdn::callControl ||
        isdn::isMaintenance(message.layer3.discriminator))
        checkElements(nullptr, message, false);
    if (message.layer3.discriminator == isdn::callControl && message.layer3.type == type::status)
        checkCause(nullptr, message);
}

void CallFindings::checkElements(const Call* call, const Message& message, bool clearsFirst) {
    for (BrokenRule& broken : brokenElementRules(message, clearsFirst)) {
        if (broken.ifFirst)
            reportUnlessLost(*broken.kind, *call, message, std::move(broken.sentence));
        else
            report(*broken.kind, call, message, std::move(broken.sentence));
    }
}

// STATUS of the global or the dummy reference is about RESTART or another message without a call; there is no
// reference then that could be unknown.
void CallFindings::checkCause(const Call* call, const Message& message) {
    const isdn::Element found = message.layer3.elements.find(element::cause);
    const auto cause = isdn::cause(found);
    if (!cause || cause->codingStandard != 0)
        return;
    const FindingKind* kind = protocolFinding(cause->value);
    if (call == nullptr && kind == &findings::unknownReference)
        kind = &findings::protocolError;
    if (kind != nullptr)
        report(*kind, call, message, nameOf(message) + " says " + wordsOf(found, message));
}

void CallFindings::checkStatus(const Call& call, Notes& notes, const Message& message) {
    if (message.layer3.type == type::statusEnquiry) {
        notes.enquired[static_cast<std::size_t>(message.from())] = true;
        return;
    }
    if (message.layer3.type != type::status)
        return;
    const bool asked = std::exchange(notes.enquired[static_cast<std::size_t>(other(message.from()))], false);
    if (call.beforeTrace && call.messages == 1)
        return;  // what was sent before the trace is not known
    const isdn::Element state = message.layer3.elements.find(element::callState);
    const auto value = isdn::callState(state);
    if (value && value->codingStandard == 0 && value->value == 0 && !notes.cleared) {
        std::string sentence = "STATUS names state 0 for a call that is alive";
        if (call.incomplete)
            report(findings::cannotBeTold, &call, message,
                   sentence + " as far as the trace shows: frames are missing");
        else
            report(findings::statusIncompatible, &call, message, std::move(sentence));
        return;
    }
    const auto cause = isdn::cause(message.layer3.elements.find(element::cause));
    if (!asked && cause && cause->codingStandard == 0 && cause->value == statusEnquiryAnswer)
        reportUnlessLost(findings::statusUnasked, call, message,
                         "STATUS answers an enquiry that is not in the trace");
}

void CallFindings::checkDigits(const Call& call, Notes& notes, const Message& message) {
    const std::uint8_t messageType = message.layer3.type;
    if (message.from() == call.origin) {
        if (messageType == type::setup || messageType == type::information)
            notes.lastDigit = message.at;
        if (!message.layer3.elements.find(element::sendingComplete).octets.empty())
            notes.sendingComplete = true;
        return;
    }
    if (messageType == type::setupAcknowledge) {
        notes.acknowledged = true;
        notes.lastDigit = message.at;
        return;
    }
    const std::int64_t waited = message.at - notes.lastDigit;
    constexpr std::int64_t shortestT302 = 10 * second;
    const bool inTime = waited >= shortestT302 && waited <= timers_.t302 + timers_.slack;
    const bool goesOn = messageType == type::callProceeding || messageType == type::alerting ||
                        messageType == type::progress || messageType == type::connect;
    if (goesOn && inTime && !notes.sendingComplete && !call.beforeTrace && !notes.cleared &&
        (notes.acknowledged || call.firstResponse == message.at - call.begin.at))
        reportUnlessLost(
            findings::waitsForDigits, call, message,
            nameOf(message) + " came " + std::to_string(waited / second) + " s after the last digit");
    if (goesOn)
        notes.acknowledged = false;
}

// The network names the channel in its first answer, unless the user has demanded one (Q.931 5.1.2, tables
// 3-2 to 3-16). A SETUP that names none may be that of a connection without a B channel.
void CallFindings::demandChannel(const Call& call, Notes& notes, const Message& message) {
    constexpr std::array answers{type::setupAcknowledge, type::callProceeding, type::alerting, type::connect};
    const bool isAnswer = message.from() != call.origin && message.sender() == isdn::Sender::network &&
                          std::find(answers.begin(), answers.end(), message.layer3.type) != answers.end();
    if (!isAnswer || std::exchange(notes.channelDemanded, true))
        return;
    using Selection = isdn::ChannelId::Selection;
    const bool leavesChoice = call.asked && !call.asked->exclusive && !call.asked->dChannel &&
                              call.asked->selection != Selection::none;
    if (leavesChoice && !call.granted && call.kind == Kind::call)
        reportUnlessLost(findings::elementAbsent, call, message,
                         nameOf(message) + " answers SETUP first and has no CHANNEL IDENTIFICATION");
}

// Only a SETUP that says "no other channel" is contradicted by another one.
void CallFindings::checkChannel(const Call& call, Notes& notes, const Message& message) {
    if (notes.channelChecked || !call.granted)
        return;
    notes.channelChecked = true;
    if (!call.asked || !call.asked->exclusive || call.asked->channels.none() || call.granted->channels.none())
        return;
    if (call.asked->interface && call.granted->interface &&
        call.asked->interface != call.granted->interface) {
        report(findings::interfaceMismatch, &call, message,
               nameOf(message) + " names another interface than SETUP");
        return;
    }
    if (call.asked->channels == call.granted->channels)
        return;
    report(findings::channelChanged, &call, message,
           nameOf(message) + " answers with " +
               wordsOf(message.layer3.elements.find(element::channelIdentification), message) +
               " where SETUP demanded its own");
}

void CallFindings::ended(Call& call, const Message* by) {
    if (call.broadcast && !call.firstResponse && call.endedBy == EndedBy::release && by == nullptr) {
        sink_.report(findingOf(findings::broadcastUnanswered, call.begin, call, "no terminal answered"));
    }
}

void CallFindings::replaced(Call& old, Call& by, const Message& message) {
    std::string sentence = nameOf(message) + " takes the reference of call " + std::to_string(old.number) +
                           ", which had not ended";
    if (old.lack == Lack::board)
        return;  // board-restarted has been reported
    if (old.lack == Lack::frames)
        report(findings::cannotBeTold, &by, message,
               sentence + " as far as the trace shows: frames are missing");
    else
        report(findings::referenceInUse, &by, message, std::move(sentence));
}

void CallFindings::stray(const Message& message) {
    checkElements(nullptr, message, false);
    report(findings::unknownReference, nullptr, message,
           nameOf(message) + " for a reference whose call ended long before");
}

void CallFindings::report(const FindingKind& kind, const Call* call, const Message& message,
                          std::string sentence) {
    sink_.report(findingOf(kind, message, call, std::move(sentence)));
}

void CallFindings::reportUnlessLost(const FindingKind& kind, const Call& call, const Message& message,
                                    std::string sentence) {
    if (!call.incomplete)
        held_.report(findingOf(kind, message, &call, std::move(sentence)), message);
}

}  // namespace calls
