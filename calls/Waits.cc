#include "calls/Waits.h"

#include <algorithm>

#include "calls/WaitRules.h"
#include "calls/findingOf.h"
#include "isdn/words.h"

namespace calls {

namespace {

namespace element = isdn::element;
namespace type = isdn::message;

constexpr std::uint8_t endToEndNot = 1, destinationNotIsdn = 2, inBandInformation = 8;
constexpr std::uint8_t numberIncomplete = 28, timerExpired = 102;

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

bool says(const Message& message, std::uint8_t value) {
    const auto cause = isdn::cause(message.layer3.elements.find(element::cause));
    return cause && cause->codingStandard == 0 && cause->value == value;
}

// Cause 102 may name the timer in its diagnostic, in digits: "313".
bool saysThatItRanOut(const Message& message, std::string_view timer) {
    if (!says(message, timerExpired))
        return false;
    const auto cause = isdn::cause(message.layer3.elements.find(element::cause));
    const std::string_view digits = timer.substr(1);
    return cause->diagnostics.empty() ||
           std::equal(cause->diagnostics.begin(), cause->diagnostics.end(), digits.begin(), digits.end(),
                      [](std::uint8_t octet, char digit) {
                          return (octet & 0x7FU) == static_cast<std::uint8_t>(digit);
                      });
}

bool isFault(Verdicts::Verdict verdict) {
    return verdict == Verdicts::Verdict::fault || verdict == Verdicts::Verdict::held;
}

}  // namespace

Side Waits::Wait::answering() const { return rule->sameSideAnswers ? asker : other(asker); }

void Waits::heard(Call& call, const Message& message) {
    if (call.phase == Phase::ended)
        return;
    if (message.layer3.type == type::connectAcknowledge && message.senderRole() == capture::Role::user)
        acknowledging_.insert(message.layer2.tei);
    bool timerTold = false;
    const bool answersDisconnect = answer(call, message, timerTold);
    if (!timerTold && says(message, timerExpired)) {
        std::string words;
        isdn::appendWords(words, message.layer3.elements.find(element::cause), message.variant,
                          message.sender());
        sink_.report(findingOf(findings::timer102, message, &call,
                               std::string(isdn::messageName(message.layer3)) + " says " + words));
    }
    // DISCONNECTs that cross answer each other, and either side may go on with RELEASE (Q.931 5.3.5).
    if (!answersDisconnect || message.layer3.type != type::disconnect)
        ask(call, message);
}

std::vector<std::uint64_t> Waits::waitsOf(const Call& call) const {
    const auto found = ofCall_.find(call.number);
    return found == ofCall_.end() ? std::vector<std::uint64_t>() : found->second;
}

Waits::Effect Waits::effectOf(const Wait& wait, const Message& message) const {
    const Rule& rule = *wait.rule;
    const std::uint8_t messageType = message.layer3.type & 127U;
    const bool byWaiting = message.from() == wait.waiting();
    // Each terminal of a broadcast call answers for itself, but any of them may go on with the call.
    if (wait.tei != message.layer2.tei && !rule.sameSideAnswers)
        return Effect::none;
    if (!byWaiting && rule.answers.test(messageType))
        return Effect::answers;
    if (messageType == type::progress && rule.progressStops &&
        announces(message, {endToEndNot, destinationNotIsdn, inBandInformation}))
        return Effect::stops;
    if (byWaiting && messageType == type::information && rule.digitsRestart)
        return Effect::restarts;
    if (!isClearing(messageType))
        return Effect::none;
    // The sender of DISCONNECT goes on to RELEASE, which it may do at any time without an answer.
    const bool goesOn = rule.ask == type::disconnect && messageType == type::release;
    if (!rule.clearingAnswers && !goesOn)
        return Effect::none;
    const bool outOfTime = message.at >= wait.deadline - 2 * timers_.slack;
    if (byWaiting && rule.waitingSideGivesUp &&
        (outOfTime || saysThatItRanOut(message, wait.timer.name) ||
         (rule.digitsRestart && says(message, numberIncomplete))))
        return Effect::timerRanOut;
    constexpr std::int64_t shortestT302 = 10 * second;
    const bool incomplete = says(message, numberIncomplete) || says(message, timerExpired);
    if (!byWaiting && rule.digitsRestart && incomplete && message.at - wait.last.at >= shortestT302)
        return Effect::noMoreDigits;
    return byWaiting && goesOn ? Effect::endsIt : rule.clearingAnswers ? Effect::endsIt : Effect::none;
}

bool Waits::answer(Call& call, const Message& message, bool& timerTold) {
    bool answersDisconnect = false;
    for (const std::uint64_t id : waitsOf(call)) {
        Wait& wait = waits_.at(id);
        switch (effectOf(wait, message)) {
            case Effect::none:
                continue;
            case Effect::restarts:
                wait.last = momentOf(message);
                setDeadline(id, wait, message.at + wait.timer.value + timers_.slack);
                continue;
            case Effect::stops:
                setDeadline(id, wait, never);
                continue;
            case Effect::answers:
                answersDisconnect = answersDisconnect || wait.rule->ask == type::disconnect;
                break;
            case Effect::endsIt:
                break;
            case Effect::timerRanOut:
                if (wait.deadline != never)
                    timerTold = isFault(expire(wait, message.at)) || timerTold;
                break;
            case Effect::noMoreDigits:
                timerTold = true;
                sink_.report(findingOf(findings::overlapTimeout, message, &call,
                                       "no further digit came for " + seconds(message.at - wait.last.at) +
                                           " after \"" + call.called.digits + "\""));
                break;
        }
        drop(id);
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
            repeat(id, wait, message);
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
        return {"T306", timers_.t306, "Q.931 5.3.4.1, T306"};
    const capture::Role sender = message.senderRole();
    const bool networkWaits =
        rule.sameSideAnswers ? sender == capture::Role::user : sender == capture::Role::network;
    return {rule.timer, networkWaits ? timers_.*rule.network : timers_.*rule.user};
}

void Waits::setDeadline(std::uint64_t id, Wait& wait, std::int64_t deadline) {
    deadlines_.erase({wait.deadline, id});
    wait.deadline = deadline;
    if (deadline != never)
        deadlines_.emplace(deadline, id);
}

void Waits::repeat(std::uint64_t id, Wait& wait, const Message& message) {
    ++wait.repetitions;
    wait.last = momentOf(message);
    if (wait.repetitions == 1 && wait.rule->repetition != nullptr)
        sink_.report(findingOf(*wait.rule->repetition, wait.last, *wait.call,
                               std::string(isdn::messageName(message.layer3)) + " repeated after " +
                                   seconds(message.at - wait.first.at)));
    setDeadline(id, wait, message.at + wait.timer.value + timers_.slack);
}

void Waits::ended(Call& call, const Message*) { dropAll(call); }

void Waits::boardRestarted() {
    waits_.clear();
    ofCall_.clear();
    deadlines_.clear();
    verdicts_.forget();
}

void Waits::advance(std::int64_t at) {
    while (!deadlines_.empty() && deadlines_.begin()->first <= at) {
        const std::uint64_t id = deadlines_.begin()->second;
        const Wait& wait = waits_.at(id);
        expire(wait, wait.deadline - timers_.slack);
        drop(id);
    }
    verdicts_.advance(at, waits_.empty() ? never : waits_.begin()->second.first.at);
}

Verdicts::Verdict Waits::expire(const Wait& wait, std::int64_t until) {
    const Rule& rule = *wait.rule;
    if (rule.finding == &findings::connectNeverAcknowledged && !acknowledging_.contains(wait.tei))
        return Verdicts::Verdict::nothing;
    const std::string name(isdn::messageName(isdn::callControl, rule.ask));
    const bool sinceLastDigit = rule.digitsRestart && wait.last.at != wait.first.at;
    std::string what = name + " of frame " + std::to_string(wait.first.frame) +
                       (rule.sameSideAnswers ? " was followed by nothing for " : " got no answer for ") +
                       seconds(until - (sinceLastDigit ? wait.last : wait.first).at) +
                       (sinceLastDigit ? " after the last digit" : "") + " (" + std::string(wait.timer.name);
    what += wait.repetitions == 0 ? ")" : ", repeated " + std::to_string(wait.repetitions) + "x)";
    Finding finding = findingOf(*rule.finding, wait.last, *wait.call, std::move(what));
    if (!wait.timer.clause.empty())
        finding.clause = wait.timer.clause;
    return verdicts_.judge(
        {std::move(finding), wait.tei, wait.asker, wait.answering(), wait.first.frame, wait.first.at, until});
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
