#include "calls/Analysis.h"

#include <algorithm>
#include <limits>
#include <optional>
#include <utility>

#include "calls/AnalysisGroup.h"
#include "calls/ChannelClock.h"
#include "calls/FindingKinds.h"
#include "calls/LinkFindings.h"
#include "calls/Segments.h"
#include "calls/WitnessKeeper.h"
#include "calls/findingOf.h"
#include "calls/standardVariant.h"

namespace calls {

namespace {

bool isGrouped(const Options& options, const std::string& name) {
    return std::any_of(options.groups.begin(), options.groups.end(),
                       [&](const std::vector<std::string>& group) {
                           return std::find(group.begin(), group.end(), name) != group.end();
                       });
}

}  // namespace

struct Analysis::Channel {
    Channel(const Options& options, const std::string& itsName, Group& itsGroup, std::uint32_t number,
            isdn::Variant ofTrunk)
        : name(itsName),
          links(options.timers, options.role),
          linkFindings(
              {.dChannel = itsName, .timers = options.timers, .grouped = isGrouped(options, itsName)},
              itsGroup),
          group(itsGroup),
          groupNumber(number),
          variant(ofTrunk) {}

    Message messageOf(const capture::Frame& frame, std::uint64_t number, std::int64_t at,
                      const isdn::Layer2& layer2) const {
        Message message;
        message.frame = &frame;
        message.number = number;
        message.at = at;
        message.group = groupNumber;
        message.role = links.marks().role;
        message.variant = variant;
        message.numbering = links.link()->numbering();
        message.layer2 = layer2;
        message.layer3 = isdn::parseLayer3(layer2.information);
        return message;
    }
    // The recorder, or the board, was started again.
    void restarted() {
        links.restarted();
        linkFindings.restarted();
        group.boardRestarted();
    }
    // Takes a frame that carries a message.
    void take(const Message& message, const Timers& timers) {
        if (links.marks().accepted.value_or(false))
            accept(message, timers);
        else
            carriers.take(message, links.marks(), group.table(), group.carried());
    }
    // Takes a frame that the receiver's layer 2 hands up.
    void accept(Message message, const Timers& timers) {
        WitnessKeeper& keeper = keepers[message.layer2.tei];
        Segments& pieces = segments[message.layer2.tei];
        expireSegments(message.at, timers);
        const Segments::Taken taken = pieces.take(message);
        if (const auto replaced = pieces.replaced())
            reportSegments(replaced->moment, replaced->from, replaced->moment.at, keeper.witness(),
                           "the message that began in SEGMENT was not completed before the next one began");
        if (taken == Segments::Taken::kept) {
            segmentsDue = std::min(segmentsDue, message.at + timers.t314 + timers.slack);
            carriers.take(message, links.marks(), group.table(), group.carried());
            return;
        }
        if (taken == Segments::Taken::outOfOrder)
            reportSegments(momentOf(message), message.from(), message.at - timers.t314, keeper.witness(),
                           "a SEGMENT does not follow those before it");
        message.at = group.now();
        group.take(message, keeper.witness(), carriers);
    }
    // Gives up messages whose next segment has not come in time.
    void expireSegments(std::int64_t at, const Timers& timers) {
        if (at <= segmentsDue)
            return;
        segmentsDue = never;
        for (auto& [tei, pieces] : segments) {
            while (const auto late = pieces.unfinished(at, timers.t314 + timers.slack))
                reportSegments(late->moment, late->from, late->moment.at, keepers[tei].witness(),
                               "the next SEGMENT did not come within T314");
            if (!pieces.empty())
                segmentsDue = std::min(segmentsDue, pieces.oldest() + timers.t314 + timers.slack);
        }
    }
    void reportSegments(const Moment& moment, Side from, std::int64_t since, const LinkWitness& witness,
                        std::string sentence) {
        const bool isWhole = witness.isWholeSince(since, from);
        if (!isWhole)
            sentence += ", but a frame is missing in the trace";
        group.report(findingOf(isWhole ? findings::segmentsUnfinished : findings::cannotBeTold, moment, name,
                               std::move(sentence)));
    }

    std::string name;
    DChannel links;
    LinkFindings linkFindings;
    ChannelClock clock;
    std::optional<std::int64_t> begin;  // the time of the first frame
    Group& group;
    std::uint32_t groupNumber;
    isdn::Variant variant;
    std::map<std::uint8_t, WitnessKeeper> keepers;  // by TEI, of call control
    std::map<std::uint8_t, Segments> segments;      // by TEI
    static constexpr std::int64_t never = std::numeric_limits<std::int64_t>::max();
    std::int64_t segmentsDue = never;  // when the next segment of some message is overdue
    Carriers carriers;
};

Analysis::Analysis(const Options& options, Listener& listener)
    : options_(options), listener_(listener), numbers_(std::make_unique<CallNumbers>()) {}

Analysis::~Analysis() = default;

std::uint32_t Analysis::groupOf(const std::string& name) {
    for (const auto& [other, channel] : channels_) {
        const auto together = [&, &known = other](const std::vector<std::string>& group) {
            return std::find(group.begin(), group.end(), name) != group.end() &&
                   std::find(group.begin(), group.end(), known) != group.end();
        };
        if (std::any_of(options_.groups.begin(), options_.groups.end(), together))
            return channel->groupNumber;
    }
    groups_.push_back(std::make_unique<Group>(options_.timers, *numbers_, listener_));
    return static_cast<std::uint32_t>(groups_.size() - 1);
}

Analysis::Channel& Analysis::channelOf(const capture::Interface& interface) {
    if (last_ != nullptr && last_->name == interface.name)
        return *last_;
    auto found = channels_.find(interface.name);
    if (found == channels_.end()) {
        const std::uint32_t group = groupOf(interface.name);
        found = channels_
                    .emplace(interface.name,
                             std::make_unique<Channel>(options_, interface.name, *groups_[group], group,
                                                       standardVariant(interface.variant, options_.variant)))
                    .first;
    }
    last_ = found->second.get();
    if (interface.variant != capture::Variant::unknown)
        last_->variant = standardVariant(interface.variant, options_.variant);
    return *last_;
}

// Whether a D channel of the same group has a link over which the calls can be signalled.
bool Analysis::mayCallsGoOn(const Channel& channel, std::uint8_t tei) const {
    return std::any_of(channels_.begin(), channels_.end(), [&](const auto& each) {
        if (&each.second->group != &channel.group)
            return false;
        const Link* const link = each.second->links.find(isdn::callControlSapi, tei);
        return link != nullptr && link->state() == LinkState::up;
    });
}

const Marks& Analysis::take(const capture::Frame& frame, std::uint64_t number) {
    Channel& channel = channelOf(*frame.interface);
    const std::int64_t at = channel.clock.at(frame);
    if (!channel.begin)
        channel.begin = at;
    if (channel.clock.hasRestarted())
        channel.restarted();
    channel.group.advance(at);
    channel.expireSegments(at, options_.timers);
    const Marks& marks = channel.links.take(frame, number, at);
    channel.linkFindings.take(channel.links);
    const isdn::Layer2& layer2 = channel.links.layer2();
    if (layer2.sapi != isdn::callControlSapi || layer2.header.size() < 3)
        return marks;
    WitnessKeeper& keeper = channel.keepers[layer2.tei];
    keeper.take(channel.links);
    if (marks.unseenSetUp || keeper.witness().isShortAt(at))
        channel.group.framesLost(layer2.tei);
    if (marks.linkUp || marks.linkDown)
        channel.group.linkChanged(layer2.tei, {number, channel.group.now(), frame.clock, frame.time},
                                  channel.name, marks.linkUp, mayCallsGoOn(channel, layer2.tei));
    for (const KeptFrame& late : channel.links.late()) {
        capture::Frame kept = late.frame;
        kept.octets = late.octets;
        // the reader that owns it may be destroyed before the kept frame is used
        kept.interface = frame.interface;
        kept.place.file = frame.place.file;
        const isdn::Layer2 keptLayer2 = isdn::parseLayer2(kept.octets);
        if (keptLayer2.carriesMessage())
            channel.accept(channel.messageOf(kept, late.number, at, keptLayer2), options_.timers);
    }
    channel.carriers.advance(at, channel.group.table(), channel.group.carried());
    if (layer2.carriesMessage())
        channel.take(channel.messageOf(frame, number, at, layer2), options_.timers);
    return marks;
}

void Analysis::mayMiss(const capture::Interface& interface, std::string_view reason) {
    Channel& channel = channelOf(interface);
    channel.links.mayMiss(reason);
    for (auto& [tei, keeper] : channel.keepers)
        keeper.mayMiss(channel.clock.now());
    channel.linkFindings.lost(std::string(reason));
}

void Analysis::mayLack(const capture::Interface& interface, Side side) {
    Channel& channel = channelOf(interface);
    channel.links.mayLack(side);
    for (auto& [tei, keeper] : channel.keepers) {
        keeper.lacks(side, channel.clock.now());
        channel.group.table().framesLost(tei);
    }
}

void Analysis::restarted(const capture::Interface& interface) { channelOf(interface).restarted(); }

void Analysis::advance(std::int64_t nanoseconds) {
    for (const auto& [name, channel] : channels_) {
        channel->clock.advance(nanoseconds);
        channel->group.advance(channel->clock.now());
        channel->expireSegments(channel->clock.now(), options_.timers);
        channel->linkFindings.advance(channel->clock.now());
        channel->carriers.advance(channel->clock.now(), channel->group.table(), channel->group.carried());
    }
}

void Analysis::finish() {
    for (const auto& [name, channel] : channels_) {
        channel->expireSegments(channel->clock.now(), options_.timers);
        channel->links.finish();
        channel->linkFindings.finish(channel->links);
        channel->carriers.finish(channel->group.table(), channel->group.carried());
    }
    for (const auto& group : groups_)
        group->finish();
}

std::vector<const Call*> Analysis::open() const {
    std::vector<const Call*> calls;
    for (const auto& group : groups_) {
        const std::vector<const Call*> some = group->table().open();
        calls.insert(calls.end(), some.begin(), some.end());
    }
    std::sort(calls.begin(), calls.end(), [](const Call* a, const Call* b) { return a->number < b->number; });
    return calls;
}

std::uint64_t Analysis::dropped() const {
    std::uint64_t sum = 0;
    for (const auto& group : groups_)
        sum += group->table().dropped();
    return sum;
}

std::vector<Span> Analysis::spans() const {
    std::vector<Span> spans;
    for (const auto& [name, channel] : channels_) {
        if (channel->begin)
            spans.push_back({name, channel->groupNumber, *channel->begin, channel->clock.now()});
    }
    return spans;
}

const DChannel* Analysis::dChannel(std::string_view name) const {
    const auto found = channels_.find(name);
    return found == channels_.end() ? nullptr : &found->second->links;
}

ChannelService Analysis::serviceOf(std::uint32_t group, const ChannelKey& channel) const {
    const Maintenance& maintenance = groups_.at(group)->maintenance();
    return {maintenance.serviceOf(channel), maintenance.blockedBy(channel),
            maintenance.isRestarting(channel)};
}

}  // namespace calls
