#include "calls/Patterns.h"

#include <algorithm>
#include <array>
#include <cstdlib>

#include "calls/FindingKinds.h"
#include "calls/Maintenance.h"
#include "calls/findingOf.h"

namespace calls {

namespace {

constexpr std::size_t callsThatEndTogether = 3;
constexpr std::size_t callsOfOneLength = 5;
// With more calls than these, five would have the same length by chance.
constexpr std::size_t durationsCompared = 30;
constexpr std::int64_t shortestLength = 10 * second;
constexpr std::int64_t lengthTolerance = second / 2;
constexpr std::size_t callsOfABurst = 5;
constexpr std::int64_t burstWindow = 60 * second;
constexpr std::int64_t burstSilence = 600 * second;
constexpr std::size_t prefixDigits = 4;
constexpr std::size_t mostFailures = 256;
// Faults by which a link goes down; those that were reported this long before it did belong to it.
constexpr std::array linkFaults{&findings::linkFlap,       &findings::sabmeUnanswered,
                                &findings::linkRefused,    &findings::frameRejected,
                                &findings::pollUnanswered, &findings::oneDirectionSilent};
constexpr std::int64_t faultBefore = 60 * second;
constexpr std::size_t mostFaults = 8;

// Ordinary causes. Calls that end with one of them are not compared.
bool isOrdinary(std::uint8_t cause) {
    constexpr std::array<std::uint8_t, 7> ordinary{16, 17, 18, 19, 21, 26, 31};
    return std::find(ordinary.begin(), ordinary.end(), cause) != ordinary.end();
}

// "national/ISDN"; empty without a number.
std::string kindOf(const Number& number) {
    if (number.digits.empty())
        return {};
    const auto named = [](std::string_view name, std::uint8_t value) {
        return name.empty() ? std::to_string(value) : std::string(name);
    };
    return named(isdn::numberTypeName(number.type), number.type) + "/" +
           named(isdn::numberingPlanName(number.plan), number.plan);
}

}  // namespace

void Patterns::ended(Call& call, const Message*) {
    if (call.endedBy == EndedBy::open)
        return;
    if (endsWithLink(call)) {
        if (lost_.empty())
            lostAt_ = call.end.at;
        lost_.push_back(call.number);
    }
    findSameDuration(call);
    findCauseBurst(call);
}

void Patterns::linkChanged(const Moment& moment, const std::string& dChannel, bool isUp) {
    reportMassClear();
    link_ = LinkChange{moment, dChannel, isUp};
}

void Patterns::linkFault(const Finding& fault, std::int64_t at) {
    if (std::find(linkFaults.begin(), linkFaults.end(), fault.kind) == linkFaults.end())
        return;
    faults_.push_back({at, fault.dChannel, fault.severity,
                       std::string(fault.kind->id) + " of frame " + std::to_string(fault.frame)});
    if (faults_.size() > mostFaults)
        faults_.pop_front();
}

// Whether the call ended because of its link: the link was down for too long, or one side cleared it when the
// link went down or came up, and with a cause that is not ordinary.
bool Patterns::endsWithLink(const Call& call) const {
    if (!link_)
        return false;
    if (call.endedBy == EndedBy::link)
        return true;
    const bool soon = call.end.at - link_->moment.at <= second;
    const bool ordinary = call.endedBy == EndedBy::release && call.cause && isOrdinary(call.cause->value);
    return soon && !ordinary && call.endedBy != EndedBy::suspended && call.endedBy != EndedBy::replaced;
}

// The findings that were reported of the link when it went down, or since then.
std::vector<const Patterns::LinkFault*> Patterns::faultsOfLink() const {
    std::vector<const LinkFault*> faults;
    for (const LinkFault& fault : faults_) {
        if (fault.dChannel == link_->dChannel && fault.at >= link_->moment.at - faultBefore)
            faults.push_back(&fault);
    }
    return faults;
}

// If an error of the link has been reported, the calls that went with it are its consequence, and a note.
void Patterns::reportMassClear() {
    if (lost_.size() >= callsThatEndTogether) {
        std::vector<std::string> names;
        for (const std::uint64_t call : lost_)
            names.push_back(std::to_string(call));
        std::string sentence = std::to_string(lost_.size()) + " calls ended with the link, which " +
                               (link_->isUp ? "was set up" : "went down") + " here: " + listOf(names);
        bool isConsequence = false;
        std::vector<std::string> words;
        for (const LinkFault* const fault : faultsOfLink()) {
            words.push_back(fault->words);
            isConsequence = isConsequence || fault->severity == Severity::error;
        }
        if (!words.empty())
            sentence += "; they follow from " + listOf(words);
        Finding finding = findingOf(findings::massClear, link_->moment, link_->dChannel, std::move(sentence));
        if (isConsequence)
            finding.severity = Severity::note;
        stuck_.lostWithLink(std::move(finding), lost_);
    }
    lost_.clear();
}

void Patterns::advance(std::int64_t at) {
    if (!lost_.empty() && at - lostAt_ > second)
        reportMassClear();
}

void Patterns::finish() { reportMassClear(); }

void Patterns::findSameDuration(const Call& call) {
    if (!call.duration || *call.duration < shortestLength || call.endedBy != EndedBy::release)
        return;
    durations_.push_back(*call.duration);
    if (durations_.size() > durationsCompared)
        durations_.pop_front();
    const auto isAlike = [&](std::int64_t other) {
        return std::abs(other - *call.duration) <= lengthTolerance;
    };
    if (static_cast<std::size_t>(std::count_if(durations_.begin(), durations_.end(), isAlike)) <
            callsOfOneLength ||
        std::any_of(lengthsSaid_.begin(), lengthsSaid_.end(), isAlike))
        return;
    lengthsSaid_.push_back(*call.duration);
    if (lengthsSaid_.size() > durationsCompared)
        lengthsSaid_.pop_front();
    sink_.report(findingOf(findings::sameDuration, call.end, call,
                           std::to_string(callsOfOneLength) + " of the last calls ended after " +
                               std::to_string((*call.duration + second / 2) / second) + " s"));
}

// The property of the last call that its cause is about: bearer, channel or number.
std::string Patterns::detailsOf(const Failure& failure) {
    switch (failure.cause) {
        case 57:
        case 58:
        case 65:
        case 88:
            return failure.bearer.empty() ? std::string() : "; bearer " + failure.bearer;
        case 1:
        case 28:
            return failure.numberKind.empty() ? std::string() : "; number " + failure.numberKind;
        default:
            return {};
    }
}

void Patterns::findCauseBurst(const Call& call) {
    if (!call.cause || call.cause->codingStandard != 0 || isOrdinary(call.cause->value) || !hasFailed(call))
        return;
    while (!failures_.empty() &&
           (call.end.at - failures_.front().at > burstWindow || failures_.size() >= mostFailures))
        failures_.pop_front();
    const std::vector<ChannelKey> channels = channelsOf(call.channel());
    failures_.push_back({call.end.at, call.cause->value, call.called.digits.substr(0, prefixDigits),
                         channels.empty() ? std::string() : toString(channels.front()), call.bearer,
                         kindOf(call.called)});
    const Failure& last = failures_.back();
    if (const auto said = burstSaid_.find(last.cause);
        said != burstSaid_.end() && last.at - said->second < burstSilence)
        return;
    const auto alike = [&](std::string Failure::*property) {
        return !(last.*property).empty() &&
               static_cast<std::size_t>(
                   std::count_if(failures_.begin(), failures_.end(), [&](const Failure& each) {
                       return each.cause == last.cause && each.*property == last.*property;
                   })) >= callsOfABurst;
    };
    std::string common;
    if (alike(&Failure::prefix))
        common = "to numbers that begin with \"" + last.prefix + "\"";
    else if (alike(&Failure::channel))
        common = "on channel " + last.channel;
    else if (alike(&Failure::bearer))
        common = "with bearer " + last.bearer;
    else
        return;
    burstSaid_[last.cause] = last.at;
    sink_.report(findingOf(findings::causeBurst, call.end, call,
                           "cause " + std::to_string(last.cause) + " in " + std::to_string(callsOfABurst) +
                               " calls within a minute, " + common + detailsOf(last)));
}

}  // namespace calls
