#include "reader/figureTables.h"

#include <array>
#include <set>

#include "isdn/Layer3.h"
#include "isdn/values.h"
#include "reader/TimeText.h"
#include "reader/text.h"

namespace reader {

namespace {

using calls::Side;
using enum FigureColumn::Kind;

constexpr std::array bothSides{Side::us, Side::peer};
constexpr std::string_view nameOf(Side side) { return side == Side::us ? "us" : "peer"; }

std::string seconds(std::int64_t nanoseconds) {
    std::string text;
    appendSeconds(text, nanoseconds);
    return text;
}

std::string percent(std::optional<double> share) { return share ? decimal(*share * 100, 1) : std::string(); }

std::string instant(calls::HourKey key) {
    constexpr std::int64_t hour = 3600 * calls::second;
    return textOf({key.clock, key.hour * hour});
}

std::string wordsOf(calls::MessageKind kind) {
    if (!kind.hasType)
        return "of other protocols, or damaged";
    const std::string_view name =
        kind.national ? std::string_view() : isdn::messageName(kind.discriminator, kind.type);
    // Trunks may have both maintenance protocols, with the same names of messages.
    if (!name.empty())
        return std::string(name) + (kind.discriminator == isdn::maintenanceOfNetwork ? " (protocol 43)" : "");
    std::string words = kind.national ? "national 0x" : "unknown 0x";
    appendHex(words, std::array{kind.type});
    return words;
}

FigureTable messages(const calls::Figures& figures) {
    FigureTable table{"messages",
                      "Messages that layer 2 accepted",
                      {{"message", "message", key}, {"sent", "sent"}, {"received", "received"}}};
    for (const auto& [kind, counts] : figures.messages())
        table.rows.push_back({wordsOf(kind), std::to_string(counts[0]), std::to_string(counts[1])});
    return table;
}

// A row of the table about the calls of one direction.
struct TrafficRow {
    std::string_view name;
    std::string (*value)(const calls::Traffic& traffic);
};

template <std::uint64_t calls::Traffic::*member>
std::string countOf(const calls::Traffic& traffic) {
    return std::to_string(traffic.*member);
}
template <calls::Outcome outcome>
std::string outcomeOf(const calls::Traffic& traffic) {
    return std::to_string(traffic.byOutcome[static_cast<std::size_t>(outcome)]);
}

constexpr TrafficRow trafficRows[] = {
    {"seizures", countOf<&calls::Traffic::seizures>},
    {"answered", countOf<&calls::Traffic::answered>},
    {"answer-seizure ratio %",
     [](const calls::Traffic& traffic) { return percent(traffic.answerSeizureRatio()); }},
    {"network effectiveness ratio %",
     [](const calls::Traffic& traffic) { return percent(traffic.networkEffectivenessRatio()); }},
    {"failed", countOf<&calls::Traffic::failed>},
    {"busy", outcomeOf<calls::Outcome::busy>},
    {"no-answer", outcomeOf<calls::Outcome::noAnswer>},
    {"abandoned", outcomeOf<calls::Outcome::abandoned>},
    {"rejected", outcomeOf<calls::Outcome::rejected>},
    {"number", outcomeOf<calls::Outcome::number>},
    {"incompatible", outcomeOf<calls::Outcome::incompatible>},
    {"congestion", outcomeOf<calls::Outcome::congestion>},
    {"protocol", outcomeOf<calls::Outcome::protocol>},
    {"other", outcomeOf<calls::Outcome::other>},
    {"SETUP repeated", countOf<&calls::Traffic::setupRepeated>},
    {"not counted: gave way to a crossing call", countOf<&calls::Traffic::gaveWay>},
    {"not counted: without a B channel", countOf<&calls::Traffic::signalling>},
    {"not counted: began before the trace", countOf<&calls::Traffic::beforeTrace>},
    {"not counted: still being set up at its end", countOf<&calls::Traffic::open>},
};

FigureTable traffic(const calls::Figures& figures) {
    FigureTable table{"traffic",
                      "Calls, by the side that began them",
                      {{"figure", "", key}, {"us", "us"}, {"peer", "peer"}}};
    for (const TrafficRow& row : trafficRows) {
        table.rows.push_back({std::string(row.name), row.value(figures.traffic(Side::us)),
                              row.value(figures.traffic(Side::peer))});
    }
    return table;
}

FigureTable causes(const calls::Figures& figures) {
    FigureTable table{"causes",
                      "Causes: first of their call, in later messages, and before clearing",
                      {{"cause", "cause", key},
                       {"name", "", text},
                       {"location", "location", key},
                       {"said_by", "said by", key},
                       {"made", "made", text},
                       {"first", "first"},
                       {"later", "later"},
                       {"before", "before"}}};
    for (const auto& [cause, counts] : figures.causes()) {
        const bool standard = cause.codingStandard == 0;
        table.rows.push_back({std::to_string(cause.value),
                              std::string(standard ? isdn::causeName(cause.value) : "of another standard"),
                              std::string(isdn::locationName(cause.location)),
                              std::string(nameOf(cause.from)), std::string(nameOf(cause.made)),
                              std::to_string(counts.first), std::to_string(counts.later),
                              std::to_string(counts.before)});
    }
    if (figures.withoutCause() != 0)
        table.rows.push_back({"none", "", "", "", "", std::to_string(figures.withoutCause()), "", ""});
    return table;
}

FigureTable times(const calls::Figures& figures) {
    FigureTable table{"times",
                      "Times in seconds, by the side that began the call",
                      {{"measure", "", key},
                       {"from", "from", key},
                       {"count", "count"},
                       {"median_s", "median"},
                       {"p95_s", "95 %"},
                       {"worst_s", "worst"},
                       {"mean_s", "mean"},
                       {"meaning", "", text}}};
    for (std::size_t i = 0; i < calls::measures().size(); ++i) {
        for (const Side side : bothSides) {
            const calls::Durations& durations = figures.times(i, side);
            if (durations.count() == 0)
                continue;
            table.rows.push_back({std::string(calls::measures()[i].name), std::string(nameOf(side)),
                                  std::to_string(durations.count()), seconds(durations.quantile(0.5)),
                                  seconds(durations.quantile(0.95)), seconds(durations.longest()),
                                  seconds(durations.mean()), std::string(calls::measures()[i].meaning)});
        }
    }
    return table;
}

FigureTable hours(const calls::Figures& figures, const calls::Occupancy& occupancy) {
    FigureTable table{"hours",
                      "By the hour",
                      {{"hour", "hour", key},
                       {"seizures_us", "seizures us"},
                       {"seizures_peer", "peer"},
                       {"answered_us", "answered us"},
                       {"answered_peer", "peer"},
                       {"failed", "failed"},
                       {"erlangs", "erlangs"}}};
    std::set<calls::HourKey> keys;
    for (const auto& [hour, figure] : figures.hours())
        keys.insert(hour);
    for (const auto& [hour, used] : occupancy.hours())
        keys.insert(hour);
    for (const calls::HourKey& hour : keys) {
        const auto counted = figures.hours().find(hour);
        const calls::HourFigures figure =
            counted == figures.hours().end() ? calls::HourFigures() : counted->second;
        const auto used = occupancy.hours().find(hour);
        const std::int64_t in = used == occupancy.hours().end() ? 0 : used->second;
        table.rows.push_back(
            {instant(hour), std::to_string(figure.seizures[0]), std::to_string(figure.seizures[1]),
             std::to_string(figure.answered[0]), std::to_string(figure.answered[1]),
             std::to_string(figure.failed),
             decimal(static_cast<double>(in) / static_cast<double>(3600 * calls::second), 3)});
    }
    return table;
}

// The channels as ranges of numbers: "1 to 15, 17".
std::string rangesOf(const std::vector<calls::ChannelKey>& channels) {
    std::string text;
    for (std::size_t i = 0; i < channels.size();) {
        std::size_t last = i;
        while (last + 1 < channels.size() && channels[last + 1].interface == channels[i].interface &&
               channels[last + 1].number == channels[last].number + 1)
            ++last;
        text += text.empty() ? "" : ", ";
        text += toString(channels[i]);
        if (last > i)
            text += " to " + std::to_string(channels[last].number);
        i = last + 1;
    }
    return text;
}

// A figure that needs time is absent if no time has passed: the trace has no times, or a single frame.
std::string ifHeard(const calls::Occupancy::Group& group, const std::string& figure) {
    return group.heard > 0 ? figure : std::string();
}

FigureTable trunks(const calls::Occupancy& occupancy, calls::TrunkSize size) {
    FigureTable table{"trunks",
                      "Trunks",
                      {{"dchannel", "D channel", key},
                       {"size", "size", text},
                       {"heard_s", "heard s"},
                       {"peak", "peak"},
                       {"peak_at", "at", text},
                       {"erlangs", "erlangs"},
                       {"unknown", "channel unknown"},
                       {"stuck", "stuck", text},
                       {"never_used", "never used", text}}};
    for (const auto& [number, group] : occupancy.groups()) {
        const calls::TrunkSize its = size == calls::TrunkSize::unknown ? learntSize(group) : size;
        std::vector<calls::ChannelKey> stuck;
        for (const auto& [channel, figure] : group.channels) {
            if (figure.stuck)
                stuck.push_back(channel);
        }
        const std::string at =
            group.mostAt ? textOf({group.mostAt->clock, group.mostAt->time}) : std::string();
        table.rows.push_back({group.dChannels, std::string(nameOf(its)) + (its == size ? "" : ", learnt"),
                              ifHeard(group, seconds(group.heard)), std::to_string(group.most), at,
                              ifHeard(group, decimal(group.erlangs(), 3)), std::to_string(group.unknown),
                              rangesOf(stuck), rangesOf(neverUsed(its, group))});
    }
    return table;
}

FigureTable channels(const calls::Occupancy& occupancy) {
    FigureTable table{"channels",
                      "Channels that calls have named",
                      {{"dchannel", "D channel", key},
                       {"channel", "channel", key},
                       {"calls", "calls"},
                       {"used_s", "used s"},
                       {"erlangs", "erlangs"},
                       {"state", "", text}}};
    for (const auto& [number, group] : occupancy.groups()) {
        for (const auto& [channel, figure] : group.channels) {
            const double erlangs =
                group.heard <= 0 ? 0 : static_cast<double>(figure.used) / static_cast<double>(group.heard);
            std::string_view state = figure.stuck        ? "stuck"
                                     : figure.usedAtEnd  ? "in use at the end"
                                     : figure.calls == 0 ? "asked for only"
                                                         : "";
            table.rows.push_back({group.dChannels, toString(channel), std::to_string(figure.calls),
                                  ifHeard(group, seconds(figure.used)), ifHeard(group, decimal(erlangs, 3)),
                                  std::string(state)});
        }
    }
    return table;
}

}  // namespace

std::vector<FigureTable> figureTables(const calls::Figures& figures, const calls::Occupancy& occupancy,
                                      calls::TrunkSize size) {
    return {messages(figures),         traffic(figures),        causes(figures),    times(figures),
            hours(figures, occupancy), trunks(occupancy, size), channels(occupancy)};
}

}  // namespace reader
