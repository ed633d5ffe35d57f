#include "calls/Maintenance.h"

#include <algorithm>
#include <limits>

#include "calls/FindingKinds.h"
#include "calls/channelKeys.h"
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
// A storm passes over the channels one after another. Channels that it reaches within this time share one
// finding.
constexpr std::int64_t stormPasses = 10 * second;
constexpr std::int64_t never = std::numeric_limits<std::int64_t>::max();
constexpr std::uint32_t wholeInterface = 1000;  // stands for a restart of class 6 or 7 among channel numbers

std::size_t indexOf(Side side) { return static_cast<std::size_t>(side); }

std::string_view nameOf(Side side) { return side == Side::us ? "us" : "the peer"; }

std::string restartedTooOften(Side asker) {
    return " restarted more than 3 times in 10 minutes by " + std::string(nameOf(asker));
}

GatheredFindings::Sentence unacknowledged(std::string_view messages, Side asker) {
    return [messages, asker](const Finding&, const std::string& channels) {
        return std::string(messages) + " of " + std::string(nameOf(asker)) + " got no acknowledge" +
               (channels.empty() ? "" : ": " + channels);
    };
}

isdn::Element changeStatusOf(const Message& message) {
    const isdn::Element own = message.layer3.elements.find(element::changeStatus);
    return own.octets.empty() ? message.layer3.elements.find(element::changeStatus, 6) : own;
}

std::optional<isdn::ChannelId> channelIn(const Message& message) {
    return isdn::channelId(message.layer3.elements.find(element::channelIdentification));
}

}  // namespace

Maintenance::Told::Told(FindingSink& sink, Side asker)
    : restarts(sink, unacknowledged("RESTARTs", asker)),
      services(sink, unacknowledged("SERVICEs", asker)),
      storms(sink, [asker](const Finding&, const std::string& channels) {
          return (channels.empty() ? "the interface was" : channels + " were") + restartedTooOften(asker);
      }) {}

Maintenance::Maintenance(const Timers& timers, const LinkWitnesses& links, FindingSink& sink)
    : timers_(timers),
      sink_(sink),
      told_{Told(sink, Side::us), Told(sink, Side::peer)},
      verdicts_(timers, links, sink) {}

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
            each.last = momentOf(message);
            if (++each.repetitions == 1)
                each.due = dueAfterRepetition(each);
            return;
        }
    }
    if (!isService)
        countRestart(message, target);
    if (asked_.size() >= mostAsked)
        asked_.erase(asked_.begin());
    const capture::Interface* const interface = message.frame->interface;
    const Moment now = momentOf(message);
    asked_.push_back({isService, target, message.from(), message.layer2.tei,
                      interface == nullptr ? std::string() : interface->name, now, now, 0,
                      isService ? never : now.at + 2 * timers_.t316 + timers_.slack});
}

// The first repetition decides: a side that repeats for ever gets its finding all the same.
std::int64_t Maintenance::dueAfterRepetition(const Asked& asked) const {
    const std::int64_t due = asked.service
                                 ? asked.first.at + servicePatience
                                 : std::max(asked.first.at + 2 * timers_.t316, asked.last.at + timers_.t316);
    return due + timers_.slack;
}

// Counts a restart of a channel that is no repetition, so an acknowledgement has come in between.
void Maintenance::countRestart(const Message& message, const Target& target) {
    std::vector<ChannelKey> keys;
    if (target.kind == 0)
        keys = keysOf(target.interface, target.channels);
    if (keys.empty())
        keys.push_back({target.interface, wholeInterface + target.kind});
    bool storm = false;
    std::vector<std::string> channels;
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
        if (key.number < wholeInterface)
            channels.push_back(toString(key));
        while (times.size() > 1)  // reported once; then the count begins again
            times.pop_front();
    }
    if (!storm)
        return;
    Finding finding = findingOf(findings::restartStorm, message, nullptr,
                                (channels.empty() ? "the interface" : "channel " + listOf(channels)) +
                                    " was" + restartedTooOften(message.from()));
    finding.channels = std::move(channels);
    toldOf(message.from()).storms.report(std::move(finding));
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
            sink_.report(
                findingOf(findings::restartPartly, message, nullptr,
                          "RESTART ACKNOWLEDGE lacks channel " + listOf(namesOf(keysOf({}, missing)))));
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

void Maintenance::advance(std::int64_t at) {
    for (Told& told : told_) {
        for (GatheredFindings* const gathered : {&told.restarts, &told.services, &told.storms})
            gathered->advance(at);
    }
    for (std::size_t i = 0; i < asked_.size();) {
        if (at <= asked_[i].due) {
            ++i;
            continue;
        }
        expire(asked_[i]);
        asked_.erase(asked_.begin() + static_cast<std::ptrdiff_t>(i));
    }
    verdicts_.advance(at, asked_.empty() ? never : asked_.front().first.at);
    completeTold(at);
}

void Maintenance::expire(const Asked& asked) {
    if (asked.service && !acknowledgesService_[indexOf(other(asked.asker))])
        return;
    const FindingKind& kind =
        asked.service ? findings::serviceUnacknowledged : findings::restartUnacknowledged;
    Finding finding = findingOf(kind, asked.last, asked.dChannel,
                                std::string(asked.service ? "SERVICE" : "RESTART") + " of frame " +
                                    std::to_string(asked.first.frame) + " got no acknowledge");
    finding.channels = namesOf(keysOf(asked.target.interface, asked.target.channels));
    if (!finding.channels.empty())
        finding.sentence += ": channel " + listOf(finding.channels);
    Told& told = toldOf(asked.asker);
    verdicts_.judge({std::move(finding), asked.tei, asked.asker, other(asked.asker), asked.first.frame,
                     asked.first.at, asked.due - timers_.slack,
                     asked.service ? &told.services : &told.restarts});
}

// Questions that were asked before the first of them was overdue belong together. They are complete when none
// of them waits any more.
bool Maintenance::isComplete(const GatheredFindings& gathered, Side asker, bool service) const {
    return gathered.since() && !verdicts_.isHolding() &&
           std::none_of(asked_.begin(), asked_.end(), [&](const Asked& each) {
               return each.service == service && each.asker == asker && each.due != never &&
                      each.first.at <= *gathered.since();
           });
}

void Maintenance::completeTold(std::int64_t at) {
    for (const Side asker : {Side::us, Side::peer}) {
        Told& told = toldOf(asker);
        if (isComplete(told.restarts, asker, false))
            told.restarts.complete();
        if (isComplete(told.services, asker, true))
            told.services.complete();
        if (const auto since = told.storms.since(); since && at - *since > stormPasses)
            told.storms.complete();
        for (GatheredFindings* const gathered : {&told.restarts, &told.services, &told.storms})
            gathered->reportCounted();
    }
}

void Maintenance::finish() {
    verdicts_.finish();
    for (Told& told : told_) {
        for (GatheredFindings* const gathered : {&told.restarts, &told.services, &told.storms})
            gathered->finish();
    }
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
