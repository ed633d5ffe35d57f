#include "reader/Columns.h"

#include <algorithm>

#include "isdn/words.h"
#include "reader/errors.h"
#include "reader/text.h"

namespace reader {

namespace {

constexpr std::string_view bold = "\x1b[1m", green = "\x1b[32m", cyan = "\x1b[36m", yellow = "\x1b[33m",
                           plain = "\x1b[0m";

// Appends text in a colour. Appends nothing at all if there is no text.
template <class Put>
void inColor(Cell& cell, std::string_view color, Put put) {
    if (!cell.colors) {
        put();
        return;
    }
    const std::size_t start = cell.line.size();
    cell.line += color;
    put();
    if (cell.line.size() == start + color.size())
        cell.line.resize(start);
    else
        cell.line += plain;
}

void putNumber(Cell& cell) {
    if (cell.seen.number != 0)
        appendNumber(cell.line, cell.seen.number);
}

void putTime(Cell& cell) {
    if (cell.relative && cell.seen.when.clock != capture::Clock::none)
        appendSeconds(cell.line, cell.seen.sinceFirst);
    else
        cell.times.append(cell.line, cell.seen.when);
}

// Appends nothing: the code that puts the lines in order fills this column in.
void putDelta(Cell& /*cell*/) {}

void putDirection(Cell& cell) {
    if (cell.seen.number == 0)
        return;
    const bool transmitted = cell.seen.frame().transmitted;
    inColor(cell, transmitted ? green : cyan, [&] {
        cell.line += transmitted ? "TX " : "RX ";
        cell.line += direction(cell.seen);
    });
}

void putTrunk(Cell& cell) {
    if (cell.seen.frame().interface != nullptr)
        appendSafe(cell.line, cell.seen.frame().interface->name);
}

void putPlace(Cell& cell) { appendSafe(cell.line, capture::toString(cell.seen.frame().place)); }

void putTicks(Cell& cell) {
    if (cell.seen.frame().ticks)
        appendNumber(cell.line, *cell.seen.frame().ticks);
}

bool hasOctets(const Seen& seen) { return !seen.frame().octets.empty(); }

void putLink(Cell& cell) {
    if (!hasOctets(cell.seen))
        return;
    appendNumber(cell.line, cell.seen.link.sapi);
    cell.line += '/';
    appendNumber(cell.line, cell.seen.link.tei);
}

void putFrame(Cell& cell) {
    if (hasOctets(cell.seen))
        cell.line += isdn::nameOf(cell.seen.link.type);
}

void putNs(Cell& cell) {
    if (cell.seen.link.hasNs() && hasOctets(cell.seen))
        appendNumber(cell.line, cell.seen.link.ns);
}

void putNr(Cell& cell) {
    if (cell.seen.link.hasNr() && hasOctets(cell.seen))
        appendNumber(cell.line, cell.seen.link.nr);
}

// Appends P for a command and F for a response, or the bit itself while it is not known which of them the
// frame is.
void putPollFinal(Cell& cell) {
    if (!cell.seen.link.hasPf() || !hasOctets(cell.seen))
        return;
    if (!cell.seen.command)
        cell.line += cell.seen.link.pf ? '1' : '0';
    else if (cell.seen.link.pf)
        cell.line += *cell.seen.command ? 'P' : 'F';
    else
        cell.line += '-';
}

void putReference(Cell& cell) { appendCallReference(cell.line, cell.seen); }

void putMessage(Cell& cell) {
    if (cell.seen.isFrame())
        inColor(cell, bold, [&] { appendMessageName(cell.line, cell.seen); });
    else
        inColor(cell, yellow, [&] { appendEvent(cell.line, *cell.seen.item); });
}

void putDetails(Cell& cell) { appendDetails(cell.line, cell.seen); }

void putMarks(Cell& cell) {
    std::string marks;
    appendMarks(marks, cell.seen);
    if (!marks.empty())
        inColor(cell, yellow, [&] { ((cell.line += '[') += marks) += ']'; });
}

void putLength(Cell& cell) { appendNumber(cell.line, cell.seen.frame().octets.size()); }

void putHex(Cell& cell) { appendHex(cell.line, cell.seen.frame().octets); }

// clang-format off
constexpr Column table[] = {
    {"n",       "number of the frame in this run",                            5, true,  putNumber},
    {"time",    "when it passed",                                            29, false, putTime},
    {deltaColumn, "seconds since the line before",                  deltaWidth, true,  putDelta},
    {"trunk",   "name of the D channel",                                      8, false, putTrunk},
    {"place",   "file, and line or packet",                                  20, false, putPlace},
    {"ticks",   "the board's time stamp, of 4 ms",                            8, true,  putTicks},
    {"dir",     "TX or RX, and the sides of the link",                        6, false, putDirection},
    {"link",    "SAPI and TEI",                                               4, false, putLink},
    {"frame",   "type of the frame",                                          5, false, putFrame},
    {"ns",      "N(S)",                                                       3, true,  putNs},
    {"nr",      "N(R)",                                                       3, true,  putNr},
    {"pf",      "P of a command, F of a response",                            1, false, putPollFinal},
    {"length",  "octets of the frame",                                        3, true,  putLength},
    {"ref",     "call reference, from the originator (o) or to it (d)",       5, false, putReference},
    {"message", "name of the message",                                        0, false, putMessage},
    {"details", "what matters of the contents, in words",                     0, false, putDetails},
    {"marks",   "what the link says: retransmitted, link up",                 0, false, putMarks},
    {"hex",     "all octets",                                                 0, false, putHex},
};

static_assert(std::ranges::all_of(table, [](const Column& column) { return column.width <= widestColumn; }));

constexpr struct {
    capture::Item::Kind kind;
    std::string_view words;
    bool counted;
} eventWords[] = {
    {capture::Item::Kind::oversized, "oversized frame, not recorded",                  false},
    {capture::Item::Kind::cut,       "cut frame",                                      false},
    {capture::Item::Kind::lost,      "frames lost by the recorder",                    true},
    {capture::Item::Kind::notQueued, "a frame lost by the recorder: its queue was full", false},
    {capture::Item::Kind::notTaken,  "a frame lost by the recorder: its queue failed", false},
    {capture::Item::Kind::dropped,   "packets dropped by the capture",                 true},
    {capture::Item::Kind::run,       "the recorder started",                           false},
    {capture::Item::Kind::restart,   "the board's clock fell back: it restarted",      false},
    {capture::Item::Kind::replaced,  "the file was replaced or emptied",               false},
    {capture::Item::Kind::mixed,     "two traces in one file",                         false},
    {capture::Item::Kind::unproved,  "lines that no recorder writes",                  true},
    {capture::Item::Kind::damaged,   "damaged",                                        false},
    {capture::Item::Kind::comment,   "comment",                                        false},
};
// clang-format on

isdn::Sender senderOf(const Seen& seen) {
    if (seen.role == capture::Role::unknown)
        return isdn::Sender::unknown;
    const bool sentByNetwork = seen.frame().transmitted == (seen.role == capture::Role::network);
    return sentByNetwork ? isdn::Sender::network : isdn::Sender::user;
}

}  // namespace

std::span<const Column> columns() { return table; }

const Column& columnNamed(std::string_view name) {
    const auto* const found =
        std::find_if(std::begin(table), std::end(table), [&](const Column& c) { return c.name == name; });
    if (found != std::end(table))
        return *found;
    std::string known;
    for (const Column& column : table)
        (known += known.empty() ? "" : ",") += column.name;
    throw UsageError("there is no column " + std::string(name) + " (there are " + known + ")");
}

void appendEvent(std::string& to, const capture::Item& item) {
    const auto* const found = std::find_if(std::begin(eventWords), std::end(eventWords),
                                           [&](const auto& row) { return row.kind == item.kind; });
    to += "-- ";
    to += found->words;
    if (found->counted) {
        to += ": ";
        appendNumber(to, item.count);
    }
    if (!item.text.empty()) {
        to += ": ";
        appendSafe(to, item.text);
    }
}

void appendMessageName(std::string& to, const isdn::Layer3& message) {
    const std::string_view name = isdn::messageName(message);
    if (!name.empty()) {
        to += name;
    } else if (message.hasType) {
        to += message.national ? "national message 0x" : "message 0x";
        appendHex(to, std::span(&message.type, 1));
    } else {
        to += "protocol 0x";
        appendHex(to, std::span(&message.discriminator, 1));
    }
}

void appendMessageName(std::string& to, const Seen& seen) {
    if (seen.hasMessage)
        appendMessageName(to, seen.message);
}

void appendDetails(std::string& to, const Seen& seen) {
    const std::size_t start = to.size();
    if (seen.hasMessage)
        isdn::appendWords(to, seen.message, seen.variant, senderOf(seen));
    else if (seen.link.carriesTeiMessage())
        isdn::appendWords(to, isdn::parseTeiMessage(seen.link.information));
    else if (seen.link.type == isdn::FrameType::FRMR)
        isdn::appendWords(to, isdn::parseFrameReject(seen.link.information));
    makeSafe(to, start);
}

void appendCallReference(std::string& to, const Seen& seen) {
    if (!seen.hasMessage || !seen.message.hasCallReference)
        return;
    const isdn::CallReference& reference = seen.message.callReference;
    if (reference.dummy()) {
        to += "dummy";
        return;
    }
    for (unsigned digits = 2 * std::min<unsigned>(reference.length, 8); digits-- > 0;)
        to += "0123456789abcdef"[reference.value >> 4 * digits & 0xFU];
    to += reference.flag ? 'd' : 'o';
}

}  // namespace reader
