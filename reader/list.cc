#include "reader/list.h"

#include <algorithm>
#include <string_view>

#include "reader/TextConsumer.h"
#include "reader/errors.h"
#include "reader/inputs.h"
#include "reader/session.h"
#include "reader/text.h"

namespace reader {

namespace {

constexpr std::string_view usual[] = {"n",  "time", "delta", "dir",     "link",    "frame", "ns",
                                      "nr", "pf",   "ref",   "message", "details", "marks"};
constexpr std::string_view wide[] = {"n",      "time", "delta",   "trunk",   "place", "ticks",
                                     "dir",    "link", "frame",   "ns",      "nr",    "pf",
                                     "length", "ref",  "message", "details", "marks", "hex"};

constexpr unsigned secondsWidth = 10;
constexpr std::string_view blanks = "                                ";
static_assert(blanks.size() == widestColumn + 1);

// Adapts the time column: seconds are shorter than dates, and are aligned to the right.
Column placed(std::string_view name, TimeForm time) {
    Column column = columnNamed(name);
    if (column.name == "time" && time == TimeForm::relative) {
        column.width = secondsWidth;
        column.right = true;
    }
    return column;
}

std::vector<Column> chosenColumns(const ListOptions& options) {
    std::vector<Column> chosen;
    if (!options.columns.empty()) {
        for (const std::string& name : options.columns)
            chosen.push_back(placed(name, options.time));
        return chosen;
    }
    for (const std::string_view name : options.wide ? std::span<const std::string_view>(wide) : usual) {
        // If the time that is shown is the time since the line before, its column replaces the time column.
        if (options.time != TimeForm::delta || name != "time")
            chosen.push_back(placed(name, options.time));
        if (name == deltaColumn && options.trunk && !options.wide)
            chosen.push_back(columnNamed("trunk"));
    }
    return chosen;
}

// The place of the column of this name; the number of columns if there is none.
std::size_t placeOf(std::string_view name, const std::vector<Column>& columns) {
    const auto found = std::find_if(columns.begin(), columns.end(),
                                    [&](const Column& column) { return column.name == name; });
    return static_cast<std::size_t>(found - columns.begin());
}

// Appends the blanks that follow a column whose text has this length. One blank separates columns, but two
// follow a message and other texts that contain blanks.
void appendGap(std::string& text, const Column& column, std::size_t length) {
    if (column.width == 0)
        text += blanks.substr(0, length == 0 ? 0 : 2);
    else if (length >= column.width || column.right)
        text += ' ';
    else
        text += blanks.substr(0, column.width - length + 1);
}

void trimBlanks(std::string& text, std::size_t start) {
    while (text.size() > start && text.back() == ' ')
        text.pop_back();
}

}  // namespace

LineComposer::LineComposer(const ListOptions& options, bool colors)
    : columns_(chosenColumns(options)),
      delta_(placeOf(deltaColumn, columns_)),
      relative_(options.time == TimeForm::relative),
      colors_(colors) {}

void LineComposer::compose(const Seen& seen, std::string& text, Piece& piece) {
    const std::size_t lineStart = text.size();
    std::size_t end = lineStart;  // of the last column that has a text
    Cell cell{seen, text, times_, relative_, colors_};
    for (std::size_t i = 0; i < columns_.size(); ++i) {
        const Column& column = columns_[i];
        const std::size_t start = text.size();
        column.put(cell);
        if (i == delta_) {
            piece.deltaAt = start;
            piece.deltaSize = deltaWidth;
            text += blanks.substr(0, deltaWidth);
        }
        const std::size_t length = text.size() - start;
        if (length < column.width && column.right)
            text.insert(start, blanks, 0, column.width - length);
        if (length != 0)
            end = text.size();
        appendGap(text, column, length);
    }
    text.resize(end);
    trimBlanks(text, std::max(lineStart, piece.deltaAt + piece.deltaSize));
    text += '\n';
}

std::span<const OptionRow> listOptions() {
    static constexpr OptionRow rows[] = {
        {"--relative", "", "Seconds since the first frame instead of times",
         [](Options& to, const std::string&) { to.list.time = TimeForm::relative; }, "time"},
        {"--delta", "", "Seconds since the line before instead of times",
         [](Options& to, const std::string&) { to.list.time = TimeForm::delta; }, "time"},
        {"--wide", "", "All columns, the octets among them",
         [](Options& to, const std::string&) { to.list.wide = true; }, "columns"},
        {"--columns", "A,B,...",
         "These columns, in this order: n, time, delta, trunk, place, ticks, dir, link, frame, ns, nr, pf, "
         "length, "
         "ref, message, details, marks, hex",
         [](Options& to, const std::string& value) {
             to.list.columns = splitAtCommas(value);
             for (const std::string& name : to.list.columns)
                 columnNamed(name);
         },
         "columns"},
    };
    return rows;
}

int runList(const Options& options, Chatter& chatter) {
    Session session(options, chatter);
    Output& out = session.output();
    const bool colors = session.useColors();
    TextConsumer consumer(out);
    ListOptions list = options.list;
    list.trunk = mayHaveSeveralDChannels(options);
    session.run(consumer, [&] { return std::make_unique<LineComposer>(list, colors); });
    return good;
}

}  // namespace reader
