#include "reader/list.h"

#include <string_view>

#include "reader/TextConsumer.h"
#include "reader/errors.h"
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
    }
    return chosen;
}

void trimBlanks(std::string& text, std::size_t start) {
    while (text.size() > start && text.back() == ' ')
        text.pop_back();
}

}  // namespace

LineComposer::LineComposer(const ListOptions& options, bool colors)
    : columns_(chosenColumns(options)), relative_(options.time == TimeForm::relative), colors_(colors) {}

void LineComposer::compose(const Seen& seen, std::string& text, Piece& piece) {
    const std::size_t lineStart = text.size();
    Cell cell{seen, text, times_, relative_, colors_};
    // One blank between columns, but two after a message and after other texts that contain blanks.
    std::string_view separator;
    for (const Column& column : columns_) {
        text += separator;
        const std::size_t start = text.size();
        column.put(cell);
        padTo(text, start, column.width, column.right);
        if (column.name == deltaColumn) {
            piece.deltaAt = start;
            piece.deltaSize = deltaWidth;
        }
        if (column.width != 0)
            separator = " ";
        else if (text.size() != start)
            separator = "  ";
        else
            text.resize(start - separator.size());
    }
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
    session.run(consumer, [&] { return std::make_unique<LineComposer>(options.list, colors); });
    return good;
}

}  // namespace reader
