#include "calls/Cells.h"

#include <array>
#include <map>

namespace calls {

namespace {

using Cells = std::map<ChannelKey, ChannelCell>;

constexpr std::uint32_t dChannelOfE1 = 16;
constexpr std::uint32_t dChannelOfT1 = 24;

Use useOf(Phase phase) {
    switch (phase) {
        case Phase::setUp:
            return Use::setUp;
        case Phase::talking:
            return Use::talking;
        case Phase::clearing:
            return Use::clearing;
        case Phase::held:
            return Use::held;
        case Phase::ended:
            break;
    }
    return Use::idle;
}

// Calls that have not ended, on the channels that they have or ask for. A call on hold leaves its channel to
// another.
void putCalls(std::map<std::uint32_t, Cells>& groups, const Analysis& analysis) {
    for (const Call* const call : analysis.open()) {
        const Use use = useOf(call->phase);
        if (call->kind != Kind::call || use == Use::idle)
            continue;
        for (const ChannelKey& key : channelsOf(call->held())) {
            ChannelCell& cell = groups[call->group].try_emplace(key, ChannelCell{key}).first->second;
            if (use == Use::held && cell.call != 0)
                continue;
            cell.use = use;
            cell.call = call->number;
        }
    }
}

// Marks the channels that are being restarted, and those that are out of service and that no call has.
void putService(Cells& cells, std::uint32_t group, const Analysis& analysis) {
    for (auto& [key, cell] : cells) {
        const ChannelService service = analysis.serviceOf(group, key);
        if (service.restarting) {
            cell.use = Use::restarting;
        } else if (cell.call == 0 && service.service != Service::in) {
            cell.use = Use::outOfService;
            cell.by = service.blockedBy;
        }
    }
}

void putDChannel(Cells& cells, std::optional<std::uint32_t> interface, TrunkSize size) {
    const std::uint32_t number = size == TrunkSize::e1   ? dChannelOfE1
                                 : size == TrunkSize::t1 ? dChannelOfT1
                                                         : 0;
    const ChannelKey key{interface, number};
    if (number != 0)
        cells.try_emplace(key, ChannelCell{key, Use::dChannel});
}

void appendRows(std::vector<CellRow>& rows, Cells& cells, const CellRow& like) {
    for (const auto& [key, cell] : cells) {
        if (rows.empty() || rows.back().group != like.group || rows.back().interface != key.interface) {
            rows.push_back(like);
            rows.back().interface = key.interface;
        }
        rows.back().cells.push_back(cell);
    }
}

}  // namespace

std::string_view nameOf(Use use) {
    constexpr std::array<std::string_view, 9> names{"idle",       "set-up",    "talking",
                                                    "clearing",   "held",      "out of service",
                                                    "restarting", "D channel", "never seen"};
    return names[static_cast<std::size_t>(use)];
}

std::vector<CellRow> cellRows(const Analysis& analysis, const Occupancy& occupancy, TrunkSize size) {
    std::map<std::uint32_t, Cells> groups;
    for (const auto& [number, group] : occupancy.groups()) {
        for (const auto& [key, channel] : group.channels)
            groups[number].try_emplace(key, ChannelCell{key});
    }
    putCalls(groups, analysis);
    std::vector<CellRow> rows;
    for (auto& [number, cells] : groups) {
        const auto known = occupancy.groups().find(number);
        if (known == occupancy.groups().end())
            continue;
        CellRow like;
        like.group = number;
        like.isLearnt = size == TrunkSize::unknown;
        like.size = like.isLearnt ? learntSize(known->second) : size;
        std::map<std::optional<std::uint32_t>, bool> interfaces;
        for (const auto& [key, cell] : cells)
            interfaces[key.interface] = true;
        for (const ChannelKey& key : neverUsed(like.size, known->second)) {
            const auto [cell, isNew] = cells.try_emplace(key, ChannelCell{key, Use::neverSeen});
            if (!isNew && cell->second.call == 0)
                cell->second.use = Use::neverSeen;
        }
        for (const auto& [interface, there] : interfaces)
            putDChannel(cells, interface, like.size);
        putService(cells, number, analysis);
        appendRows(rows, cells, like);
    }
    return rows;
}

}  // namespace calls
