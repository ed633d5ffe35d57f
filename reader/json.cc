#include "reader/json.h"

#include "reader/Columns.h"
#include "reader/text.h"

namespace reader {

namespace {

using Kind = capture::Item::Kind;

void putKey(std::string& to, std::string_view key) {
    if (to.back() != '{')
        to += ',';
    ((to += '"') += key) += "\":";
}

void putText(std::string& to, std::string_view key, std::string_view value) {
    putKey(to, key);
    appendJsonString(to, value);
}

template <std::integral Number>
void putNumber(std::string& to, std::string_view key, Number value) {
    putKey(to, key);
    appendNumber(to, value);
}

void putTruth(std::string& to, std::string_view key, bool value) {
    putKey(to, key);
    to += value ? "true" : "false";
}

void putNull(std::string& to, std::string_view key) {
    putKey(to, key);
    to += "null";
}

void putHex(std::string& to, std::string_view key, std::span<const std::uint8_t> octets) {
    putKey(to, key);
    to += '"';
    appendHex(to, octets);
    to += '"';
}

// Appends a number that only some frames have.
template <std::integral Number>
void putNumberIf(std::string& to, std::string_view key, bool present, Number value) {
    if (present)
        putNumber(to, key, value);
    else
        putNull(to, key);
}

std::string_view nameOf(capture::Role role) { return role == capture::Role::user ? "user" : "network"; }

void putField(std::string& to, const isdn::Field& field) {
    to += to.back() == '[' ? "{" : ",{";
    putText(to, "octet", field.octet);
    putText(to, "bits", field.bits());
    putText(to, "name", field.name);
    if (field.at.size() <= sizeof field.value && field.kind != isdn::Field::Kind::text)
        putNumber(to, "value", field.value);
    else
        putHex(to, "value", field.at);
    putText(to, "meaning", field.meaning);
    to += '}';
}

bool isWorthAKey(const isdn::Field& field) {
    using enum isdn::Field::Kind;
    return field.kind != extension && field.kind != spare && field.kind != header;
}

void putMarks(std::string& to, const Seen& seen) {
    std::string marks;
    appendMarks(marks, seen);
    putKey(to, "marks");
    to += '[';
    for (const std::string& mark : splitAtCommas(marks)) {
        if (to.back() != '[')
            to += ',';
        appendJsonString(to, std::string_view(mark).substr(mark.front() == ' ' ? 1 : 0));
    }
    to += ']';
}

void putTruthIf(std::string& to, std::string_view key, std::optional<bool> value) {
    if (value)
        putTruth(to, key, *value);
    else
        putNull(to, key);
}

}  // namespace

void appendJsonString(std::string& to, std::string_view text) {
    to += '"';
    for (const char character : text) {
        const auto octet = static_cast<unsigned char>(character);
        if (octet >= ' ' && octet < 0x7F && octet != '"' && octet != '\\') {
            to += character;
        } else {
            constexpr char digits[] = "0123456789abcdef";
            const char escape[] = {'\\', 'u', '0', '0', digits[octet >> 4], digits[octet & 15]};
            to.append(escape, sizeof escape);
        }
    }
    to += '"';
}

void JsonComposer::compose(const Seen& seen, std::string& text, Piece& /*piece*/) {
    const capture::Frame& frame = seen.frame();
    text += '{';
    putNumber(text, "v", jsonVersion);
    putNumberIf(text, "n", seen.number != 0, seen.number);
    putText(text, "file", frame.place.file);
    putText(text, "interface", frame.interface != nullptr ? std::string_view(frame.interface->name) : "");
    putKey(text, "time");
    if (seen.when.clock == capture::Clock::absolute) {
        text += '"';
        times_.append(text, seen.when);
        text += '"';
    } else {
        text += "null";
    }
    putKey(text, "seconds");
    if (seen.when.clock == capture::Clock::none)
        text += "null";
    else
        appendSeconds(text, seen.sinceFirst);
    putNumberIf(text, "ticks", frame.ticks.has_value(), frame.ticks.value_or(0));
    if (!seen.isFrame()) {
        putText(text, "event", capture::kindName(seen.item->kind));
        putNumber(text, "count", seen.item->count);
        putText(text, "text", seen.item->text);
        putTruth(text, "oversized", seen.item->kind == Kind::oversized);
    }
    if (seen.number != 0)
        putFrame(text, seen);
    text += "}\n";
}

void JsonComposer::putFrame(std::string& text, const Seen& seen) {
    const capture::Frame& frame = seen.frame();
    putText(text, "dir", frame.transmitted ? "tx" : "rx");
    if (seen.role == capture::Role::unknown)
        putNull(text, "role");
    else
        putText(text, "role", nameOf(seen.role));
    if (frame.octets.empty())
        return;
    const isdn::Layer2& link = seen.link;
    putNumber(text, "sapi", link.sapi);
    putNumberIf(text, "tei", link.octets.size() > 1, link.tei);
    putTruthIf(text, "command", seen.command);
    putText(text, "frame", isdn::nameOf(link.type));
    putNumberIf(text, "ns", link.hasNs(), link.ns);
    putNumberIf(text, "nr", link.hasNr(), link.nr);
    putNumberIf(text, "pf", link.hasPf(), link.pf ? 1 : 0);
    if (link.problem != isdn::Problem::none)
        putText(text, "problem", isdn::nameOf(link.problem));
    putTruth(text, "retransmission", seen.marks.retransmitted);
    putTruthIf(text, "accepted", seen.marks.accepted);
    if (seen.hasMessage)
        putMessage(text, seen);
    putMarks(text, seen);
    putHex(text, "hex", frame.octets);
}

void JsonComposer::putMessage(std::string& text, const Seen& seen) {
    const isdn::Layer3& message = seen.message;
    putNumber(text, "pd", message.discriminator);
    if (message.hasCallReference) {
        putKey(text, "callref");
        text += '{';
        putNumber(text, "value", message.callReference.value);
        putNumber(text, "flag", message.callReference.flag ? 1 : 0);
        putNumber(text, "length", message.callReference.length);
        text += '}';
    }
    if (message.hasType) {
        putText(text, "message", isdn::messageName(message));
        putNumber(text, "code", message.type);
    }
    putKey(text, "elements");
    text += '[';
    for (const isdn::Element& element : message.elements)
        putElement(text, element, seen.variant);
    text += ']';
}

void JsonComposer::putElement(std::string& text, const isdn::Element& element, isdn::Variant variant) {
    fields_.clear();
    const isdn::Problem problem = isdn::fieldsOf(element, variant, fields_);
    text += text.back() == '[' ? "{" : ",{";
    putNumber(text, "codeset", element.codeset);
    putNumber(text, "id", element.id);
    putText(text, "name", isdn::elementName(element, variant));
    putHex(text, "hex", element.octets);
    putKey(text, "fields");
    text += '[';
    for (const isdn::Field& field : fields_) {
        if (isWorthAKey(field))
            putField(text, field);
    }
    text += ']';
    if (problem == isdn::Problem::none)
        putNull(text, "problem");
    else
        putText(text, "problem", isdn::nameOf(problem));
    text += '}';
}

}  // namespace reader
