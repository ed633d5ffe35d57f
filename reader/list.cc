#include "reader/list.h"

#include <CLI/CLI.hpp>
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

std::vector<const Column*> chosenColumns(const ListOptions& options) {
    std::vector<const Column*> chosen;
    if (!options.columns.empty()) {
        for (const std::string& name : options.columns)
            chosen.push_back(columnNamed(name));
        return chosen;
    }
    for (const std::string_view name : options.wide ? std::span<const std::string_view>(wide) : usual) {
        // The time since the line before takes the place of the time, when that is what the time is.
        if (options.time != TimeForm::delta || name != "time")
            chosen.push_back(columnNamed(name));
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
    bool first = true;
    for (const Column* column : columns_) {
        if (!first)
            text += ' ';
        first = false;
        const std::size_t start = text.size();
        column->put(cell);
        padTo(text, start, column->width, column->right);
        if (column->name == deltaColumn) {
            piece.deltaAt = start;
            piece.deltaSize = deltaWidth;
        }
        // An empty column at the end of the line takes no blank.
        if (column->width == 0 && text.size() == start)
            text.pop_back();
    }
    trimBlanks(text, std::max(lineStart, piece.deltaAt + piece.deltaSize));
    text += '\n';
}

void declareList(CLI::App& app, Options& options) {
    ListOptions& list = options.list;
    const std::string group = "Lines";
    app.add_flag_callback(
           "--relative", [&list] { list.time = TimeForm::relative; },
           "Seconds since the first frame instead of times")
        ->group(group);
    app.add_flag_callback(
           "--delta", [&list] { list.time = TimeForm::delta; },
           "Seconds since the line before instead of times")
        ->group(group);
    app.add_flag("--wide", list.wide, "All columns, the octets among them")->group(group);
    app.add_option_function<std::string>(
           "--columns",
           [&list](const std::string& names) {
               list.columns = splitAtCommas(names);
               for (const std::string& name : list.columns)
                   columnNamed(name);
           },
           "These columns, in this order: n, time, delta, trunk, place, ticks, dir, link, frame, ns, nr, pf, "
           "length, "
           "ref, message, details, marks, hex")
        ->type_name("A,B,...")
        ->group(group);
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
