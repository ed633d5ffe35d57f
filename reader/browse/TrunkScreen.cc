#include "reader/browse/TrunkScreen.h"

#include <algorithm>
#include <array>

#include "reader/FindingText.h"
#include "reader/LadderText.h"
#include "reader/browse/ListDrawing.h"
#include "reader/browse/MessageScreen.h"
#include "reader/text.h"

namespace reader::browse {

namespace {

using calls::Use;

constexpr std::array hints{
    KeyHint{"Enter", "frame", "Shows the frame of the finding under the cursor."},
};

constexpr int cellWidth = 3;
constexpr std::size_t lastFindings = 20;

// How a cell looks, and what the legend says of it.
struct Sign {
    Use use;
    std::optional<calls::Side> by;
    std::string_view sign;
    Style style;
};
const std::array signs{
    Sign{Use::idle, {}, ".", {}},
    Sign{Use::setUp, {}, "s", {Ink::note, true}},
    Sign{Use::talking, {}, "T", {Ink::ours, true}},
    Sign{Use::clearing, {}, "c", {Ink::note}},
    Sign{Use::held, {}, "h", {Ink::theirs}},
    Sign{Use::outOfService, calls::Side::us, "X", {Ink::error, true}},
    Sign{Use::outOfService, calls::Side::peer, "x", {Ink::error, true}},
    Sign{Use::outOfService, {}, "?", {Ink::error, true}},
    Sign{Use::restarting, {}, "R", {Ink::warning, true}},
    Sign{Use::dChannel, {}, "D", {Ink::faint}},
    Sign{Use::neverSeen, {}, "-", {Ink::faint}},
};

const Sign& signOf(const calls::ChannelCell& cell) {
    return *std::find_if(signs.begin(), signs.end(), [&](const Sign& sign) {
        return sign.use == cell.use && (cell.use != Use::outOfService || sign.by == cell.by);
    });
}

std::string_view nameOf(capture::Role role) {
    return role == capture::Role::user      ? "our side is the user"
           : role == capture::Role::network ? "our side is the network"
                                            : "our side's role is not known yet";
}

Style styleOf(calls::LinkState state) {
    switch (state) {
        case calls::LinkState::up:
            return {Ink::ours, true};
        case calls::LinkState::down:
            return {Ink::error, true};
        default:
            return {Ink::warning, true};
    }
}

}  // namespace

std::string TrunkScreen::title() const {
    const std::size_t count = trace().trunks().size();
    return count == 1 ? "1 D channel" : std::to_string(count) + " D channels";
}

std::span<const KeyHint> TrunkScreen::keys() const { return hints; }

void TrunkScreen::build(int width) {
    lines_.clear();
    usesShown_ = 0;
    for (const TrunkView& trunk : trace().trunks())
        putTrunk(trunk, width);
    putLegend(width);
    putFindings(width);
}

void TrunkScreen::putTrunk(const TrunkView& trunk, int width) {
    putLine(safe(trunk.dChannel) + "  " + std::string(nameOf(trunk.role)), {Ink::title, true});
    for (const LinkView& link : trunk.links) {
        std::string since =
            link.state == calls::LinkState::up && !link.sawSetUp ? " at least since " : " since ";
        desk().times().append(since, link.since);
        if (link.since.clock == capture::Clock::none || link.state == calls::LinkState::unknown)
            since.clear();
        lines_.push_back({{{"  link, TEI " + std::to_string(link.tei) + ": ", {}},
                           {std::string(calls::nameOf(link.state)), styleOf(link.state)},
                           {since, {}}}});
    }
    const auto aMinute = [](std::uint64_t count, std::string_view what) {
        return "  " + std::to_string(count) + " " + std::string(what) + (count == 1 ? "" : "s");
    };
    putLine(aMinute(trunk.framesAMinute, "frame") + "," + aMinute(trunk.callsAMinute, "call").substr(1) +
            " in the last minute");
    for (const calls::CellRow& row : trunk.cells)
        putCells(row, width);
    putLine("");
}

void TrunkScreen::putCells(const calls::CellRow& row, int width) {
    const auto used = std::count_if(row.cells.begin(), row.cells.end(),
                                    [](const calls::ChannelCell& cell) { return cell.call != 0; });
    std::string heading = "  channels";
    if (row.interface)
        heading += " of interface " + std::to_string(*row.interface);
    const bool isKnown = row.size != calls::TrunkSize::unknown;
    heading += ": " + (isKnown ? std::string(nameOf(row.size)) : "size not known");
    if (row.isLearnt && isKnown)
        heading += ", learnt";
    putLine(heading + ", " + std::to_string(used) + " in use");
    const auto inLine = static_cast<std::size_t>(std::max((width - 2) / cellWidth, 1));
    for (std::size_t begin = 0; begin < row.cells.size(); begin += inLine) {
        Line numbers{{{"  ", {}}}}, cells{{{"  ", {}}}};
        for (std::size_t i = begin; i < std::min(begin + inLine, row.cells.size()); ++i) {
            const Sign& sign = signOf(row.cells[i]);
            usesShown_ |= 1U << static_cast<unsigned>(&sign - signs.data());
            std::string number = std::to_string(row.cells[i].channel.number);
            padTo(number, 0, cellWidth - 1, true);
            numbers.pieces.push_back({number + " ", {Ink::faint}});
            cells.pieces.push_back({" " + std::string(sign.sign) + " ", sign.style});
        }
        lines_.push_back(std::move(numbers));
        lines_.push_back(std::move(cells));
    }
}

void TrunkScreen::putLegend(int width) {
    std::vector<std::string> items;
    for (std::size_t i = 0; i < signs.size(); ++i) {
        if ((usesShown_ & 1U << i) == 0)
            continue;
        std::string item = std::string(signs[i].sign) + " " + std::string(calls::nameOf(signs[i].use));
        if (signs[i].by)
            item += *signs[i].by == calls::Side::us ? " by us" : " by the peer";
        items.push_back(std::move(item));
    }
    if (items.empty())
        return;
    for (const std::string& line : wrapped(items, static_cast<std::size_t>(std::max(width - 2, 1))))
        putLine("  " + line, {Ink::faint});
    putLine("");
}

void TrunkScreen::putFindings(int width) {
    putLine("Last findings", {Ink::title, true});
    const auto& findings = trace().findings();
    if (findings.empty())
        putLine("  nothing is wrong so far");
    std::size_t left = lastFindings;
    for (auto each = findings.rbegin(); each != findings.rend() && left > 0; ++each, --left) {
        std::string text = "  " + std::string(calls::nameOf(each->severity)) + " ";
        appendHappening(text, *each, desk().times());
        text.resize(std::min(text.size(), static_cast<std::size_t>(width)));
        lines_.push_back({{{std::move(text), {inkOf(each->severity)}}}, each->frame});
    }
}

void TrunkScreen::draw(Canvas& canvas, const Area& area) {
    build(area.width - 1);
    cursor_.fit(lines_.size(), area.height);
    top_ = area.y;
    for (int i = 0; i < area.height && cursor_.top() + static_cast<std::size_t>(i) < lines_.size(); ++i) {
        const std::size_t at = cursor_.top() + static_cast<std::size_t>(i);
        int x = area.x + 1;
        for (const Piece& piece : lines_[at].pieces) {
            Style style = piece.style;
            style.reverse = at == cursor_.line() && lines_[at].frame.has_value();
            x = canvas.put(x, area.y + i, piece.text, style);
        }
        canvas.put(area.x, area.y + i, at == cursor_.line() ? ">" : " ", {Ink::plain, true});
    }
    if (trace().trunks().empty())
        canvas.put(area.x + 1, area.y, "no frames yet");
}

bool TrunkScreen::press(const Key& key) {
    if (cursor_.press(key))
        return true;
    const bool isClick = key.code == Key::Code::click || key.code == Key::Code::doubleClick;
    if (isClick && key.y >= top_)
        cursor_.moveTo(cursor_.top() + static_cast<std::size_t>(key.y - top_));
    if (key.code == Key::Code::enter || key.code == Key::Code::doubleClick) {
        if (cursor_.line() < lines_.size() && lines_[cursor_.line()].frame)
            desk().open(std::make_unique<MessageScreen>(desk(), *lines_[cursor_.line()].frame,
                                                        std::vector<std::uint64_t>()));
        return true;
    }
    return isClick;
}

}  // namespace reader::browse
