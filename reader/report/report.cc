#include "reader/report/report.h"

#include <optional>

#include "reader/Redacting.h"
#include "reader/errors.h"
#include "reader/forms.h"
#include "reader/inputs.h"
#include "reader/redact.h"
#include "reader/report/ReportTaker.h"
#include "reader/session.h"
#include "reader/trunkRows.h"

namespace reader {

namespace {

// The title of a redacted report names no files, because file names may name people and places.
std::string titleOf(const Options& options) {
    if (options.redact.inReport)
        return "Report of a trace, redacted";
    std::string title = "Report of";
    const bool areFiles = options.input.store.empty();
    for (const std::string& name : inputNames(options)) {
        const std::string shown = areFiles ? name.substr(name.rfind('/') + 1) : name;
        title += " " + (shown == "-" ? "the standard input" : shown);
    }
    return title;
}

// Replaces numbers by pseudonyms before anything is composed or counted.
void takeRedacted(ReportTaker& taker, Session& session, const Options& options, const redaction::Key& key,
                  Chatter& chatter) {
    Redacting redacting(options, key, redaction::Direction::redact, nullptr, taker);
    session.run(redacting, [] { return std::make_unique<NoComposer>(); });
    redacting.finish();
    taker.end(chatter);
}

}  // namespace

std::span<const OptionRow> reportOptions() {
    static const OptionRow rows[] = {
        {"--redact", "", "Put pseudonyms in place of numbers, names and user data",
         [](Options& to, const std::string&) { to.redact.inReport = true; }},
        {"--key", "FILE", "Make them by this key, and make the key if there is none; implies --redact",
         [](Options& to, const std::string& value) {
             to.redact.inReport = true;
             to.redact.key = value;
         }},
        e1Row,
        t1Row,
        basicRow,
    };
    return rows;
}

int runReport(const Options& options, Chatter& chatter) {
    Session session(options, chatter);
    std::optional<redaction::Key> key;  // before an output is emptied
    if (options.redact.inReport)
        key = redactionKey(options, chatter);
    Output& out = session.output("a report", looksLikeReport);
    if (out.isTerminal())
        throw UsageError("a report is not for a terminal: name a file with -o, or send it through a pipe");
    ReportTaker taker(key ? Redacting::behind(options) : options);
    if (key)
        takeRedacted(taker, session, options, *key, chatter);
    else
        taker.run(session, chatter);
    taker.finish();
    out.write(htmlOf(taker.page(titleOf(options), options.calls.trunk)));
    out.flush();
    return good;
}

}  // namespace reader
