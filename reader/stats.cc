#include "reader/stats.h"

#include <algorithm>
#include <iterator>
#include <string>
#include <utility>
#include <vector>

#include "reader/FigureTaker.h"
#include "reader/errors.h"
#include "reader/figureForms.h"
#include "reader/session.h"
#include "reader/trunkRows.h"

namespace reader {

std::span<const OptionRow> statsOptions() {
    static const OptionRow rows[] = {
        {"--csv", "", "A row a figure, for spreadsheets",
         [](Options& to, const std::string&) { to.calls.form = CallForm::csv; }, "form"},
        {"--jsonl", "", "A JSON object a row",
         [](Options& to, const std::string&) { to.calls.form = CallForm::jsonLines; }, "form"},
        {"--over-time", "", "Also: channels in use over time, links, and link events",
         [](Options& to, const std::string&) { to.calls.overTime = true; }},
        e1Row,
        t1Row,
        basicRow,
    };
    return rows;
}

int runStats(const Options& options, Chatter& chatter) {
    Session session(options, chatter);
    Output& out = session.output();
    FigureTaker taker(options);
    taker.run(session, chatter);
    taker.finish();
    std::vector<FigureTable> tables = taker.tables(options.calls.trunk);
    if (options.calls.overTime)
        std::ranges::move(taker.overTime(), std::back_inserter(tables));
    std::string text;
    if (options.calls.form == CallForm::csv)
        text = figureCsvHeader;
    bool first = true;
    for (const FigureTable& table : tables) {
        if (options.calls.form == CallForm::csv) {
            appendFigureCsv(text, table);
        } else if (options.calls.form == CallForm::jsonLines) {
            appendFigureJson(text, table);
        } else if (!table.rows.empty()) {
            text += first ? "" : "\n";
            appendFigureText(text, table);
            first = false;
        }
    }
    out.write(text);
    out.flush();
    return good;
}

}  // namespace reader
