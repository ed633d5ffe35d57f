#include "reader/browse/CompareScreen.h"

#include <algorithm>
#include <array>

#include "reader/browse/ListDrawing.h"
#include "reader/text.h"

namespace reader::browse {

namespace {

using Row = CompareScreen::Row;
using Part = ComparedMessage::Part;

constexpr std::array hints{
    KeyHint{"n", "next difference", "Goes to the next difference, and from the last one to the first."},
    KeyHint{"a", "all or differences", "Shows all fields, or only what differs."},
};

std::string headingOf(const ComparedMessage* message) {
    if (message == nullptr)
        return {};
    std::string text = safe(message->name) + " +";
    appendSeconds(text, message->since);
    return text + " frame " + std::to_string(message->frame);
}

const Part* find(const ComparedMessage* message, const Part& part) {
    if (message == nullptr)
        return nullptr;
    const auto found = std::find_if(message->parts.begin(), message->parts.end(), [&](const Part& each) {
        return each.element == part.element && each.field == part.field;
    });
    return found == message->parts.end() ? nullptr : &*found;
}

bool hasElement(const ComparedMessage* message, const std::string& element) {
    return message != nullptr &&
           (element.empty() ||
            std::any_of(message->elements.begin(), message->elements.end(),
                        [&](const ComparedMessage::Whole& each) { return each.element == element; }));
}

// The fields of one element, those of `a` first.
void appendFields(std::vector<Row>& rows, const ComparedPair& pair, const std::string& element) {
    const auto value = [](const Part* part) { return part == nullptr ? std::string() : safe(part->value); };
    const auto append = [&](const Part& part) {
        Row row{Row::Kind::field, safe(part.field), value(find(pair.a, part)), value(find(pair.b, part))};
        row.differs = row.a != row.b;
        rows.push_back(std::move(row));
    };
    for (const ComparedMessage* const side : {pair.a, pair.b}) {
        for (std::size_t i = 0; side != nullptr && i < side->parts.size(); ++i) {
            const Part& part = side->parts[i];
            if (part.element == element && (side == pair.a || find(pair.a, part) == nullptr))
                append(part);
        }
    }
}

void appendElement(std::vector<Row>& rows, const ComparedPair& pair, const std::string& element) {
    if (!element.empty()) {
        Row row{Row::Kind::element, safe(element)};
        const bool inA = hasElement(pair.a, element), inB = hasElement(pair.b, element);
        row.a = inA ? "" : "absent";
        row.b = inB ? "" : "absent";
        row.differs = inA != inB;
        rows.push_back(std::move(row));
    }
    appendFields(rows, pair, element);
}

}  // namespace

std::vector<Row> rowsOf(const std::vector<ComparedPair>& pairs) {
    std::vector<Row> rows;
    for (const ComparedPair& pair : pairs) {
        const std::size_t start = rows.size();
        rows.push_back({Row::Kind::message, "", headingOf(pair.a), headingOf(pair.b)});
        appendElement(rows, pair, "");
        for (const ComparedMessage* const side : {pair.a, pair.b}) {
            for (std::size_t i = 0; side != nullptr && i < side->elements.size(); ++i) {
                if (side == pair.a || !hasElement(pair.a, side->elements[i].element))
                    appendElement(rows, pair, side->elements[i].element);
            }
        }
        rows[start].differs = pair.a == nullptr || pair.b == nullptr || pair.a->name != pair.b->name ||
                              std::any_of(rows.begin() + static_cast<std::ptrdiff_t>(start), rows.end(),
                                          [](const Row& row) { return row.differs; });
    }
    return rows;
}

std::unique_ptr<Screen> CompareScreen::ofCalls(Desk& desk, std::uint64_t a, std::uint64_t b) {
    std::vector<Row> rows;
    std::string title = "Call " + std::to_string(a) + " beside call " + std::to_string(b);
    const calls::Call* const callA = desk.trace().call(a);
    const calls::Call* const callB = desk.trace().call(b);
    if (callA != nullptr && callB != nullptr) {
        const auto messagesA = desk.trace().messagesOf(*callA);
        const auto messagesB = desk.trace().messagesOf(*callB);
        try {
            rows = rowsOf(pairsOf(messagesA, messagesB));
        } catch (const TooDifferent& error) {
            title += ": " + std::string(error.what());
        }
    }
    auto screen = std::make_unique<CompareScreen>(desk, std::move(title), std::move(rows));
    screen->onlyDifferences_ = true;
    screen->choose();
    return screen;
}

std::unique_ptr<Screen> CompareScreen::ofMessages(Desk& desk, std::uint64_t a, std::uint64_t b) {
    const auto messageA = desk.trace().messageOf(a);
    const auto messageB = desk.trace().messageOf(b);
    std::vector<Row> rows;
    if (messageA && messageB)
        rows = rowsOf({{&*messageA, &*messageB}});
    return std::make_unique<CompareScreen>(
        desk, "Frame " + std::to_string(a) + " beside frame " + std::to_string(b), std::move(rows));
}

CompareScreen::CompareScreen(Desk& desk, std::string title, std::vector<Row> rows)
    : Screen(desk), title_(std::move(title)), rows_(std::move(rows)) {
    differences_ = static_cast<std::size_t>(std::count_if(rows_.begin(), rows_.end(), [](const Row& row) {
        return row.differs && row.kind == Row::Kind::field;
    }));
    choose();
}

// Chooses the rows that are shown. The rows that name messages are always shown.
void CompareScreen::choose() {
    shown_.clear();
    for (std::size_t i = 0; i < rows_.size(); ++i) {
        bool differs = rows_[i].differs;
        if (rows_[i].kind == Row::Kind::element) {
            for (std::size_t j = i + 1; j < rows_.size() && rows_[j].kind == Row::Kind::field; ++j)
                differs = differs || rows_[j].differs;
        }
        const bool isChosen = rows_[i].kind == Row::Kind::message || differs;
        if (!onlyDifferences_ || isChosen)
            shown_.push_back(i);
    }
    cursor_ = {};
}

std::string CompareScreen::title() const {
    return title_ + ": " + std::to_string(differences_) +
           (differences_ == 1 ? " field differs" : " fields differ") +
           (onlyDifferences_ ? ", alike ones not shown" : "");
}

std::span<const KeyHint> CompareScreen::keys() const { return hints; }

void CompareScreen::draw(Canvas& canvas, const Area& area) {
    if (rows_.empty()) {
        canvas.put(area.x, area.y, "there is nothing to compare: one of the two has no message in memory");
        return;
    }
    const auto& here = rows_[shown_[std::min(cursor_.line(), shown_.size() - 1)]];
    std::vector<std::string> details;
    if (here.kind == Row::Kind::field)
        details = {"A: " + (here.a.empty() ? "absent" : here.a),
                   "B: " + (here.b.empty() ? "absent" : here.b)};
    constexpr int leastLines = 6;
    const Area list = drawDetails(canvas, area, details, 2, leastLines, desk().hasUtf8());
    const int nameWidth = std::max(10, list.width * 3 / 10);
    const int valueWidth = (list.width - gutter - nameWidth - 2) / 2;
    const int a = list.x + gutter + nameWidth + 1, b = a + valueWidth + 1;
    cursor_.fit(shown_.size(), list.height);
    top_ = list.y;
    for (int i = 0; i < list.height && cursor_.top() + static_cast<std::size_t>(i) < shown_.size(); ++i) {
        const std::size_t at = cursor_.top() + static_cast<std::size_t>(i);
        const Row& row = rows_[shown_[at]];
        const int y = list.y + i;
        Style style{row.differs ? Ink::warning : Ink::plain, row.kind != Row::Kind::field,
                    at == cursor_.line()};
        if (row.kind == Row::Kind::message && !row.differs)
            style.ink = Ink::title;
        canvas.fill({list.x + gutter, y, list.width - gutter, 1}, style);
        drawGutter(canvas, list, i, style.reverse, false);
        canvas.put(list.x + 1, y, row.differs ? "!" : " ", {Ink::warning, true});
        const std::string indent = row.kind == Row::Kind::field ? "  " : "";
        canvas.put(list.x + gutter, y, indent + row.name, style, a - 1);
        const auto value = [&](const std::string& text) {
            return text.empty() && row.kind != Row::Kind::element ? std::string("-") : text;
        };
        canvas.put(a, y, value(row.a), style, b - 1);
        canvas.put(b, y, value(row.b), style);
    }
}

void CompareScreen::toNextDifference() {
    for (std::size_t i = 1; i <= shown_.size(); ++i) {
        const std::size_t at = (cursor_.line() + i) % shown_.size();
        if (rows_[shown_[at]].differs && rows_[shown_[at]].kind == Row::Kind::field) {
            cursor_.moveTo(at);
            return;
        }
    }
}

bool CompareScreen::press(const Key& key) {
    if (cursor_.press(key))
        return true;
    if (key.is(U'n') && !shown_.empty()) {
        toNextDifference();
    } else if (key.is(U'a')) {
        onlyDifferences_ = !onlyDifferences_;
        choose();
    } else if (key.code == Key::Code::click && key.y >= top_) {
        cursor_.moveTo(cursor_.top() + static_cast<std::size_t>(key.y - top_));
    } else {
        return false;
    }
    return true;
}

}  // namespace reader::browse
