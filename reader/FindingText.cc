#include "reader/FindingText.h"

#include "reader/text.h"

namespace reader {

void appendHappening(std::string& to, const calls::Finding& finding, TimeText& times, bool severalDChannels) {
    if (finding.clock == capture::Clock::none)
        to += '-';
    else
        times.append(to, {finding.clock, finding.time});
    if (severalDChannels && !finding.dChannel.empty())
        appendSafe(to += ' ', finding.dChannel);
    to += " frame ";
    appendNumber(to, finding.frame);
    if (finding.call) {
        to += " call ";
        appendNumber(to, *finding.call);
    }
    to += ' ';
    to += finding.kind->id;
    to += ": ";
    appendSafe(to, finding.sentence);
    if (finding.count > 1) {
        to += " (";
        appendNumber(to, finding.count);
        to += " times)";
    }
}

void appendMeaning(std::string& to, const calls::Finding& finding) {
    to += finding.kind->meaning;
    to += "; look at: ";
    to += finding.kind->lookAt;
    if (!finding.clause.empty()) {
        to += " [";
        to += finding.clause;
        to += ']';
    }
}

}  // namespace reader
