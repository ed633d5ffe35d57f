#include "reader/browse/LadderScreen.h"

#include <algorithm>
#include <array>
#include <set>

#include "reader/browse/CompareScreen.h"
#include "reader/browse/ListDrawing.h"
#include "reader/browse/MessageScreen.h"
#include "reader/browse/SaveScreen.h"

namespace reader::browse {

namespace {

constexpr std::array hints{
    KeyHint{"Enter", "message", "Shows the message, field by field beside its octets."},
    KeyHint{"Space", "mark", "Marks the message, or takes the mark away."},
    KeyHint{"c", "compare", "Shows two marked messages side by side."},
    KeyHint{"w", "save", "Writes what is marked, or the frames of this ladder, into a pcapng file."},
    KeyHint{"u", "unmark", "Takes all marks away."},
};

Style styleOf(const Rung& rung) {
    if (rung.kind == Rung::Kind::words)
        return {Ink::warning};
    return {rung.from == calls::Side::us ? Ink::ours : Ink::theirs};
}

}  // namespace

LadderScreen::LadderScreen(Desk& desk, std::vector<std::uint64_t> calls)
    : Screen(desk), calls_(std::move(calls)) {}

std::string LadderScreen::title() const {
    std::string title = calls_.size() == 1 ? "Ladder of call" : "Ladder of calls";
    constexpr std::size_t named = 8;
    for (std::size_t i = 0; i < std::min(calls_.size(), named); ++i)
        title += (i == 0 ? " " : ", ") + std::to_string(calls_[i]);
    if (calls_.size() > named)
        title += ", ...";
    if (!desk().marked().frames.empty())
        title += ", " + std::to_string(desk().marked().frames.size()) + " messages marked";
    return title;
}

std::span<const KeyHint> LadderScreen::keys() const { return hints; }

void LadderScreen::changed(const Changes& changes) {
    const auto isOurs = [&](std::uint64_t call) {
        return std::find(calls_.begin(), calls_.end(), call) != calls_.end();
    };
    if (std::any_of(changes.calls.begin(), changes.calls.end(), isOurs))
        builtFor_ = 0;
}

void LadderScreen::build(int width) {
    const bool wasAtEnd = builtFor_ != 0 && cursor_.isAtEnd() && ladder_.rungs.size() > 1;
    std::vector<CallLadder> ladders;
    for (const std::uint64_t number : calls_) {
        if (const calls::Call* const call = trace().call(number); call != nullptr)
            ladders.push_back(trace().ladderOf(*call, desk().times()));
    }
    if (!ladders.empty() || ladder_.rungs.empty())
        ladder_ = together(std::move(ladders), calls_);
    LadderTextForm form;
    form.width = static_cast<unsigned>(width);
    form.least = LadderTextForm::leastWidth - gutter;
    form.utf8 = desk().hasUtf8();
    lines_ = ladderLines(ladder_, form, desk().times());
    builtFor_ = width;
    cursor_.fit(ladder_.rungs.size(), 1 << 20);
    if (wasAtEnd)
        cursor_.press({Key::Code::end});
}

const Rung* LadderScreen::current() const {
    return cursor_.line() < ladder_.rungs.size() ? &ladder_.rungs[cursor_.line()] : nullptr;
}

std::size_t LadderScreen::rungAt(std::size_t line) const {
    const auto after = std::upper_bound(lines_.rungs.begin(), lines_.rungs.end(), line);
    return static_cast<std::size_t>(after - lines_.rungs.begin());  // 0: none; else the rung plus one
}

void LadderScreen::draw(Canvas& canvas, const Area& area) {
    if (builtFor_ != area.width - gutter)
        build(area.width - gutter);
    const auto height = static_cast<std::size_t>(area.height);
    const std::size_t rung = cursor_.line();
    const std::size_t first = rung < lines_.rungs.size() ? lines_.rungs[rung] : 0;
    const std::size_t last = rung + 1 < lines_.rungs.size() ? lines_.rungs[rung + 1] - 1 : first;
    top_ = rung == 0 ? 0 : std::min(top_, first);
    if (last >= top_ + height)
        top_ = last + 1 - height;
    textTop_ = area.y;
    for (std::size_t i = 0; i < height && top_ + i < lines_.lines.size(); ++i) {
        const std::size_t line = top_ + i;
        const int y = area.y + static_cast<int>(i);
        const std::size_t of = rungAt(line);
        const bool isFirst = of != 0 && lines_.rungs[of - 1] == line;
        Style style = of == 0 ? Style{Ink::title, true} : styleOf(ladder_.rungs[of - 1]);
        style.reverse = of == rung + 1;
        if (style.reverse)
            canvas.fill({area.x + gutter, y, area.width - gutter, 1}, style);
        canvas.put(area.x + gutter, y, lines_.lines[line], style);
        if (isFirst)
            drawGutter(canvas, area, static_cast<int>(i), of == rung + 1,
                       desk().marked().frames.contains(ladder_.rungs[of - 1].frame) &&
                           ladder_.rungs[of - 1].kind != Rung::Kind::words);
    }
    if (ladder_.rungs.empty())
        canvas.put(area.x + gutter, area.y + 1, "the frames of this call are not in memory any more");
}

bool LadderScreen::press(const Key& key) {
    if (cursor_.press(key))
        return true;
    if (key.code == Key::Code::click || key.code == Key::Code::doubleClick) {
        if (key.y >= textTop_) {
            if (const std::size_t rung = rungAt(top_ + static_cast<std::size_t>(key.y - textTop_)); rung != 0)
                cursor_.moveTo(rung - 1);
        }
        if (key.code == Key::Code::doubleClick)
            openMessage();
        return true;
    }
    auto& marked = desk().marked().frames;
    if (key.code == Key::Code::enter) {
        openMessage();
    } else if (key.is(U' ')) {
        const Rung* const rung = current();
        if (rung != nullptr && rung->kind != Rung::Kind::words && marked.erase(rung->frame) == 0)
            marked.insert(rung->frame);
        cursor_.press({Key::Code::down});
    } else if (key.is(U'u')) {
        desk().marked() = {};
    } else if (key.is(U'c')) {
        openComparison();
    } else if (key.is(U'w')) {
        desk().open(std::make_unique<SaveScreen>(desk(), Marked{{calls_.begin(), calls_.end()}, {}}));
    } else {
        return false;
    }
    return true;
}

void LadderScreen::openMessage() {
    const Rung* const here = current();
    if (here == nullptr || here->kind == Rung::Kind::words)
        return;
    std::vector<std::uint64_t> frames;
    for (const Rung& rung : ladder_.rungs) {
        if (rung.kind != Rung::Kind::words)
            frames.push_back(rung.frame);
    }
    desk().open(std::make_unique<MessageScreen>(desk(), here->frame, std::move(frames)));
}

void LadderScreen::openComparison() {
    const auto& marked = desk().marked().frames;
    constexpr std::size_t two = 2;
    if (marked.size() != two) {
        desk().say("mark two messages with Space, then press c");
        return;
    }
    desk().open(CompareScreen::ofMessages(desk(), *marked.begin(), *marked.rbegin()));
}

}  // namespace reader::browse
