#include "reader/LadderMermaid.h"

#include <algorithm>

#include "reader/text.h"

namespace reader {

namespace {

using calls::Side;

// Writes characters that have a meaning in Mermaid, or in the HTML that it makes, as their numbers.
void appendPlain(std::string& to, std::string_view text) {
    constexpr std::string_view harmless = " .,:?!()/+-*=[]'_";
    for (const char character : safe(text)) {
        const bool isPlain =
            (character >= '0' && character <= '9') || (character >= 'A' && character <= 'Z') ||
            (character >= 'a' && character <= 'z') || harmless.find(character) != std::string_view::npos;
        if (isPlain) {
            to += character;
            continue;
        }
        to += '#';
        appendNumber(to, static_cast<unsigned>(static_cast<unsigned char>(character)));
        to += ';';
    }
}

void appendNote(std::string& to, const std::vector<std::string>& items) {
    to += "    Note over us,peer: ";
    bool first = true;
    for (const std::string& item : items) {
        if (item.empty())
            continue;  // the time of a line that has none
        to += first ? "" : "<br/>";
        first = false;
        appendPlain(to, item);
    }
    to += '\n';
}

void appendArrow(std::string& to, const CallLadder& ladder, std::size_t number, TimeText& times) {
    const Rung& rung = ladder.rungs[number];
    const bool fromUs = rung.from == Side::us;
    to += fromUs ? "    us" : "    peer";
    to += rung.kind == Rung::Kind::link ? "-->>" : "->>";
    to += fromUs ? "peer: " : "us: ";
    appendPlain(to, rung.name);
    std::string time = timeOfDay(rung.when, times);
    if (const auto since = ladder.sinceBefore(number)) {
        time += " +";
        appendSeconds(time, *since);
    }
    std::vector<std::string> lines = detailsOf(ladder, rung);
    if (!time.empty())
        lines.insert(lines.begin(), time);
    for (const std::string& line : lines) {
        to += "<br/>";
        appendPlain(to, line);
    }
    to += '\n';
}

}  // namespace

void appendMermaid(std::string& to, const CallLadder& ladder, TimeText& times) {
    to += "```mermaid\nsequenceDiagram\n    participant us as ";
    appendPlain(to, ladder.us);
    to += "\n    participant peer as ";
    appendPlain(to, ladder.peer);
    to += '\n';
    appendNote(to, ladder.headline);
    for (std::size_t i = 0; i < ladder.rungs.size(); ++i) {
        if (ladder.rungs[i].kind == Rung::Kind::words)
            appendNote(to, {timeOfDay(ladder.rungs[i].when, times), ladder.rungs[i].name});
        else
            appendArrow(to, ladder, i, times);
    }
    if (ladder.missing != 0)
        appendNote(
            to, {"messages that are not shown, since there are too many: " + std::to_string(ladder.missing)});
    to += "```\n";
}

}  // namespace reader
