#include "reader/browse/MessageScreen.h"

#include <algorithm>
#include <array>

#include "reader/Columns.h"
#include "reader/Contents.h"
#include "reader/LadderText.h"
#include "reader/browse/CompareScreen.h"
#include "reader/browse/ListDrawing.h"
#include "reader/browse/SaveScreen.h"
#include "reader/list.h"
#include "reader/text.h"

namespace reader::browse {

namespace {

constexpr std::array hints{
    KeyHint{"Left/Right", "other message", "Shows the message before this one, or after it."},
    KeyHint{"Space", "mark", "Marks the message, or takes the mark away."},
    KeyHint{"c", "compare", "Shows two marked messages side by side."},
    KeyHint{"w", "save", "Writes what is marked, or this frame, into a pcapng file."},
};

constexpr int octetsInLine = 8;
constexpr int positionWidth = 4;
constexpr int octetsWidth = positionWidth + 1 + 3 * octetsInLine + 1;
constexpr int leastBeside = 72;  // screens of at least this width show octets beside the fields
constexpr std::size_t octetColumn = 4, nameColumn = 24;

// Splits a line where two or more blanks stand.
std::vector<std::string> itemsOf(std::string_view line) {
    std::vector<std::string> items;
    while (!line.empty()) {
        const std::size_t end = std::min(line.find("  "), line.size());
        if (end > 0)
            items.emplace_back(line.substr(0, end));
        line.remove_prefix(std::min(line.find_first_not_of(' ', end), line.size()));
    }
    return items;
}

}  // namespace

// Makes rows of what a frame consists of.
class MessageScreen::Rows : public ContentsVisitor {
  public:
    // The fields of the rows are views of `octets`, which the screen keeps as the block of this number.
    Rows(std::vector<Row>& rows, std::span<const std::uint8_t> octets, std::size_t block)
        : rows_(rows), octets_(octets), block_(block) {}

    void heading(std::string_view words) override {
        Row row;
        appendSafe(row.text, words);
        row.block = block_;
        row.style = {Ink::title, true};
        rows_.push_back(std::move(row));
    }
    void field(const isdn::Field& field) override {
        if (field.at.empty())
            return;
        Row row;
        row.begin = static_cast<std::size_t>(field.at.data() - octets_.data());
        row.size = field.at.size();
        row.block = block_;
        appendSafe(row.text, field.octet);
        padTo(row.text, 0, octetColumn, true);
        row.text += ' ';
        const std::size_t start = row.text.size();
        row.text.append(std::size_t{2} * field.depth, ' ');
        appendSafe(row.text, field.name);
        padTo(row.text, start, nameColumn);
        row.text += ' ';
        const std::size_t valueAt = row.text.size();
        const bool isText = field.kind == isdn::Field::Kind::text;
        if (!isText && field.at.size() <= sizeof field.value)
            appendNumber(row.text, field.value);
        if (!field.meaning.empty()) {
            row.text += isText ? "\"" : " ";
            appendSafe(row.text, field.meaning);
            row.text += isText ? "\"" : "";
        }
        row.words = {safe(field.name) + " " + row.text.substr(valueAt),
                     "octet " + safe(field.octet) + ", bits " + std::string(field.bits())};
        if (!field.clause.empty())
            row.words.emplace_back(field.clause);
        row.style.ink = field.doubtful ? Ink::warning : Ink::plain;
        rows_.push_back(std::move(row));
    }
    void problem(isdn::Problem problem) override {
        rows_.push_back({"     ** " + std::string(isdn::nameOf(problem)), {}, 0, 0, block_, {Ink::error}});
    }

  private:
    std::vector<Row>& rows_;
    std::span<const std::uint8_t> octets_;
    std::size_t block_;
};

MessageScreen::MessageScreen(Desk& desk, std::uint64_t frame, std::vector<std::uint64_t> frames)
    : Screen(desk), frames_(std::move(frames)) {
    load(frame);
}

void MessageScreen::load(std::uint64_t frame) {
    frame_ = frame;
    rows_.clear();
    blocks_ = {};
    headline_.clear();
    cursor_ = {};
    Shown shown;
    const auto place = trace().frames().placeOf(frame);
    isThere_ = place && trace().frames().load(*place, shown);
    if (!isThere_)
        return;
    const Seen& seen = shown.seen();
    std::string line;
    Piece unused;
    LineComposer({}, false).compose(seen, line, unused);
    line.pop_back();
    headline_ = itemsOf(line);
    blocks_[0].assign(seen.frame().octets.begin(), seen.frame().octets.end());
    Rows rows(rows_, seen.frame().octets, 0);
    if (seen.isFrame())
        visitFrame(seen.frame().octets, seen.variant, rows);
    if (seen.hasMessage && seen.message.type == isdn::message::segment &&
        seen.message.discriminator == isdn::callControl)
        addJoined(seen.variant);
}

void MessageScreen::addJoined(isdn::Variant variant) {
    auto joined = trace().joinedOf(frame_);
    if (!joined) {
        rows_.push_back({"The other segments of its message are not there.", {}, 0, 0, 0, {Ink::warning}});
        return;
    }
    std::string words = "The message put together of frames ";
    for (std::size_t i = 0; i < joined->frames.size(); ++i)
        words += (i == 0 ? "" : ", ") + std::to_string(joined->frames[i]);
    rows_.push_back({words, {}, 0, 0, 1, {Ink::title, true}});
    blocks_[1] = std::move(joined->octets);
    Rows rows(rows_, blocks_[1], 1);
    visitMessage(isdn::parseLayer3(blocks_[1]), variant, rows);
}

// Returns the octets that are shown beside the row under the cursor.
const std::vector<std::uint8_t>& MessageScreen::shownOctets() const {
    return blocks_[cursor_.line() < rows_.size() ? rows_[cursor_.line()].block : 0];
}

std::string MessageScreen::title() const {
    std::string title = "Frame " + std::to_string(frame_);
    if (const std::uint64_t call = trace().callOf(frame_); call != 0)
        title += " of call " + std::to_string(call);
    if (desk().marked().frames.contains(frame_))
        title += ", marked";
    return title;
}

std::span<const KeyHint> MessageScreen::keys() const { return hints; }

void MessageScreen::draw(Canvas& canvas, const Area& area) {
    if (!isThere_) {
        canvas.put(area.x, area.y, "this frame is not in memory any more");
        return;
    }
    const auto lines = wrapped(headline_, static_cast<std::size_t>(area.width));
    const int headline = std::min<int>(static_cast<int>(lines.size()), std::max(area.height / 4, 1));
    for (int i = 0; i < headline; ++i)
        canvas.put(area.x, area.y + i, lines[static_cast<std::size_t>(i)], {Ink::title});
    constexpr int leastForTwo = 14;
    const int foot = area.height < leastForTwo ? 1 : 2;
    Area fields{area.x, area.y + headline, area.width, area.height - headline - foot};
    Area octets = fields;
    if (area.width >= leastBeside) {
        fields.width -= octetsWidth + 1;
        octets = {fields.x + fields.width + 1, fields.y, octetsWidth, fields.height};
    } else {
        const int needed = (static_cast<int>(shownOctets().size()) + octetsInLine - 1) / octetsInLine;
        const int given = std::min(needed, std::max(fields.height / 3, 1));
        fields.height -= given;
        octets = {fields.x, fields.y + fields.height, area.width, given};
    }
    cursor_.fit(rows_.size(), fields.height);
    rowsTop_ = fields.y;
    for (int i = 0; i < fields.height; ++i) {
        const std::size_t at = cursor_.top() + static_cast<std::size_t>(i);
        if (at >= rows_.size())
            break;
        const bool isCurrent = at == cursor_.line();
        Style style = rows_[at].style;
        style.reverse = isCurrent;
        drawGutter(canvas, fields, i, isCurrent, false);
        canvas.put(fields.x + 1, fields.y + i, rows_[at].text, style, fields.x + fields.width);
    }
    drawOctets(canvas, octets);
    if (cursor_.line() >= rows_.size())
        return;
    const auto words = wrapped(rows_[cursor_.line()].words, static_cast<std::size_t>(area.width));
    for (int i = 0; i < std::min(foot, static_cast<int>(words.size())); ++i)
        canvas.put(area.x, area.y + area.height - foot + i, words[static_cast<std::size_t>(i)], {Ink::note});
}

// Draws the octets. Those that contain the field under the cursor are reversed and in brackets.
void MessageScreen::drawOctets(Canvas& canvas, const Area& area) const {
    const std::vector<std::uint8_t>& octets = shownOctets();
    const Row* const row = cursor_.line() < rows_.size() ? &rows_[cursor_.line()] : nullptr;
    const auto isLit = [&](std::size_t octet) {
        return row != nullptr && octet >= row->begin && octet < row->begin + row->size;
    };
    const int litLine = row == nullptr ? 0 : static_cast<int>(row->begin) / octetsInLine;
    const int top = std::max(0, std::min(litLine - area.height / 2,
                                         static_cast<int>(octets.size()) / octetsInLine + 1 - area.height));
    for (int i = 0; i < area.height; ++i) {
        const auto begin = static_cast<std::size_t>(top + i) * std::size_t{octetsInLine};
        if (begin >= octets.size())
            break;
        const int y = area.y + i;
        std::string position;
        appendNumber(position, begin + 1);
        padTo(position, 0, positionWidth - 1, true);
        canvas.put(area.x, y, position + ":", {Ink::faint});
        for (std::size_t at = begin; at < std::min(begin + octetsInLine, octets.size()); ++at) {
            const int x = area.x + positionWidth + 3 * static_cast<int>(at - begin);
            std::string hex;
            appendHex(hex, std::span(&octets[at], 1));
            const bool lit = isLit(at);
            const Style style{Ink::plain, lit, lit};
            const bool begins = lit && (at == begin || !isLit(at - 1));
            const bool ends = lit && (at + 1 == begin + octetsInLine || !isLit(at + 1));
            if (lit)
                canvas.put(x, y, begins ? "[" : " ", begins ? Style{} : style);
            canvas.put(x + 1, y, hex, style);
            if (ends)
                canvas.put(x + 3, y, "]");
        }
    }
}

void MessageScreen::step(bool forward) {
    std::uint64_t next = forward ? frame_ + 1 : frame_ - 1;
    if (!frames_.empty()) {
        const auto here = std::lower_bound(frames_.begin(), frames_.end(), frame_);
        if (forward ? here == frames_.end() || here + 1 == frames_.end() : here == frames_.begin())
            return;
        next = forward ? *(here + 1) : *(here - 1);
    }
    if (trace().frames().placeOf(next))
        load(next);
}

bool MessageScreen::press(const Key& key) {
    if (cursor_.press(key))
        return true;
    if (key.code == Key::Code::left || key.is(U'p')) {
        step(false);
    } else if (key.code == Key::Code::right || key.is(U'n')) {
        step(true);
    } else if (key.code == Key::Code::click) {
        if (key.y >= rowsTop_)
            cursor_.moveTo(cursor_.top() + static_cast<std::size_t>(key.y - rowsTop_));
    } else if (key.is(U' ')) {
        auto& marked = desk().marked().frames;
        if (marked.erase(frame_) == 0)
            marked.insert(frame_);
    } else if (key.is(U'c')) {
        const auto& marked = desk().marked().frames;
        if (marked.size() == 2)
            desk().open(CompareScreen::ofMessages(desk(), *marked.begin(), *marked.rbegin()));
        else
            desk().say("mark two messages with Space, then press c");
    } else if (key.is(U'w')) {
        desk().open(std::make_unique<SaveScreen>(desk(), Marked{{}, {frame_}}));
    } else {
        return false;
    }
    return true;
}

}  // namespace reader::browse
