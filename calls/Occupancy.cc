#include "calls/Occupancy.h"

#include <algorithm>
#include <limits>
#include <set>

#include "calls/FindingKinds.h"

namespace calls {

namespace {

namespace type = isdn::message;

constexpr std::int64_t hour = 3600 * second;
constexpr std::uint32_t lastOfT1 = 24;
constexpr std::uint32_t dChannelOfE1 = 16;
constexpr std::uint32_t lastOfE1 = 31;

// Times in a damaged capture may lie at the end of what the numbers can hold; a sum stops there.
std::int64_t later(std::int64_t time, std::int64_t by) {
    constexpr std::int64_t endOfTime = std::numeric_limits<std::int64_t>::max();
    return time > endOfTime - by ? endOfTime : time + by;
}

std::int64_t hoursIn(std::int64_t time) { return time >= 0 ? time / hour : (time + 1) / hour - 1; }

// Whether the message says that the other side takes the call, and with it the channel.
bool takes(std::uint8_t messageType) {
    return messageType == type::callProceeding || messageType == type::setupAcknowledge ||
           messageType == type::alerting || messageType == type::connect;
}

// Whether a message may begin the use of its call's channel.
bool mayBegin(const Message& message, const Call& call) {
    const std::uint8_t messageType = message.layer3.type;
    if (messageType == type::retrieveAcknowledge || messageType == type::resumeAcknowledge)
        return true;
    return call.phase != Phase::held && call.phase != Phase::clearing &&
           ((message.from() != call.origin && takes(messageType)) ||
            (call.beforeTrace && !isClearing(messageType) && messageType != type::status &&
             messageType != type::statusEnquiry));
}

}  // namespace

std::optional<HourKey> hourOf(const Moment& moment) {
    if (moment.clock == capture::Clock::none)
        return std::nullopt;
    return HourKey{moment.clock, hoursIn(moment.time)};
}

double Occupancy::Group::erlangs() const {
    return heard <= 0 ? 0 : static_cast<double>(used) / static_cast<double>(heard);
}

void Occupancy::heard(const Message& message, const Call& call) {
    if (call.phase == Phase::ended || call.kind != Kind::call)
        return;
    if (call.messages == 1) {
        Group& group = groups_[call.group];
        groupOf_.try_emplace(call.dChannel, call.group);
        group.ofT1 = message.variant != isdn::Variant::net5;
        for (const ChannelKey& key : channelsOf(call.asked)) {
            if (channels_ < mostChannels && group.channels.try_emplace(key).second)
                ++channels_;
        }
    }
    if (message.layer3.type == type::holdAcknowledge)
        end(call, momentOf(message));
    else if (mayBegin(message, call) && !held_.contains(call.number))
        begin(message, call);
}

void Occupancy::begin(const Message& message, const Call& call) {
    const std::vector<ChannelKey> keys = channelsOf(call.channel());
    Group& group = groups_[call.group];
    if (keys.empty())
        return;
    group.primary = group.primary || call.channel()->primaryRate;
    const Moment moment = momentOf(message);
    std::vector<ChannelKey>& held = held_[call.number];
    for (const ChannelKey& key : keys) {
        auto place = group.channels.find(key);
        if (place == group.channels.end()) {
            if (channels_ >= mostChannels)
                continue;
            ++channels_;
            place = group.channels.emplace(key, Channel()).first;
        }
        Channel& channel = place->second;
        ++channel.calls;
        held.push_back(key);
        channel.holders.push_back(call.number);
        if (channel.holders.size() > 1)
            continue;
        channel.since = moment;
        if (++group.inUse > group.most) {
            group.most = group.inUse;
            group.mostAt = moment;
        }
        group.overTime.set(moment, group.inUse);
    }
}

void Occupancy::end(const Call& call, const Moment& moment) {
    const auto held = held_.find(call.number);
    if (held == held_.end())
        return;
    Group& group = groups_[call.group];
    for (const ChannelKey& key : held->second) {
        Channel& channel = group.channels.at(key);
        std::erase(channel.holders, call.number);
        if (channel.holders.empty())
            stop(group, channel, moment);
    }
    held_.erase(held);
}

void Occupancy::stop(Group& group, Channel& channel, const Moment& moment) {
    const std::int64_t used = std::max<std::int64_t>(moment.at - channel.since.at, 0);
    channel.used = later(channel.used, used);
    group.used = later(group.used, used);
    --group.inUse;
    group.overTime.set(moment, group.inUse);
    spread(channel.since, later(channel.since.time, used));
}

// Adds a time of use to the hours that it touches.
void Occupancy::spread(const Moment& from, std::int64_t until) {
    if (from.clock == capture::Clock::none)
        return;
    std::int64_t at = from.time;
    for (std::size_t touched = 0; at < until && touched < mostHours; ++touched) {
        const HourKey key{from.clock, hoursIn(at)};
        const std::int64_t left =
            hour - (at - key.hour * hour);  // of this hour; a sum could pass the end of time
        const std::int64_t next = until - at < left ? until : at + left;
        if (hours_.size() < mostHours || hours_.contains(key))
            hours_[key] += next - at;
        at = next;
    }
}

void Occupancy::ended(const Call& call) {
    if (call.kind == Kind::call && call.outcome == Outcome::answered && !held_.contains(call.number) &&
        !call.channel())
        ++groups_[call.group].unknown;
    end(call, call.end);
}

void Occupancy::found(const Finding& finding) {
    const auto group = groupOf_.find(finding.dChannel);
    const bool tellsOfStuckOnes =
        finding.kind == &findings::stuckChannel || finding.kind == &findings::massClear;
    if (group == groupOf_.end() || !tellsOfStuckOnes)
        return;
    for (auto& [key, channel] : groups_[group->second].channels) {
        if (std::find(finding.channels.begin(), finding.channels.end(), toString(key)) !=
            finding.channels.end())
            channel.stuck = true;
    }
}

void Occupancy::finish(const std::vector<Span>& spans) {
    std::map<std::uint32_t, std::pair<std::int64_t, std::int64_t>> spanOf;
    for (const Span& span : spans) {
        Group& group = groups_[span.group];
        group.dChannels += (group.dChannels.empty() ? "" : ",") + span.dChannel;
        const auto [entry, isNew] = spanOf.try_emplace(span.group, span.from, span.until);
        entry->second.first = std::min(entry->second.first, span.from);
        entry->second.second = std::max(entry->second.second, span.until);
    }
    for (auto& [number, group] : groups_) {
        const auto [from, until] = spanOf[number];
        group.heard = until - from;
        for (auto& [key, channel] : group.channels) {
            if (channel.holders.empty())
                continue;
            channel.holders.clear();
            channel.usedAtEnd = true;
            Moment end = channel.since;
            end.at = std::max(until, channel.since.at);
            end.time = later(end.time, end.at - channel.since.at);
            stop(group, channel, end);
        }
    }
    held_.clear();
}

std::string_view nameOf(TrunkSize size) {
    switch (size) {
        case TrunkSize::e1:
            return "E1";
        case TrunkSize::t1:
            return "T1";
        case TrunkSize::basic:
            return "basic access";
        case TrunkSize::unknown:
            break;
    }
    return "unknown";
}

TrunkSize learntSize(const Occupancy::Group& group) {
    const auto wasUsed = [](const auto& each) { return each.second.calls > 0; };
    if (std::none_of(group.channels.begin(), group.channels.end(), wasUsed))
        return TrunkSize::unknown;
    if (!group.primary)
        return TrunkSize::basic;
    const bool beyondT1 = std::any_of(group.channels.begin(), group.channels.end(),
                                      [](const auto& each) { return each.first.number > lastOfT1; });
    return beyondT1 || !group.ofT1 ? TrunkSize::e1 : TrunkSize::t1;
}

std::vector<ChannelKey> neverUsed(TrunkSize size, const Occupancy::Group& group) {
    const std::uint32_t last = size == TrunkSize::e1      ? lastOfE1
                               : size == TrunkSize::t1    ? lastOfT1 - 1
                               : size == TrunkSize::basic ? 2
                                                          : 0;
    std::set<std::optional<std::uint32_t>> interfaces;
    for (const auto& [key, channel] : group.channels)
        interfaces.insert(key.interface);
    std::vector<ChannelKey> unused;
    for (const std::optional<std::uint32_t>& interface : interfaces) {
        for (std::uint32_t number = 1; number <= last; ++number) {
            const ChannelKey key{interface, number};
            const auto found = group.channels.find(key);
            const bool isD = size == TrunkSize::e1 && number == dChannelOfE1;
            if (!isD && (found == group.channels.end() || found->second.calls == 0))
                unused.push_back(key);
        }
    }
    return unused;
}

}  // namespace calls
