#include "reader/browse/CallsScreen.h"

#include <algorithm>
#include <array>

#include "reader/CallLadder.h"
#include "reader/LadderText.h"
#include "reader/browse/CompareScreen.h"
#include "reader/browse/LadderScreen.h"
#include "reader/browse/ListDrawing.h"
#include "reader/browse/SaveScreen.h"
#include "reader/text.h"

namespace reader::browse {

namespace {

constexpr std::array hints{
    KeyHint{"Enter", "ladder", "Shows the call as a ladder; with calls marked, all of them together."},
    KeyHint{"/", "filter",
            "Shows calls only whose lines hold the words that you type. \"!\" in front of a "
            "word: calls that do not. failed, unanswered, open and marked ask for such calls."},
    KeyHint{"s", "sort", "Sorts by start, duration, connect, response, cause, channel in turn."},
    KeyHint{"Space", "mark", "Marks the call, or takes the mark away."},
    KeyHint{"c", "compare", "Shows two marked calls side by side."},
    KeyHint{"w", "save", "Writes the frames of what is marked, or of this call, into a pcapng file."},
    KeyHint{"u", "unmark", "Takes all marks away."},
};

constexpr std::array typingHints{
    KeyHint{"Enter", "keep the filter", "Ends the filter; letters are keys again."},
    KeyHint{"Esc", "no filter", "Takes the filter away."},
    KeyHint{"Up Down", "move", "Move the cursor."},
};

// The columns, the most important first: the screen shows as many as it has room for. Below: how wide the
// columns are whose texts may have any length.
constexpr std::array<std::string_view, 13> byImportance{
    "call", "start",    "calling > called", "outcome", "cleared by: cause", "channel",
    "dir",  "duration", "connect",          "alert",   "respond",           "ref",
    "flags"};
constexpr int roomForText = 20;
constexpr int timeWidth = 12;
constexpr int datedWidth = 110;  // screens of at least this width show dates

const CallLineColumn& columnNamed(std::string_view heading) {
    return *std::find_if(callLineColumns().begin(), callLineColumns().end(),
                         [&](const CallLineColumn& column) { return column.heading == heading; });
}

bool isStart(const CallLineColumn& column) { return column.heading == "start"; }

int widthOf(const CallLineColumn& column, bool hasDates) {
    if (isStart(column) && !hasDates)
        return timeWidth;
    return column.width == 0 ? roomForText : static_cast<int>(column.width);
}

std::vector<const CallLineColumn*> columnsFor(int width, bool hasDates) {
    std::vector<const CallLineColumn*> chosen;
    for (const std::string_view heading : byImportance) {
        const CallLineColumn& column = columnNamed(heading);
        const int needed = widthOf(column, hasDates) + (chosen.empty() ? 0 : 1);
        if (needed > width)
            continue;
        width -= needed;
        chosen.push_back(&column);
    }
    std::sort(chosen.begin(), chosen.end());  // in the order of the table
    return chosen;
}

}  // namespace

std::string CallsScreen::title() const {
    std::string title = "Calls: " + std::to_string(list_.size());
    if (!list_.filter().empty() || isTyping_)
        title += " of " + std::to_string(trace().calls().size());
    if (list_.order() != 0)
        title += ", by " + std::string(callOrders()[list_.order()].name);
    if (!desk().marked().calls.empty())
        title += ", " + std::to_string(desk().marked().calls.size()) + " marked";
    if (trace().callsDropped() != 0)
        title +=
            ", let go before their end, since too many were alive: " + std::to_string(trace().callsDropped());
    if (isTyping_)
        title += "   /" + input_.text() + "_";
    else if (!list_.filter().empty())
        title += "   /" + list_.filter();
    return title;
}

std::span<const KeyHint> CallsScreen::keys() const {
    return isTyping_ ? std::span<const KeyHint>(typingHints) : hints;
}

void CallsScreen::changed(const Changes& changes) { list_.changed(changes); }

bool CallsScreen::work(Clock::time_point until) { return list_.work(until); }

std::uint64_t CallsScreen::current() const {
    return cursor_.line() < list_.size() ? list_[cursor_.line()] : 0;
}

void CallsScreen::keepPlace() {
    if (list_.size() == 0)
        return;
    if (followsEnd_)
        cursor_.moveTo(list_.size() - 1);
    else if (const auto place = list_.find(current_); place)
        cursor_.moveTo(*place);
}

void CallsScreen::goTo(std::uint64_t call) {
    if (!list_.filter().empty())
        setFilter("");
    current_ = call;
    followsEnd_ = false;
}

void CallsScreen::draw(Canvas& canvas, const Area& area) {
    hasDates_ = area.width >= datedWidth;
    columns_ = columnsFor(area.width - gutter, hasDates_);
    keepPlace();
    std::vector<std::string> details;
    Area list = area;
    const calls::Call* const here = trace().call(current());
    if (here != nullptr)
        details = wrapped(callWords(*here, desk().times()), static_cast<std::size_t>(area.width));
    constexpr int mostDetails = 4, leastLines = 8;
    list = drawDetails(canvas, list, details, mostDetails, leastLines, desk().hasUtf8());
    int x = list.x + gutter;
    for (const CallLineColumn* const column : columns_) {
        std::string heading(column->heading);
        padTo(heading, 0, static_cast<std::size_t>(widthOf(*column, hasDates_)), column->right);
        x = canvas.put(x, list.y, heading, {Ink::title, true}) + 1;
    }
    listTop_ = list.y + 1;
    list = {list.x, listTop_, list.width, list.height - 1};
    cursor_.fit(list_.size(), list.height);
    for (int i = 0; i < list.height && cursor_.top() + static_cast<std::size_t>(i) < list_.size(); ++i) {
        const std::size_t line = cursor_.top() + static_cast<std::size_t>(i);
        const calls::Call* const call = trace().call(list_[line]);
        if (call == nullptr)
            continue;
        const bool isCurrent = line == cursor_.line();
        drawLine(canvas, list, list.y + i, *call,
                 {calls::hasFailed(*call) ? Ink::error : Ink::plain, false, isCurrent});
        drawGutter(canvas, list, i, isCurrent, desk().marked().calls.contains(call->number));
    }
    if (list_.size() == 0)
        canvas.put(list.x + gutter, list.y, list_.filter().empty() ? "no calls yet" : "no call matches");
}

void CallsScreen::drawLine(Canvas& canvas, const Area& area, int y, const calls::Call& call, Style style) {
    canvas.fill({area.x + gutter, y, area.width - gutter, 1}, style);
    int x = area.x + gutter;
    for (const CallLineColumn* const column : columns_) {
        std::string text;
        if (isStart(*column) && !hasDates_)
            text = timeOfDay({call.begin.clock, call.begin.time}, desk().times());
        else
            column->put(text, call, desk().times());
        const int width = widthOf(*column, hasDates_);
        padTo(text, 0, static_cast<std::size_t>(width), column->right);
        const bool isLast = column == columns_.back();
        canvas.put(x, y, text, style, isLast ? area.x + area.width : x + width);
        x += width + 1;
    }
}

bool CallsScreen::press(const Key& key) {
    if (isTyping_ && key.code != Key::Code::up && key.code != Key::Code::down) {
        pressTyping(key);
        return true;
    }
    if (cursor_.press(key)) {
        current_ = current();
        followsEnd_ = cursor_.isAtEnd();
        return true;
    }
    if (key.code == Key::Code::click || key.code == Key::Code::doubleClick) {
        if (key.y >= listTop_) {
            cursor_.moveTo(cursor_.top() + static_cast<std::size_t>(key.y - listTop_));
            cursor_.fit(list_.size(), 1 << 20);
            current_ = current();
            followsEnd_ = false;
        }
        if (key.code == Key::Code::doubleClick)
            openLadder();
        return true;
    }
    if (key.code == Key::Code::escape && !list_.filter().empty()) {
        setFilter("");
        return true;
    }
    if (key.code == Key::Code::enter) {
        openLadder();
    } else if (key.is(U'/')) {
        isTyping_ = true;
        input_.set(list_.filter());
    } else if (key.is(U's')) {
        current_ = current();
        list_.setOrder(list_.order() + 1);
    } else if (key.is(U' ')) {
        auto& marked = desk().marked().calls;
        if (const std::uint64_t call = current(); call != 0 && marked.erase(call) == 0)
            marked.insert(call);
        cursor_.press({Key::Code::down});
        current_ = current();
    } else if (key.is(U'u')) {
        desk().marked() = {};
    } else if (key.is(U'c')) {
        compare();
    } else if (key.is(U'w')) {
        if (const calls::Call* const call = trace().call(current()); call != nullptr)
            desk().open(std::make_unique<SaveScreen>(desk(), Marked{{call->number}, {}}));
    } else {
        return false;
    }
    return true;
}

void CallsScreen::pressTyping(const Key& key) {
    if (key.code == Key::Code::enter) {
        isTyping_ = false;
    } else if (key.code == Key::Code::escape) {
        isTyping_ = false;
        setFilter("");
    } else if (input_.press(key)) {
        setFilter(input_.text());
    }
}

void CallsScreen::setFilter(const std::string& words) {
    current_ = current();
    list_.setFilter(words);
}

void CallsScreen::openLadder() {
    std::vector<std::uint64_t> calls(desk().marked().calls.begin(), desk().marked().calls.end());
    if (calls.empty() && current() != 0)
        calls.push_back(current());
    if (!calls.empty())
        desk().open(std::make_unique<LadderScreen>(desk(), calls));
}

void CallsScreen::compare() {
    const auto& marked = desk().marked().calls;
    constexpr std::size_t two = 2;
    if (marked.size() != two) {
        desk().say("mark two calls with Space, then press c");
        return;
    }
    desk().open(CompareScreen::ofCalls(desk(), *marked.begin(), *marked.rbegin()));
}

}  // namespace reader::browse
