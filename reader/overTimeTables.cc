#include "reader/overTimeTables.h"

#include "reader/TimeText.h"
#include "reader/text.h"

namespace reader {

namespace {

using enum FigureColumn::Kind;

std::string instant(const calls::Moment& moment) { return textOf({moment.clock, moment.time}); }

void appendUse(FigureTable& table, const std::string& dChannels, const calls::UseOverTime& use) {
    const std::string width = std::to_string(use.width() / calls::second);
    auto expected = calls::UseOverTime::Key();
    for (const auto& [key, step] : use.steps()) {
        // Steps in which nothing was in use are not kept.
        if (key.clock != expected.clock)
            expected = key;
        for (; expected <= key; ++expected.step) {
            const bool isKept = expected == key;
            const double mean =
                isKept ? static_cast<double>(step.used) / static_cast<double>(use.width()) : 0;
            table.rows.push_back({dChannels,
                                  instant({.clock = key.clock, .time = expected.step * use.width()}), width,
                                  decimal(mean, 3), std::to_string(isKept ? step.most : 0)});
        }
    }
}

FigureTable use(const calls::Occupancy& occupancy) {
    FigureTable table{"use",
                      "Channels in use over time: on average of a step, and at once",
                      {{"dchannel", "D channel", key},
                       {"from", "from", key},
                       {"seconds", "seconds"},
                       {"mean", "mean"},
                       {"most", "most"}}};
    for (const auto& [number, group] : occupancy.groups())
        appendUse(table, group.dChannels, group.overTime);
    return table;
}

FigureTable links(const calls::LinkHistory& history) {
    FigureTable table{"links",
                      "Links, as they are at the end of the trace",
                      {{"dchannel", "D channel", key},
                       {"tei", "TEI", key},
                       {"state", "state", text},
                       {"since", "since", text},
                       {"at_least", "at least since", text},
                       {"ups", "set up"},
                       {"downs", "ended"}}};
    for (const auto& [link, standing] : history.links()) {
        // A state whose beginning is not in the trace has lasted longer than the trace shows.
        const bool isSeen = standing.state != calls::LinkState::up || standing.sawSetUp;
        const std::string since = instant(standing.since);
        table.rows.push_back({link.first, std::to_string(link.second), std::string(nameOf(standing.state)),
                              isSeen ? since : "", isSeen ? "" : since, std::to_string(standing.ups),
                              std::to_string(standing.downs)});
    }
    return table;
}

FigureTable linkEvents(const calls::LinkHistory& history) {
    FigureTable table{"link_events",
                      "Link events",
                      {{"time", "time", key},
                       {"dchannel", "D channel", key},
                       {"tei", "TEI", key},
                       {"frame", "frame"},
                       {"from", "from", text},
                       {"event", "event", key}}};
    for (const calls::LinkHistory::Entry& entry : history.entries()) {
        const std::string from = !entry.from ? "" : *entry.from == calls::Side::us ? "us" : "peer";
        table.rows.push_back({instant(entry.moment), entry.dChannel,
                              entry.tei ? std::to_string(*entry.tei) : "", std::to_string(entry.moment.frame),
                              from, std::string(nameOf(entry.news))});
    }
    return table;
}

}  // namespace

std::vector<FigureTable> overTimeTables(const calls::Occupancy& occupancy,
                                        const calls::LinkHistory& history) {
    return {use(occupancy), links(history), linkEvents(history)};
}

}  // namespace reader
