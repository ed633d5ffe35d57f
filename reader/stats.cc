#include "reader/stats.h"

#include <string>

#include "reader/FigureTaker.h"
#include "reader/errors.h"
#include "reader/figureForms.h"
#include "reader/session.h"

namespace reader {

std::span<const OptionRow> statsOptions() {
    static const OptionRow rows[] = {
        {"--csv", "", "A row a figure, for spreadsheets",
         [](Options& to, const std::string&) { to.calls.form = CallForm::csv; }, "form"},
        {"--jsonl", "", "A JSON object a row",
         [](Options& to, const std::string&) { to.calls.form = CallForm::jsonLines; }, "form"},
        {"--e1", "", "The trunks have the channels of E1 (default: learnt)",
         [](Options& to, const std::string&) { to.calls.trunk = calls::TrunkSize::e1; }, "trunk"},
        {"--t1", "", "The trunks have the channels of T1",
         [](Options& to, const std::string&) { to.calls.trunk = calls::TrunkSize::t1; }, "trunk"},
        {"--bri", "", "The trunks are basic accesses",
         [](Options& to, const std::string&) { to.calls.trunk = calls::TrunkSize::basic; }, "trunk"},
    };
    return rows;
}

int runStats(const Options& options, Chatter& chatter) {
    Session session(options, chatter);
    Output& out = session.output();
    FigureTaker taker(options);
    taker.run(session, chatter);
    std::string text;
    if (options.calls.form == CallForm::csv)
        text = figureCsvHeader;
    bool first = true;
    for (const FigureTable& table : taker.tables(options.calls.trunk)) {
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
