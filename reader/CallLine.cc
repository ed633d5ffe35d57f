#include "reader/CallLine.h"

#include <array>
#include <optional>

#include "reader/CallFields.h"
#include "reader/text.h"

namespace reader {

namespace {

using calls::Call;
using LineColumn = CallLineColumn;

void putSeconds(std::string& to, const std::optional<std::int64_t>& nanoseconds) {
    if (nanoseconds)
        appendSeconds(to, *nanoseconds);
}

void putParties(std::string& to, const Call& call) {
    appendSafe(to, call.calling.digits.empty() ? "-" : call.calling.digits);
    to += " > ";
    appendSafe(to, call.called.digits.empty() ? "-" : call.called.digits);
}

void putChannels(std::string& to, const Call& call) {
    to += call.askedWords.empty() ? "-" : call.askedWords;
    if (call.granted && call.grantedWords != call.askedWords)
        to += " > " + call.grantedWords;
}

// "peer: cause 17 user busy, remote user; then 16".
void putClearing(std::string& to, const Call& call) {
    if (call.endedBy == calls::EndedBy::open)
        return;
    to += nameOf(call.clearedBy);
    to += ": ";
    std::string words =
        call.cause ? call.cause->words : std::string(call.clearingSeen ? "no cause" : nameOf(call.endedBy));
    appendSafe(to, words);
    if (call.causeBefore) {
        to += "; before: ";
        appendSafe(to, call.causeBefore->words);
    }
    for (const calls::CauseGiven& cause : call.laterCauses) {
        to += "; then ";
        appendSafe(to, cause.words);
    }
}

constexpr std::array columns{
    LineColumn{"call", "call ", 5, true,
               [](std::string& to, const Call& call, TimeText&) { appendNumber(to, call.number); }},
    LineColumn{
        "start", "", 29, false,
        [](std::string& to, const Call& call, TimeText& times) { appendInstant(to, call.begin, times); }},
    LineColumn{"D channel", "D channel ", 9, false,
               [](std::string& to, const Call& call, TimeText&) { appendSafe(to, call.dChannel); }, true},
    LineColumn{"dir", "", 8, false,
               [](std::string& to, const Call& call, TimeText&) {
                   to += call.origin == calls::Side::us ? "TX " : "RX ";
                   to += directionOf(call);
               }},
    LineColumn{"ref", "ref ", 4, false,
               [](std::string& to, const Call& call, TimeText&) { appendReference(to, call); }},
    LineColumn{"calling > called", "", 24, false,
               [](std::string& to, const Call& call, TimeText&) { putParties(to, call); }},
    LineColumn{"channel", "channel ", 9, false,
               [](std::string& to, const Call& call, TimeText&) { putChannels(to, call); }},
    LineColumn{"respond", "respond ", 8, true,
               [](std::string& to, const Call& call, TimeText&) {
                   putSeconds(to, timeOf(call, call.firstResponse));
               }},
    LineColumn{
        "alert", "alert ", 8, true,
        [](std::string& to, const Call& call, TimeText&) { putSeconds(to, timeOf(call, call.alerting)); }},
    LineColumn{
        "connect", "connect ", 8, true,
        [](std::string& to, const Call& call, TimeText&) { putSeconds(to, timeOf(call, call.connect)); }},
    LineColumn{
        "duration", "duration ", 9, true,
        [](std::string& to, const Call& call, TimeText&) { putSeconds(to, timeOf(call, call.duration)); }},
    LineColumn{"outcome", "", 12, false,
               [](std::string& to, const Call& call, TimeText&) {
                   to += call.kind == calls::Kind::signalling ? nameOf(call.kind) : nameOf(call.outcome);
               }},
    LineColumn{"cleared by: cause", "cleared by ", 0, false,
               [](std::string& to, const Call& call, TimeText&) { putClearing(to, call); }},
    LineColumn{"flags", "", 0, false,
               [](std::string& to, const Call& call, TimeText&) {
                   if (const std::string flags = flagsOf(call); !flags.empty())
                       to += "[" + flags + "]";
               }},
};

void trimEnd(std::string& to, std::size_t start) {
    while (to.size() > start && to.back() == ' ')
        to.pop_back();
}

}  // namespace

std::span<const CallLineColumn> callLineColumns() { return columns; }

std::string callHeading(bool severalDChannels) {
    std::string heading;
    for (const LineColumn& column : columns) {
        if (column.forSeveral && !severalDChannels)
            continue;
        if (!heading.empty())
            heading += ' ';
        const std::size_t start = heading.size();
        heading += column.heading;
        padTo(heading, start, column.width, column.right);
    }
    return heading;
}

std::vector<CallColumn> callColumns() {
    std::vector<CallColumn> named;
    named.reserve(columns.size());
    for (const LineColumn& column : columns) {
        if (!column.forSeveral)
            named.push_back({column.heading, column.right});
    }
    return named;
}

std::vector<std::string> callCells(const Call& call, TimeText& times) {
    std::vector<std::string> cells;
    for (const LineColumn& column : columns) {
        if (!column.forSeveral)
            column.put(cells.emplace_back(), call, times);
    }
    return cells;
}

std::vector<std::string> callWords(const Call& call, TimeText& times, bool severalDChannels) {
    std::vector<std::string> words;
    for (const LineColumn& column : columns) {
        if (column.forSeveral && !severalDChannels)
            continue;
        std::string word;
        column.put(word, call, times);
        if (!word.empty())
            words.push_back(std::string(column.before) + word);
    }
    return words;
}

void appendCallLine(std::string& to, const Call& call, TimeText& times, bool severalDChannels) {
    const std::size_t lineStart = to.size();
    bool first = true;
    for (const LineColumn& column : columns) {
        if (column.forSeveral && !severalDChannels)
            continue;
        if (!first)
            to += ' ';
        first = false;
        const std::size_t start = to.size();
        column.put(to, call, times);
        padTo(to, start, column.width, column.right);
    }
    trimEnd(to, lineStart);
}

}  // namespace reader
