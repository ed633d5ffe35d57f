#include "calls/Waits.h"

#include <algorithm>
#include <bitset>

#include "calls/findingOf.h"

namespace calls {

namespace {

namespace element = isdn::element;
namespace type = isdn::message;

using Types = std::bitset<128>;
Types typesOf(std::initializer_list<std::uint8_t> list) {
    Types types;
    for (const std::uint8_t each : list)
        types.set(each);
    return types;
}

constexpr std::uint8_t endToEndNot = 1, destinationNotIsdn = 2, inBandInformation = 8;

bool announces(const Message& message, std::initializer_list<std::uint8_t> descriptions) {
    const auto progress = isdn::progress(message.layer3.elements.find(element::progressIndicator));
    return progress &&
           std::find(descriptions.begin(), descriptions.end(), progress->value) != descriptions.end();
}

std::string seconds(std::int64_t nanoseconds) {
    const std::int64_t tenths = (nanoseconds + 50 * millisecond) / (100 * millisecond);
    std::string text = std::to_string(tenths / 10);
    if (tenths % 10 != 0)
        text += "." + std::to_string(tenths % 10);
    return text + " s";
}

}  // namespace

// A row for each question. The finding comes one timer after the last repetition.
struct Waits::Rule {
    std::uint8_t ask;
    capture::Role asker;            // the role of the side that asks; unknown: either side
    Types answers;                  // the messages that answer, from the other side
    bool clearingAnswers;           // a clearing message of either side ends the wait
    bool sameSideAnswers;           // the side that sent `ask` must send the answer itself
    std::string_view timer;         // the timer's name, for the sentence of the finding
    std::int64_t Timers::*user;     // the timer's value if the user waits
    std::int64_t Timers::*network;  // the timer's value if the network waits
    bool isRepeated;                // the sender repeats it once
    const FindingKind* finding;
    const FindingKind* repetition;
};

const std::vector<Waits::Rule>& Waits::rules() {
    using T = Timers;
    const Types clearing = typesOf({type::disconnect, type::release, type::releaseComplete});
    static const std::vector<Rule> rows{
        {type::setup, capture::Role::unknown,
         typesOf(
             {type::callProceeding, type::setupAcknowledge, type::alerting, type::progress, type::connect}) |
             clearing,
         true, false, "T303", &T::t303, &T::t303, true, &findings::setupUnanswered, &findings::setupRepeated},
        {type::callProceeding, capture::Role::unknown, typesOf({type::alerting, type::connect}), true, true,
         "T310", &T::t310User, &T::t310Network, false, &findings::proceedingUnanswered, nullptr},
        {type::connect, capture::Role::user, typesOf({type::connectAcknowledge}), true, false, "T313",
         &T::t313, &T::t313, false, &findings::connectNotAcknowledged, nullptr},
        // The standard leaves this answer to the user. It counts as missing only if this user has given it
        // before.
        {type::connect, capture::Role::network, typesOf({type::connectAcknowledge}), true, false, "T313",
         &T::t313, &T::t313, false, &findings::connectNeverAcknowledged, nullptr},
        {type::disconnect, capture::Role::unknown, clearing, false, false, "T305", &T::t305, &T::t305, false,
         &findings::disconnectUnanswered, nullptr},
        {type::release, capture::Role::unknown, typesOf({type::release, type::releaseComplete}), false, false,
         "T308", &T::t308, &T::t308, true, &findings::releaseUnanswered, &findings::releaseRepeated},
        {type::statusEnquiry, capture::Role::unknown, typesOf({type::status}), true, false, "T322", &T::t322,
         &T::t322, true, &findings::statusEnquiryUnanswered, nullptr},
    };
    return rows;
}

void Waits::heard(Call& call, const Message& message) {
    seen_ |= message.from() == Side::us ? 1U : 2U;
    if (call.phase == Phase::ended)
        return;
    if (message.layer3.type == type::connectAcknowledge && message.senderRole() == capture::Role::user)
        acknowledging_.insert(message.layer2.tei);
    const bool answersDisconnect = answer(call, message);
    // DISCONNECTs that cross answer each other, and either side may go on with RELEASE (Q.931 5.3.5).
    if (!answersDisconnect || message.layer3.type != type::disconnect)
        ask(call, message);
}

std::vector<std::uint64_t> Waits::waitsOf(const Call& call) const {
    const auto found = ofCall_.find(call.number);
    return found == ofCall_.end() ? std::vector<std::uint64_t>() : found->second;
}

bool Waits::answer(Call& call, const Message& message) {
    const std::uint8_t messageType = message.layer3.type;
    const bool clears = isClearing(messageType);
    const std::vector<std::uint64_t> pending = waitsOf(call);
    bool answersDisconnect = false;
    for (const std::uint64_t id : pending) {
        const Wait& wait = waits_.at(id);
        const Rule& rule = *wait.rule;
        // Each terminal of a broadcast call answers for itself, but any of them may go on with the call.
        if (wait.tei != message.layer2.tei && !rule.sameSideAnswers)
            continue;
        const Side answering = rule.sameSideAnswers ? wait.asker : other(wait.asker);
        const bool answered = (message.from() == answering && rule.answers.test(messageType & 127U)) ||
                              (rule.ask == type::callProceeding && messageType == type::progress &&
                               announces(message, {endToEndNot, destinationNotIsdn, inBandInformation})) ||
                              (clears && rule.clearingAnswers);
        if (answered) {
            answersDisconnect = answersDisconnect || rule.ask == type::disconnect;
            drop(id);
        } else if (rule.ask == type::disconnect && messageType == type::release &&
                   message.from() == wait.asker) {
            // The asking side goes on by itself. It may do so at any time. If it does so when its timer has
            // run out, nobody has answered.
            if (message.at >= wait.deadline - timers_.slack)
                expire(wait, message.at);
            drop(id);
        }
    }
    return answersDisconnect;
}

void Waits::ask(Call& call, const Message& message) {
    const auto rule = std::find_if(rules().begin(), rules().end(), [&](const Rule& each) {
        return each.ask == message.layer3.type &&
               (each.asker == capture::Role::unknown || each.asker == message.senderRole());
    });
    // Nobody knows which terminals exist, so a broadcast SETUP need not be answered.
    if (rule == rules().end() || (call.broadcast && rule->ask == type::setup))
        return;
    for (const std::uint64_t id : waitsOf(call)) {
        Wait& wait = waits_.at(id);
        if (wait.rule == &*rule && wait.asker == message.from() && wait.tei == message.layer2.tei) {
            repeat(wait, message);
            return;
        }
    }
    Wait wait;
    wait.rule = &*rule;
    wait.call = &call;
    wait.asker = message.from();
    wait.tei = message.layer2.tei;
    wait.first = wait.last = momentOf(message);
    wait.timer = timerOf(*rule, message);
    wait.deadline = message.at + wait.timer.value * (rule->isRepeated ? 2 : 1) + timers_.slack;
    const std::uint64_t id = ++lastId_;
    ofCall_[call.number].push_back(id);
    deadlines_.emplace(wait.deadline, id);
    waits_.emplace(id, wait);
}

// The timer of the side that waits. Some timers differ between the user and the network side.
Waits::Timer Waits::timerOf(const Rule& rule, const Message& message) const {
    if (rule.ask == type::disconnect && announces(message, {inBandInformation}))
        return {"T306", timers_.t306};
    const capture::Role sender = message.senderRole();
    const bool networkWaits =
        rule.sameSideAnswers ? sender == capture::Role::user : sender == capture::Role::network;
    return {rule.timer, networkWaits ? timers_.*rule.network : timers_.*rule.user};
}

void Waits::repeat(Wait& wait, const Message& message) {
    ++wait.repetitions;
    if (wait.repetitions == 1 && wait.rule->repetition != nullptr) {
        wait.last = momentOf(message);
        report(*wait.rule->repetition, wait,
               std::string(isdn::messageName(message.layer3)) + " repeated after " +
                   seconds(message.at - wait.first.at));
    }
    wait.last = momentOf(message);
    const auto old = std::find_if(deadlines_.begin(), deadlines_.end(),
                                  [&](const auto& each) { return &waits_.at(each.second) == &wait; });
    const std::uint64_t id = old->second;
    deadlines_.erase(old);
    wait.deadline = message.at + wait.timer.value + timers_.slack;
    deadlines_.emplace(wait.deadline, id);
}

void Waits::ended(Call& call, const Message*) { dropAll(call); }

void Waits::boardRestarted() {
    waits_.clear();
    ofCall_.clear();
    deadlines_.clear();
}

void Waits::advance(std::int64_t at) {
    while (!deadlines_.empty() && deadlines_.begin()->first <= at) {
        const std::uint64_t id = deadlines_.begin()->second;
        const Wait& wait = waits_.at(id);
        expire(wait, wait.deadline - timers_.slack);
        drop(id);
    }
}

void Waits::expire(const Wait& wait, std::int64_t until) {
    if (seen_ != 3U)
        return;
    if (wait.rule->finding == &findings::connectNeverAcknowledged && !acknowledging_.contains(wait.tei))
        return;
    const Rule& rule = *wait.rule;
    const std::string name(isdn::messageName(isdn::callControl, rule.ask));
    std::string what = name + " of frame " + std::to_string(wait.first.frame) + " got no answer for " +
                       seconds(until - wait.first.at) + " (" + std::string(wait.timer.name);
    what += wait.repetitions == 0 ? ")" : ", repeated " + std::to_string(wait.repetitions) + "x)";
    const Side answering = rule.sameSideAnswers ? wait.asker : other(wait.asker);
    const std::string_view doubt =
        doubtAbout(links_.witness(wait.tei), wait.first.frame, wait.first.at, wait.asker, answering);
    if (!doubt.empty())
        report(findings::cannotBeTold, wait, what + ", but " + std::string(doubt));
    else
        report(*rule.finding, wait, std::move(what));
}

void Waits::report(const FindingKind& kind, const Wait& wait, std::string sentence) {
    sink_.report(findingOf(kind, wait.last, *wait.call, std::move(sentence)));
}

void Waits::drop(std::uint64_t id) {
    const auto wait = waits_.find(id);
    const Call& call = *wait->second.call;
    deadlines_.erase({wait->second.deadline, id});
    std::vector<std::uint64_t>& siblings = ofCall_[call.number];
    std::erase(siblings, id);
    if (siblings.empty())
        ofCall_.erase(call.number);
    waits_.erase(wait);
}

void Waits::dropAll(const Call& call) {
    for (const std::uint64_t id : waitsOf(call))
        drop(id);
}

}  // namespace calls
