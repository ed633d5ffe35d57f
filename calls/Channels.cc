#include "calls/Channels.h"

#include <algorithm>
#include <utility>

#include "calls/FindingKinds.h"
#include "calls/causes.h"
#include "calls/findingOf.h"

namespace calls {

namespace {

namespace type = isdn::message;

constexpr std::uint8_t noChannel = 34, requestedNotAvailable = 44, doesNotExist = 82;

std::string callName(std::uint64_t number) { return "call " + std::to_string(number); }

bool accepts(std::uint8_t messageType) {
    return messageType == type::callProceeding || messageType == type::setupAcknowledge ||
           messageType == type::alerting || messageType == type::connect;
}

}  // namespace

Channels::State* Channels::stateOf(const ChannelKey& key) {
    if (const auto found = states_.find(key); found != states_.end())
        return &found->second;
    return states_.size() < mostChannels ? &states_[key] : nullptr;
}

void Channels::heard(Call& call, const Message& message) {
    if (call.phase == Phase::ended)
        return;
    const auto [entry, isNew] = seizures_.try_emplace(call.number);
    Seizure& seizure = entry->second;
    seizure.call = &call;
    const std::uint8_t messageType = message.layer3.type;
    if (messageType == type::setup && isNew) {
        setUp(call, seizure, message);
        return;
    }
    if (messageType == type::holdAcknowledge) {
        release(call.number, seizure);
        return;
    }
    const bool goesOn = messageType == type::retrieveAcknowledge || messageType == type::resumeAcknowledge ||
                        (call.beforeTrace && isNew && !isClearing(messageType));
    const bool taken = message.from() != call.origin && accepts(messageType) && !seizure.answered;
    if (taken || goesOn ||
        (seizure.answered && seizure.held.empty() && call.granted && call.phase == Phase::setUp)) {
        seizure.answered = seizure.answered || taken;
        hold(call, seizure, message);
        settleGlare(call, seizure, &message);
    }
}

void Channels::setUp(Call& call, Seizure& seizure, const Message& message) {
    seizure.asked = channelsOf(call.asked);
    seizure.numbered = message.layer2.hasNs();
    seizure.setupAt = message.at;
    seizure.setupNs = message.layer2.ns;
    for (const ChannelKey& key : seizure.asked)
        static_cast<void>(stateOf(key));
    checkService(call, seizure, seizure.asked, message);
    findGlare(call, seizure, message);
    hunt(call, seizure, message);
}

// Reports, once for each call, that SETUP or the answer takes a channel that is out of service.
void Channels::checkService(const Call& call, Seizure& seizure, const std::vector<ChannelKey>& channels,
                            const Message& message) {
    for (const ChannelKey& key : channels) {
        if (maintenance_.serviceOf(key) == Service::in || seizure.outOfServiceSaid)
            continue;
        seizure.outOfServiceSaid = true;
        const bool asks = message.layer3.type == type::setup;
        sink_.report(findingOf(findings::serviceChannelSeized, message, &call,
                               std::string(isdn::messageName(message.layer3)) +
                                   (asks ? " asks for" : " takes") + " channel " + toString(key) +
                                   ", which is out of service"));
    }
}

void Channels::hold(Call& call, Seizure& seizure, const Message& message) {
    release(call.number, seizure);
    seizure.held = channelsOf(call.held());
    checkService(call, seizure, seizure.held, message);
    for (const ChannelKey& key : seizure.held) {
        State* const state = stateOf(key);
        if (state == nullptr)
            continue;
        stuck_.freed(key);
        state->refusals = 0;
        findDoubleSeizure(call, key, *state, message);
        state->holders.push_back(call.number);
    }
}

void Channels::findDoubleSeizure(const Call& call, const ChannelKey& key, State& state,
                                 const Message& message) {
    const std::vector<std::uint64_t> holders = state.holders;
    for (const std::uint64_t holder : holders) {
        const auto found = seizures_.find(holder);
        if (found == seizures_.end() || found->second.glare == call.number)
            continue;  // reported as glare
        std::string sentence = "channel " + toString(key) + " is given to " + callName(call.number) +
                               " while " + callName(holder) + " holds it";
        if (found->second.call->lack == Lack::nothing) {
            conflicts_.push_back({key, holder, call.number, message.at + timers_.slack,
                                  findingOf(findings::doubleSeizure, message, &call, std::move(sentence))});
            continue;
        }
        sink_.report(findingOf(findings::cannotBeTold, message, &call,
                               sentence + " as far as the trace shows: frames are missing"));
        release(holder, found->second);
    }
}

void Channels::release(std::uint64_t call, Seizure& seizure) {
    for (const ChannelKey& key : seizure.held) {
        State* const state = stateOf(key);
        if (state == nullptr)
            continue;
        std::erase(state->holders, call);
        state->seenFree = state->seenFree || state->holders.empty();
    }
    seizure.held.clear();
}

void Channels::ended(Call& call, const Message*) {
    const auto found = seizures_.find(call.number);
    if (found == seizures_.end())
        return;
    Seizure& seizure = found->second;
    if (call.endedBy == EndedBy::open)
        return;
    if (!seizure.answered)
        noteRefusal(call, seizure);
    settleGlare(call, seizure, nullptr);
    const std::vector<ChannelKey> held = seizure.held;
    release(call.number, seizure);
    const bool lost = call.endedBy == EndedBy::replaced || call.endedBy == EndedBy::link;
    if (lost && !call.clearingSeen && call.lack == Lack::nothing)
        stuck_.left(call, held);
    seizure.asked.clear();
}

void Channels::gone(const Call& call) { seizures_.erase(call.number); }

bool Channels::isKnownIdle(const std::vector<ChannelKey>& channels) const {
    return !channels.empty() && std::all_of(channels.begin(), channels.end(), [&](const ChannelKey& key) {
        const auto state = states_.find(key);
        return state != states_.end() && state->second.seenFree && state->second.holders.empty() &&
               maintenance_.serviceOf(key) == Service::in;
    });
}

void Channels::noteRefusal(const Call& call, const Seizure& seizure) {
    if (!call.cause || call.cause->from == call.origin || seizure.glare != 0 || !isKnownIdle(seizure.asked))
        return;
    const std::uint8_t value = call.cause->value;
    const Made made = madeBy(*call.cause);
    const bool aboutThisChannel = value == requestedNotAvailable || value == doesNotExist;
    const bool madeHere = made == Made::here || made == Made::thisExchange;
    if (!aboutThisChannel && (value != noChannel || !madeHere))
        return;
    const ChannelKey& key = seizure.asked.front();
    State& state = *stateOf(key);
    std::string sentence = "channel " + toString(key) + " was refused with cause " + std::to_string(value) +
                           " although the trace shows it idle";
    if (aboutThisChannel && ++state.refusals == 2) {
        Finding stuck =
            findingOf(findings::stuckChannel, call.end, call, std::move(sentence) + ", for the second time");
        stuck.channels = {toString(key)};
        sink_.report(std::move(stuck));
    } else {
        sink_.report(findingOf(findings::channelRefused, call.end, call, std::move(sentence)));
    }
}

void Channels::restarted(const Message& acknowledge) {
    namespace element = isdn::element;
    constexpr std::uint8_t namedChannels = 0;
    const std::uint8_t kind = isdn::restartClass(acknowledge.layer3.elements.find(element::restartIndicator))
                                  .value_or(namedChannels);
    const auto channel = isdn::channelId(acknowledge.layer3.elements.find(element::channelIdentification));
    const std::vector<ChannelKey> named = channelsOf(channel);
    const auto isMeant = [&](const ChannelKey& key) {
        if (kind == namedChannels)
            return std::find(named.begin(), named.end(), key) != named.end();
        return kind != 6 || !channel || channel->interface == key.interface;
    };
    for (const ChannelKey& key : named)
        static_cast<void>(stateOf(key));
    for (auto& [key, state] : states_) {
        if (!isMeant(key))
            continue;
        stuck_.freed(key);
        state.refusals = 0;
        state.seenFree = state.seenFree || state.holders.empty();
    }
}

void Channels::boardRestarted() {
    for (auto& [key, state] : states_)
        state = {};
    seizures_.clear();
    conflicts_.clear();
}

void Channels::framesLost() {
    for (auto& [key, state] : states_) {
        state.seenFree = false;
        state.refusals = 0;
    }
}

void Channels::advance(std::int64_t at) {
    for (std::size_t i = 0; i < conflicts_.size();) {
        if (conflicts_[i].deadline > at) {
            ++i;
            continue;
        }
        Conflict conflict = std::move(conflicts_[i]);
        conflicts_.erase(conflicts_.begin() + static_cast<std::ptrdiff_t>(i));
        const std::vector<std::uint64_t>& holders = states_[conflict.channel].holders;
        const auto holds = [&](std::uint64_t call) {
            return std::find(holders.begin(), holders.end(), call) != holders.end();
        };
        if (holds(conflict.first) && holds(conflict.second))
            sink_.report(std::move(conflict.finding));
    }
}

std::map<ChannelKey, std::vector<std::uint64_t>> Channels::holders() const {
    std::map<ChannelKey, std::vector<std::uint64_t>> all;
    for (const auto& [key, state] : states_)
        all.emplace(key, state.holders);
    return all;
}

}  // namespace calls
