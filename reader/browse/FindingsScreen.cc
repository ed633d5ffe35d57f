#include "reader/browse/FindingsScreen.h"

#include <algorithm>

#include "reader/FindingText.h"
#include "reader/LadderText.h"
#include "reader/browse/LadderScreen.h"
#include "reader/browse/ListDrawing.h"
#include "reader/browse/MessageScreen.h"
#include "reader/text.h"

namespace reader::browse {

namespace {

using calls::Severity;

constexpr std::array hints{
    KeyHint{"Enter", "frame", "Shows the frame that the finding belongs to."},
    KeyHint{"l", "ladder", "Shows the call that the finding is about."},
    KeyHint{"v", "level", "Shows all findings, warnings and errors, or errors alone."},
};

constexpr std::size_t severityWidth = 7;

}  // namespace

std::string FindingsScreen::title() const {
    std::string title = "Findings: ";
    for (const Severity severity : {Severity::error, Severity::warning, Severity::note}) {
        const std::size_t count = counts_[static_cast<std::size_t>(severity)];
        title += (severity == Severity::error ? "" : ", ") + std::to_string(count) + " " +
                 std::string(calls::nameOf(severity)) + (count == 1 ? "" : "s");
    }
    if (least_ != Severity::note)
        title += least_ == Severity::error ? "; only errors are shown" : "; notes are not shown";
    return title;
}

std::span<const KeyHint> FindingsScreen::keys() const { return hints; }

void FindingsScreen::changed(const Changes& changes) { isStale_ = isStale_ || changes.findings; }

void FindingsScreen::choose() {
    shown_.clear();
    counts_ = {};
    std::uint64_t number = trace().firstFinding();
    for (const calls::Finding& finding : trace().findings()) {
        ++counts_[static_cast<std::size_t>(finding.severity)];
        if (finding.severity >= least_)
            shown_.push_back(number);
        ++number;
    }
    isStale_ = false;
}

const calls::Finding* FindingsScreen::at(std::size_t line) const {
    if (line >= shown_.size() || shown_[line] < trace().firstFinding())
        return nullptr;
    return &trace().findings()[shown_[line] - trace().firstFinding()];
}

void FindingsScreen::draw(Canvas& canvas, const Area& area) {
    if (isStale_)
        choose();
    if (followsEnd_ && !shown_.empty())
        cursor_.moveTo(shown_.size() - 1);
    else
        cursor_.moveTo(static_cast<std::size_t>(std::lower_bound(shown_.begin(), shown_.end(), current_) -
                                                shown_.begin()));
    cursor_.fit(shown_.size(), area.height);
    std::vector<std::string> details;
    if (const calls::Finding* const here = at(cursor_.line()); here != nullptr) {
        std::string happening, meaning;
        appendHappening(happening, *here, desk().times());
        appendMeaning(meaning, *here);
        const auto width = static_cast<std::size_t>(area.width);
        details = wrapped({happening}, width);
        for (std::string& line : wrapped({meaning}, width))
            details.push_back(std::move(line));
    }
    constexpr int mostDetails = 6, leastLines = 5;
    const Area list = drawDetails(canvas, area, details, mostDetails, leastLines, desk().hasUtf8());
    cursor_.fit(shown_.size(), list.height);
    top_ = list.y;
    for (int i = 0; i < list.height; ++i) {
        const std::size_t line = cursor_.top() + static_cast<std::size_t>(i);
        const calls::Finding* const finding = at(line);
        if (finding == nullptr)
            break;
        const bool isCurrent = line == cursor_.line();
        const Style style{inkOf(finding->severity), false, isCurrent};
        std::string text(calls::nameOf(finding->severity));
        padTo(text, 0, severityWidth);
        text += ' ';
        appendHappening(text, *finding, desk().times());
        canvas.fill({list.x + gutter, list.y + i, list.width - gutter, 1}, style);
        canvas.put(list.x + gutter, list.y + i, text, style);
        drawGutter(canvas, list, i, isCurrent, desk().marked().frames.contains(finding->frame));
    }
    if (shown_.empty())
        canvas.put(list.x + gutter, list.y, "nothing is wrong so far");
}

bool FindingsScreen::press(const Key& key) {
    const bool isClick = key.code == Key::Code::click || key.code == Key::Code::doubleClick;
    if (isClick && key.y >= top_) {
        cursor_.moveTo(cursor_.top() + static_cast<std::size_t>(key.y - top_));
        cursor_.fit(shown_.size(), 1 << 20);
    }
    if (isClick || cursor_.press(key)) {
        current_ = cursor_.line() < shown_.size() ? shown_[cursor_.line()] : 0;
        followsEnd_ = !isClick && cursor_.isAtEnd();
        if (key.code == Key::Code::doubleClick)
            openFrame();
        return true;
    }
    if (key.code == Key::Code::enter) {
        openFrame();
    } else if (key.is(U'l')) {
        const calls::Finding* const here = at(cursor_.line());
        if (here != nullptr && here->call)
            desk().open(std::make_unique<LadderScreen>(desk(), std::vector{*here->call}));
        else
            desk().say("this finding is about no call");
    } else if (key.is(U'v')) {
        least_ = least_ == Severity::note      ? Severity::warning
                 : least_ == Severity::warning ? Severity::error
                                               : Severity::note;
        isStale_ = true;
    } else {
        return false;
    }
    return true;
}

void FindingsScreen::openFrame() {
    if (const calls::Finding* const here = at(cursor_.line()); here != nullptr)
        desk().open(std::make_unique<MessageScreen>(desk(), here->frame, std::vector<std::uint64_t>()));
}

}  // namespace reader::browse
