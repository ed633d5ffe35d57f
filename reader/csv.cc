#include "reader/csv.h"

#include <string>

#include "reader/Columns.h"
#include "reader/text.h"

namespace reader {

namespace {

void putText(std::string& to, std::string_view value) {
    to += ',';
    appendCsvValue(to, value);
}

template <std::integral Number>
void putNumberIf(std::string& to, bool present, Number value) {
    to += ',';
    if (present)
        appendNumber(to, value);
}

std::string safeDetails(const Seen& seen) {
    std::string details;
    appendDetails(details, seen);
    return details;
}

std::string messageName(const Seen& seen) {
    std::string name;
    appendMessageName(name, seen);
    return name;
}

std::string_view roleName(capture::Role role) {
    constexpr std::string_view names[] = {"", "user", "network"};
    return names[static_cast<std::size_t>(role)];
}

void putCallReference(std::string& to, const Seen& seen) {
    const bool present = seen.hasMessage && seen.message.hasCallReference;
    to += ',';
    if (present)
        appendNumber(to, seen.message.callReference.value, 16);
    putNumberIf(to, present, present && seen.message.callReference.flag ? 1 : 0);
}

}  // namespace

void appendCsvValue(std::string& to, std::string_view value) {
    if (value.find_first_of(",\"\n\r") == std::string_view::npos) {
        to += value;
        return;
    }
    to += '"';
    for (const char character : value) {
        if (character == '"')
            to += '"';
        to += character;
    }
    to += '"';
}

std::string_view csvHeader() {
    return "n,file,interface,time,seconds,ticks,dir,role,sapi,tei,command,frame,ns,nr,pf,pd,callref,flag,"
           "message,"
           "code,details,marks,hex\n";
}

void CsvComposer::compose(const Seen& seen, std::string& text, Piece& /*piece*/) {
    const capture::Frame& frame = seen.frame();
    if (!seen.isFrame())
        return;
    const isdn::Layer2& link = seen.link;
    appendNumber(text, seen.number);
    putText(text, safe(frame.place.file));
    putText(text, frame.interface != nullptr ? safe(frame.interface->name) : "");
    text += ',';
    if (seen.when.clock == capture::Clock::absolute)
        times_.append(text, seen.when);
    text += ',';
    if (seen.when.clock != capture::Clock::none)
        appendSeconds(text, seen.sinceFirst);
    putNumberIf(text, frame.ticks.has_value(), frame.ticks.value_or(0));
    putText(text, frame.transmitted ? "tx" : "rx");
    putText(text, roleName(seen.role));
    putNumberIf(text, !frame.octets.empty(), link.sapi);
    putNumberIf(text, frame.octets.size() > 1, link.tei);
    putNumberIf(text, seen.command.has_value(), seen.command.value_or(false) ? 1 : 0);
    putText(text, isdn::nameOf(link.type));
    putNumberIf(text, link.hasNs(), link.ns);
    putNumberIf(text, link.hasNr(), link.nr);
    putNumberIf(text, link.hasPf(), link.pf ? 1 : 0);
    putNumberIf(text, seen.hasMessage, seen.message.discriminator);
    putCallReference(text, seen);
    putText(text, messageName(seen));
    putNumberIf(text, seen.hasMessage && seen.message.hasType, seen.message.type);
    putText(text, safeDetails(seen));
    std::string marks;
    appendMarks(marks, seen);
    putText(text, marks);
    text += ',';
    appendHex(text, frame.octets);
    text += '\n';
}

}  // namespace reader
