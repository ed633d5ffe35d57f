#include "calls/Maintenance.h"

#include <algorithm>
#include <limits>

#include "calls/FindingKinds.h"
#include "calls/findingOf.h"

namespace calls {

namespace {

namespace element = isdn::element;
namespace type = isdn::message;

constexpr std::size_t mostAsked = 256;
constexpr std::size_t mostHistories = 4096;
constexpr std::int64_t stormWindow = 600 * second;
constexpr std::size_t stormAbove = 3;
constexpr std::int64_t servicePatience = 120 * second;
constexpr std::uint32_t wholeInterface = 1000;  // stands for a restart of class 6 or 7 among channel numbers

std::size_t indexOf(Side side) { return static_cast<std::size_t>(side); }

std::string_view nameOf(Side side) { return side == Side::us ? "us" : "the peer"; }

std::string listOf(const std::bitset<128>& channels) {
    std::string list;
    for (std::size_t i = 0; i < channels.size(); ++i) {
        if (channels.test(i))
            list += (list.empty() ? "" : ", ") + std::to_string(i);
    }
    return list;
}

isdn::Element changeStatusOf(const Message& message) {
    const isdn::Element own = message.layer3.elements.find(element::changeStatus);
    return own.octets.empty() ? message.layer3.elements.find(element::changeStatus, 6) : own;
}

std::optional<isdn::ChannelId> channelIn(const Message& message) {
    return isdn::channelId(message.layer3.elements.find(element::channelIdentification));
}

}  // namespace

std::vector<ChannelKey> channelsOf(const std::optional<isdn::ChannelId>& channel) {
    std::vector<ChannelKey> keys;
    for (std::uint32_t i = 0; channel && i < channel->channels.size(); ++i) {
        if (channel->channels.test(i))
            keys.push_back({channel->interface, i});
    }
    return keys;
}

std::string toString(const ChannelKey& channel) {
    return (channel.interface ? std::to_string(*channel.interface) + "/" : std::string()) +
           std::to_string(channel.number);
}

void Maintenance::take(const Message& message) {
    const isdn::Layer3& layer3 = message.layer3;
    if (!layer3.hasType)
        return;
    if (isdn::isMaintenance(layer3.discriminator)) {
        if (layer3.type == type::service)
            service(message);
        else if (layer3.type == type::serviceAcknowledge)
            serviceAcknowledge(message);
    } else if (layer3.discriminator == isdn::callControl && layer3.callReference.global()) {
        if (layer3.type == type::restart)
            restart(message);
        else if (layer3.type == type::restartAcknowledge)
            restartAcknowledge(message);
    }
}

void Maintenance::restart(const Message& message) {
    Target target;
    target.kind = isdn::restartClass(message.layer3.elements.find(element::restartIndicator)).value_or(0);
    if (const auto channel = channelIn(message)) {
        target.interface = channel->interface;
        target.channels = channel->channels;
    }
    ask(message, target, false);
}

// The same question, sent again while it waits for its answer, is a repetition.
void Maintenance::ask(const Message& message, const Target& target, bool isService) {
    for (Asked& each : asked_) {
        if (each.service == isService && each.target == target && each.asker == message.from()) {
            ++each.repetitions;
            each.last = momentOf(message);
            return;
        }
    }
    if (!isService)
        countRestart(message, target);
    if (asked_.size() >= mostAsked)
        asked_.erase(asked_.begin());
    const capture::Interface* const interface = message.frame->interface;
    asked_.push_back({isService, target, message.from(), message.layer2.tei,
                      interface == nullptr ? std::string() : interface->name, momentOf(message),
                      momentOf(message), 0});
}

// Counts a restart of a channel that is no repetition, so an acknowledgement has come in between.
void Maintenance::countRestart(const Message& message, const Target& target) {
    std::vector<ChannelKey> keys;
    for (std::uint32_t i = 0; target.kind == 0 && i < target.channels.size(); ++i) {
        if (target.channels.test(i))
            keys.push_back({target.interface, i});
    }
    if (keys.empty())
        keys.push_back({target.interface, wholeInterface + target.kind});
    bool storm = false;
    std::string which;
    for (const ChannelKey& key : keys) {
        if (restarts_.size() >= mostHistories && !restarts_.contains({message.from(), key}))
            continue;
        std::deque<std::int64_t>& times = restarts_[{message.from(), key}];
        while (!times.empty() && message.at - times.front() > stormWindow)
            times.pop_front();
        times.push_back(message.at);
        if (times.size() <= stormAbove)
            continue;
        storm = true;
        which = key.number >= wholeInterface ? "the interface" : "channel " + toString(key);
        while (times.size() > 1)  // reported once; then the count begins again
            times.pop_front();
    }
    if (storm)
        sink_.report(findingOf(findings::restartStorm, message, nullptr,
                               which + " was restarted more than 3 times in 10 minutes by " +
                                   std::string(nameOf(message.from()))));
}

void Maintenance::restartAcknowledge(const Message& message) {
    const std::uint8_t kind =
        isdn::restartClass(message.layer3.elements.find(element::restartIndicator)).value_or(0);
    const auto channel = channelIn(message);
    const auto found = std::find_if(asked_.begin(), asked_.end(), [&](const Asked& each) {
        return !each.service && each.asker == other(message.from()) && each.target.kind == kind &&
               (kind != 0 || !channel || (each.target.channels & channel->channels).any());
    });
    if (found == asked_.end())
        return;
    if (kind == 0 && channel) {
        const std::bitset<128> missing = found->target.channels & ~channel->channels;
        if (missing.any())
            sink_.report(findingOf(findings::restartPartly, message, nullptr,
                                   "RESTART ACKNOWLEDGE lacks channel " + listOf(missing)));
    }
    asked_.erase(found);
}

void Maintenance::service(const Message& message) {
    const auto status = isdn::changeStatus(changeStatusOf(message));
    if (!status)
        return;
    Target target;
    target.kind = status->status;
    const auto channel = channelIn(message);
    if (channel) {
        target.interface = channel->interface;
        target.channels = channel->channels;
    }
    ask(message, target, true);
    const Service told = status->status == 0   ? Service::in
                         : status->status == 1 ? Service::maintenance
                                               : Service::out;
    for (const ChannelKey& key : channelsOf(channel)) {
        if (status_.size() < mostHistories || status_.contains({message.from(), key}))
            status_[{message.from(), key}] = told;
    }
}

void Maintenance::serviceAcknowledge(const Message& message) {
    acknowledgesService_[indexOf(message.from())] = true;
    const auto channel = channelIn(message);
    std::erase_if(asked_, [&](const Asked& each) {
        return each.service && each.asker == other(message.from()) &&
               (!channel || each.target.channels == channel->channels);
    });
}

std::int64_t Maintenance::dueAt(const Asked& asked) const {
    if (asked.service)
        return asked.repetitions == 0 ? std::numeric_limits<std::int64_t>::max()
                                      : asked.first.at + servicePatience + timers_.slack;
    return (asked.repetitions == 0 ? asked.first.at + 2 * timers_.t316 : asked.last.at + timers_.t316) +
           timers_.slack;
}

void Maintenance::advance(std::int64_t at) {
    for (std::size_t i = 0; i < asked_.size();) {
        if (at <= dueAt(asked_[i])) {
            ++i;
            continue;
        }
        expire(asked_[i], dueAt(asked_[i]) - timers_.slack);
        asked_.erase(asked_.begin() + static_cast<std::ptrdiff_t>(i));
    }
    constexpr std::int64_t never = std::numeric_limits<std::int64_t>::max();
    verdicts_.advance(at, asked_.empty() ? never : asked_.front().first.at);
}

void Maintenance::expire(const Asked& asked, std::int64_t until) {
    if (asked.service && !acknowledgesService_[indexOf(other(asked.asker))])
        return;
    const FindingKind& kind =
        asked.service ? findings::serviceUnacknowledged : findings::restartUnacknowledged;
    std::string what = std::string(asked.service ? "SERVICE" : "RESTART") + " of frame " +
                       std::to_string(asked.first.frame) + " got no acknowledge";
    verdicts_.judge({findingOf(kind, asked.last, asked.dChannel, std::move(what)), asked.tei, asked.asker,
                     other(asked.asker), asked.first.frame, asked.first.at, until});
}

void Maintenance::boardRestarted() {
    asked_.clear();
    verdicts_.forget();
}

Service Maintenance::serviceOf(const ChannelKey& channel) const {
    Service worse = Service::in;
    for (const Side side : {Side::us, Side::peer}) {
        if (const auto found = status_.find({side, channel}); found != status_.end())
            worse = std::max(worse, found->second);
    }
    return worse;
}

std::optional<Side> Maintenance::blockedBy(const ChannelKey& channel) const {
    for (const Side side : {Side::us, Side::peer}) {
        const auto found = status_.find({side, channel});
        if (found != status_.end() && found->second != Service::in && found->second == serviceOf(channel))
            return side;
    }
    return std::nullopt;
}

bool Maintenance::isRestarting(const ChannelKey& channel) const {
    return std::any_of(asked_.begin(), asked_.end(), [&](const Asked& asked) {
        const Target& target = asked.target;
        if (asked.service || (target.interface && target.interface != channel.interface))
            return false;
        return target.channels.none() ||
               (target.interface == channel.interface && target.channels.test(channel.number));
    });
}

}  // namespace calls
