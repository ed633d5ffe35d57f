#include "reader/browse/Browser.h"

#include <algorithm>
#include <iterator>

#include "reader/browse/CallsScreen.h"
#include "reader/browse/FindingsScreen.h"
#include "reader/browse/HelpScreen.h"
#include "reader/browse/TrunkScreen.h"
#include "reader/text.h"

namespace reader::browse {

namespace {

constexpr std::array<std::string_view, 3> tabNames{"Trunk", "Calls", "Findings"};

constexpr std::array everywhere{
    KeyHint{"Tab", "next screen",
            "Goes to the next of trunk, calls and findings; 1, 2 and 3 go to one of them."},
    KeyHint{"Up Down j k", "", "Move the cursor; PgUp, PgDn, Home, End, g and G move it further."},
    KeyHint{"Esc", "back", "Goes back to the screen before, or takes the filter away."},
    KeyHint{"? F1", "", "Shows these lines."},
    KeyHint{"q", "quit", "Goes back; on the first screen, ends the program."},
    KeyHint{"Q", "", "Ends the program."},
};

// Translates the letters that other terminal programs use for arrow keys and the like.
Key translated(const Key& key) {
    using enum Key::Code;
    if (key.is(U'j'))
        return {down};
    if (key.is(U'k'))
        return {up};
    if (key.is(U'g'))
        return {home};
    if (key.is(U'G'))
        return {end};
    if (key.is(U'h'))
        return {left};
    if (key.is(U'?'))
        return {help};
    return key;
}

std::string grouped(std::uint64_t number) {
    std::string text = std::to_string(number);
    constexpr std::size_t three = 3;
    for (std::size_t at = text.size(); at > three;) {
        at -= three;
        text.insert(at, ",");
    }
    return text;
}

}  // namespace

Browser::Browser(Settings settings) : settings_(std::move(settings)), trace_(settings_.mostItems) {
    tabs_ = {std::make_unique<TrunkScreen>(*this), std::make_unique<CallsScreen>(*this),
             std::make_unique<FindingsScreen>(*this)};
}

void Browser::apply(Update update) {
    const Changes changes = trace_.apply(std::move(update));
    for (const auto& tab : tabs_)
        tab->changed(changes);
    for (const auto& screen : opened_)
        screen->changed(changes);
}

bool Browser::work(Screen::Clock::time_point until) { return tabs_[1]->work(until); }

void Browser::open(std::unique_ptr<Screen> screen) { opened_.push_back(std::move(screen)); }

void Browser::save(SaveOrder order) {
    say("writing " + safe(order.path) + " ...");
    settings_.save(trace_.frames(), std::move(order));
}

void Browser::leave() {
    if (opened_.empty())
        isDone_ = true;
    else
        opened_.pop_back();
}

void Browser::showTab(std::size_t tab) {
    opened_.clear();
    tab_ = tab % tabCount;
}

void Browser::press(Key key) {
    said_.clear();
    if (!front().isTyping())
        key = translated(key);
    if (front().isTyping() || !pressEverywhere(key)) {
        const bool isUsed = front().press(key);
        if (!isUsed && key.code == Key::Code::escape && !opened_.empty())
            leave();
    }
    if (key.code == Key::Code::home && opened_.empty() && trace_.frames().gone() != 0)
        say("what came before frame " + grouped(trace_.frames().firstNumber()) +
            " is not in memory any more: --frames N keeps more");
    if (mustClose_ && !opened_.empty())
        opened_.pop_back();
    mustClose_ = false;
}

// Handles the keys that mean the same on every screen. Returns whether this was one of them.
bool Browser::pressEverywhere(const Key& key) {
    if (key.code == Key::Code::click && key.y == 0) {
        for (std::size_t i = 0; i < tabCount; ++i) {
            if (key.x >= tabAt_[i] && key.x < tabAt_[i + 1])
                showTab(i);
        }
        return true;
    }
    if (key.code == Key::Code::help) {
        open(std::make_unique<HelpScreen>(*this, front().keys(), everywhere));
    } else if (key.code == Key::Code::tab) {
        showTab(tab_ + 1);
    } else if (key.code == Key::Code::backTab) {
        showTab(tab_ + tabCount - 1);
    } else if (key.code == Key::Code::character && key.character >= U'1' &&
               key.character < U'1' + static_cast<char32_t>(tabCount)) {
        showTab(key.character - U'1');
    } else if (key.is(U'q')) {
        leave();
    } else if (key.is(U'Q')) {
        isDone_ = true;
    } else {
        return false;
    }
    return true;
}

void Browser::draw(Canvas& canvas) {
    canvas.fill(canvas.whole());
    drawTop(canvas);
    constexpr int top = 2, foot = 1;
    if (canvas.height() > top + foot) {
        const Area area{0, top, canvas.width(), canvas.height() - top - foot};
        front().draw(canvas, area);
        // The last line is the foot's: clear what a screen has drawn there.
        canvas.fill({0, canvas.height() - 1, canvas.width(), 1});
    }
    // The title comes after the screen, because it counts what the screen has drawn.
    canvas.put(0, 1, front().title(), {Ink::title, true});
    drawFoot(canvas);
}

// "live", "reading", and how much there is.
std::string Browser::state() const {
    std::string state = trace_.state() == Update::State::live      ? "live"
                        : trace_.state() == Update::State::reading ? "reading"
                                                                   : "all read";
    if (!trace_.error().empty())
        state = "reading failed";
    state += ", " + grouped(trace_.frames().end()) + " frames";
    if (trace_.frames().gone() != 0)
        state += ", the first " + grouped(trace_.frames().gone()) + " gone";
    return state;
}

void Browser::drawTop(Canvas& canvas) {
    const Style bar{Ink::plain, false, true};
    canvas.fill({0, 0, canvas.width(), 1}, bar);
    int x = 0;
    for (std::size_t i = 0; i < tabCount; ++i) {
        tabAt_[i] = x;
        const bool isFront = i == tab_;
        x = canvas.put(x, 0, (isFront ? "[" : " ") + std::string(tabNames[i]) + (isFront ? "]" : " "),
                       {Ink::plain, isFront, true});
    }
    tabAt_[tabCount] = x;
    const std::string right = state();
    const int at = canvas.width() - columnsOf(right) - 1;
    if (at > x + 1) {
        canvas.put(at, 0, right, bar);
        canvas.put(x + 2, 0, safe(settings_.source), bar, at - 1);
    } else {
        const std::uint64_t gone = trace_.frames().gone();
        canvas.put(x + 1, 0,
                   grouped(trace_.frames().end()) + (gone == 0 ? "" : ", " + grouped(gone) + " gone"), bar);
    }
}

void Browser::drawFoot(Canvas& canvas) const {
    const int y = canvas.height() - 1;
    const std::string& words = !said_.empty() ? said_ : trace_.error();
    if (!words.empty()) {
        canvas.put(0, y, safe(words), {Ink::warning, true});
        return;
    }
    std::vector<KeyHint> hints(front().keys().begin(), front().keys().end());
    // Names as many keys as fit. The keys for help and for going back are always named.
    const std::string_view always = front().isTyping() ? "" : "? help  q back";
    const int end = canvas.width() - columnsOf(always) - 1;
    int x = 0;
    if (!front().isTyping() && opened_.empty())
        hints.insert(hints.empty() ? hints.begin() : std::next(hints.begin()), everywhere[0]);
    for (const KeyHint& hint : hints) {
        const int width = columnsOf(hint.key) + 1 + columnsOf(hint.what);
        if (x + width > end)
            break;
        x = canvas.put(x, y, hint.key, {Ink::plain, true});
        x = canvas.put(x + 1, y, hint.what, {Ink::faint}) + 2;
    }
    const std::string_view last = front().isTyping() ? ""
                                  : opened_.empty()  ? "? help  q quit"
                                                     : "? help  q back";
    canvas.put(std::max(canvas.width() - columnsOf(last), 0), y, last);
}

}  // namespace reader::browse
