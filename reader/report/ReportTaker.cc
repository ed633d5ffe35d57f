#include "reader/report/ReportTaker.h"

#include <iterator>
#include <utility>

#include "reader/CallLine.h"
#include "reader/LadderSvg.h"
#include "reader/report/Summary.h"
#include "reader/text.h"

namespace reader {

namespace {

std::string ladderName(const calls::Call& call) { return "ladder-" + std::to_string(call.number); }

// A call's words in one line: "call 5  2001-05-14T08:00:09.000+00:00  ...".
std::string headline(const CallLadder& ladder) {
    std::string line;
    for (const std::string& word : ladder.headline)
        line += (line.empty() ? "" : "  ") + word;
    return line;
}

void appendCell(std::string& to, bool isNumber, std::string_view safeText) {
    to += isNumber ? "<td class=\"n\">" : "<td>";
    appendEntities(to, safeText);
    to += "</td>";
}

}  // namespace

ReportTaker::ReportTaker(const Options& options)
    : FigureTaker(options),
      filtered_(!options.filters.empty() || options.first != 0 || options.skipped != 0) {}

void ReportTaker::see(const Seen& seen) {
    FigureTaker::see(seen);
    ladders_.see(seen);
    if (!seen.isFrame())
        return;
    ++frames_;
    until_ = seen.when;
    if (!from_)
        from_ = seen.when;
}

void ReportTaker::heard(const calls::Message& message, const calls::Call* call) {
    FigureTaker::heard(message, call);
    if (call != nullptr && mayBeWanted(*call))
        ladders_.heard(message, *call);
    else if (call == nullptr && (message.layer3.type == isdn::message::restart ||
                                 message.layer3.type == isdn::message::restartAcknowledge))
        ladders_.restarted(message);
}

void ReportTaker::carried(const calls::Message& message, const calls::Call* call) {
    FigureTaker::carried(message, call);
    if (call != nullptr && mayBeWanted(*call))
        ladders_.carried(message, *call);
}

void ReportTaker::gone(const calls::Call& call) {
    if (isWanted(call))
        addCall(call);
    ladders_.forget(call);
    FigureTaker::gone(call);
}

// Readers look for calls that failed, so the others get at most half of the table.
void ReportTaker::addCall(const calls::Call& call) {
    const bool failed = hasFailed(call);
    const bool hasLadder = failed && addLadder(call);
    if ((failed ? failed_ : callRows_.count() - failed_) >= mostCalls) {
        callRows_.leaveOut();
        return;
    }
    failed_ += failed ? 1 : 0;
    const std::vector<CallColumn> columns = callColumns();
    const std::vector<std::string> cells = callCells(call, times_);
    std::string row = failed ? "<tr class=\"failed\">" : "<tr>";
    for (std::size_t i = 0; i < cells.size(); ++i) {
        if (i == 0 && hasLadder)
            row += "<td class=\"n\"><a href=\"#" + ladderName(call) + "\">" + cells[i] + "</a></td>";
        else
            appendCell(row, columns[i].isNumber, cells[i]);
    }
    callRows_.add(row + "</tr>\n");
}

bool ReportTaker::addLadder(const calls::Call& call) {
    if (!ladderParts_.hasRoom()) {
        ladderParts_.leaveOut();
        return false;
    }
    const CallLadder ladder = ladders_.take(call, times_);
    const std::string line = headline(ladder);
    LadderSvg svg;
    svg.add(ladder, times_);
    std::string part = "<details open=\"open\" id=\"" + ladderName(call) + "\"><summary>";
    appendEntities(part, line);
    part += "</summary>\n" + svg.part("Messages of call " + std::to_string(call.number)) + "</details>\n";
    ladderParts_.add(part);
    return true;
}

void ReportTaker::report(const calls::Finding& finding) {
    ++findings_[static_cast<std::size_t>(finding.severity)];
    if (!worst_ || finding.severity > worst_->severity)
        worst_ = finding;
    std::string row = "<tr class=\"" + std::string(nameOf(finding.severity)) + "\">";
    appendCell(row, false, nameOf(finding.severity));
    appendCell(row, false, textOf({finding.clock, finding.time}));
    appendCell(row, true, std::to_string(finding.frame));
    appendCell(row, true, finding.call ? std::to_string(*finding.call) : "");
    appendCell(row, false, finding.kind->id);
    appendCell(row, false, safe(finding.sentence));
    appendCell(row, true, std::to_string(finding.count));
    appendCell(row, false, finding.kind->lookAt);
    findingRows_.add(row + "</tr>\n");
}

Page ReportTaker::page(std::string title, calls::TrunkSize size) const {
    std::vector<FigureTable> figures = tables(size);
    std::vector<FigureTable> more = overTime();
    std::move(more.begin(), more.end(), std::back_inserter(figures));
    const Overview overview{.frames = frames_,
                            .from = from_.value_or(Instant()),
                            .until = until_,
                            .filtered = filtered_,
                            .links = links(),
                            .figures = this->figures(),
                            .findings = findings_,
                            .worst = worst_};
    return {.title = std::move(title),
            .summary = summaryOf(overview),
            .figures = std::move(figures),
            .from = textOf(from_.value_or(Instant())),
            .until = textOf(until_),
            .calls = callRows_,
            .ladders = ladderParts_,
            .findings = findingRows_};
}

}  // namespace reader
