#include "reader/CallFields.h"

#include <array>
#include <optional>

#include "calls/causes.h"
#include "isdn/values.h"
#include "reader/csv.h"
#include "reader/json.h"
#include "reader/text.h"

namespace reader {

namespace {

using calls::Call;

void putMilliseconds(std::string& to, const std::optional<std::int64_t>& nanoseconds) {
    if (nanoseconds)
        appendNumber(to, *nanoseconds / 1'000'000);
}

void putCause(std::string& to, const std::optional<calls::CauseGiven>& cause) {
    if (cause)
        appendNumber(to, cause->value);
}

void putLocation(std::string& to, const Call& call) {
    if (call.cause)
        to += isdn::locationName(call.cause->location);
}

std::string_view originOf(const Call& call) { return call.origin == calls::Side::us ? "us" : "peer"; }

void putLaterCauses(std::string& to, const Call& call) {
    bool first = true;
    for (const calls::CauseGiven& cause : call.laterCauses) {
        if (!first)
            to += ' ';
        first = false;
        appendNumber(to, cause.value);
    }
}

using enum CallField::Kind;
constexpr std::array fields{
    CallField{"call", number,
              [](std::string& to, const Call& call, TimeText&) { appendNumber(to, call.number); }},
    CallField{"file", text, [](std::string& to, const Call& call, TimeText&) { to += call.file; }},
    CallField{"dchannel", text, [](std::string& to, const Call& call, TimeText&) { to += call.dChannel; }},
    CallField{
        "start", text,
        [](std::string& to, const Call& call, TimeText& times) { appendInstant(to, call.begin, times); }},
    CallField{"end", text,
              [](std::string& to, const Call& call, TimeText& times) {
                  if (call.endedBy != calls::EndedBy::open)
                      appendInstant(to, call.end, times);
              }},
    CallField{"tei", number,
              [](std::string& to, const Call& call, TimeText&) { appendNumber(to, call.tei); }},
    CallField{"callref", text,
              [](std::string& to, const Call& call, TimeText&) { appendReference(to, call); }},
    CallField{"origin", text, [](std::string& to, const Call& call, TimeText&) { to += originOf(call); }},
    CallField{"dir", text, [](std::string& to, const Call& call, TimeText&) { to += directionOf(call); }},
    CallField{"kind", text, [](std::string& to, const Call& call, TimeText&) { to += nameOf(call.kind); }},
    CallField{"calling", text,
              [](std::string& to, const Call& call, TimeText&) { to += call.calling.digits; }},
    CallField{"called", text, [](std::string& to, const Call& call, TimeText&) { to += call.called.digits; }},
    CallField{"redirecting", text,
              [](std::string& to, const Call& call, TimeText&) { to += call.redirecting.digits; }},
    CallField{"connected", text,
              [](std::string& to, const Call& call, TimeText&) { to += call.connected.digits; }},
    CallField{"bearer", text, [](std::string& to, const Call& call, TimeText&) { to += call.bearer; }},
    CallField{"channel_asked", text,
              [](std::string& to, const Call& call, TimeText&) { to += call.askedWords; }},
    CallField{"exclusive", number,
              [](std::string& to, const Call& call, TimeText&) {
                  if (call.asked)
                      to += call.asked->exclusive ? '1' : '0';
              }},
    CallField{"channel", text,
              [](std::string& to, const Call& call, TimeText&) {
                  to += call.granted ? call.grantedWords : call.askedWords;
              }},
    CallField{"first_response_ms", number,
              [](std::string& to, const Call& call, TimeText&) {
                  putMilliseconds(to, timeOf(call, call.firstResponse));
              }},
    CallField{"progress_ms", number,
              [](std::string& to, const Call& call, TimeText&) {
                  putMilliseconds(to, timeOf(call, call.progress));
              }},
    CallField{"alerting_ms", number,
              [](std::string& to, const Call& call, TimeText&) {
                  putMilliseconds(to, timeOf(call, call.alerting));
              }},
    CallField{"connect_ms", number,
              [](std::string& to, const Call& call, TimeText&) {
                  putMilliseconds(to, timeOf(call, call.connect));
              }},
    CallField{"duration_ms", number,
              [](std::string& to, const Call& call, TimeText&) {
                  putMilliseconds(to, timeOf(call, call.duration));
              }},
    CallField{"outcome", text,
              [](std::string& to, const Call& call, TimeText&) { to += nameOf(call.outcome); }},
    CallField{"ended_by", text,
              [](std::string& to, const Call& call, TimeText&) { to += nameOf(call.endedBy); }},
    CallField{"cleared_by", text,
              [](std::string& to, const Call& call, TimeText&) { to += nameOf(call.clearedBy); }},
    CallField{"cause", number,
              [](std::string& to, const Call& call, TimeText&) { putCause(to, call.cause); }},
    CallField{"location", text, [](std::string& to, const Call& call, TimeText&) { putLocation(to, call); }},
    CallField{"made", text,
              [](std::string& to, const Call& call, TimeText&) {
                  if (call.cause)
                      to += nameOf(madeBy(*call.cause));
              }},
    CallField{"cause_before", number,
              [](std::string& to, const Call& call, TimeText&) { putCause(to, call.causeBefore); }},
    CallField{"causes", text, [](std::string& to, const Call& call, TimeText&) { putLaterCauses(to, call); }},
    CallField{"first_frame", number,
              [](std::string& to, const Call& call, TimeText&) { appendNumber(to, call.begin.frame); }},
    CallField{"last_frame", number,
              [](std::string& to, const Call& call, TimeText&) { appendNumber(to, call.end.frame); }},
    CallField{"flags", text, [](std::string& to, const Call& call, TimeText&) { to += flagsOf(call); }},
};

}  // namespace

void appendReference(std::string& to, const Call& call) {
    constexpr std::string_view digits = "0123456789abcdef";
    const unsigned shown = call.referenceLength > 1 ? 4 : 2;
    for (unsigned i = shown; i-- > 0;)
        to += digits[(call.reference >> (4 * i)) & 15U];
}

std::string_view directionOf(const Call& call) {
    switch (call.originRole) {
        case capture::Role::user:
            return "U>N";
        case capture::Role::network:
            return "N>U";
        case capture::Role::unknown:
            break;
    }
    return "?>?";
}

void appendInstant(std::string& to, const calls::Moment& moment, TimeText& times) {
    if (moment.clock != capture::Clock::none)
        times.append(to, {moment.clock, moment.time});
}

std::span<const CallField> callFields() { return fields; }

std::string callCsvHeader() {
    std::string header;
    for (const CallField& field : fields) {
        if (!header.empty())
            header += ',';
        header += field.key;
    }
    return header + "\n";
}

void appendCallCsv(std::string& to, const Call& call, TimeText& times) {
    bool first = true;
    std::string value;
    for (const CallField& field : fields) {
        if (!first)
            to += ',';
        first = false;
        value.clear();
        field.put(value, call, times);
        appendCsvValue(to, safe(value));
    }
    to += '\n';
}

void appendCallJson(std::string& to, const Call& call, TimeText& times) {
    to += "{\"v\":";
    appendNumber(to, jsonVersion);
    std::string value;
    for (const CallField& field : fields) {
        value.clear();
        field.put(value, call, times);
        to += ',';
        appendJsonString(to, field.key);
        to += ':';
        if (value.empty())
            to += "null";
        else if (field.kind == number)
            to += value;
        else
            appendJsonString(to, value);
    }
    to += ",\"frames\":[";
    for (std::size_t i = 0; i < call.frames.size(); ++i) {
        if (i != 0)
            to += ',';
        appendNumber(to, call.frames[i]);
    }
    to += "]}\n";
}

}  // namespace reader
