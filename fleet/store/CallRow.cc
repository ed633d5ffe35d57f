#include "fleet/store/CallRow.h"

#include <array>
#include <string>
#include <string_view>

#include "calls/causes.h"
#include "isdn/values.h"

namespace fleet {

namespace {

using calls::Call;

Field textOf(std::string_view text) { return std::string(text); }
// The text in characters that the database takes.
Field safeText(std::string_view text) { return printable(text, text.size()); }

template <class Number>
Field numberOf(const std::optional<Number>& number) {
    return number ? Field(std::to_string(*number)) : std::nullopt;
}

Field millisecondsOf(const std::optional<std::int64_t>& nanoseconds) {
    return nanoseconds ? Field(std::to_string(*nanoseconds / 1'000'000)) : std::nullopt;
}

Field timeOf(const calls::Moment& moment) {
    return moment.clock == capture::Clock::absolute ? Field(timestampText(moment.time)) : std::nullopt;
}

Field causeOf(const std::optional<calls::CauseGiven>& cause) {
    return cause ? Field(std::to_string(cause->value)) : std::nullopt;
}

// "0378", as lapdread shows it.
Field referenceOf(const Call& call) {
    constexpr std::string_view digits = "0123456789abcdef";
    std::string text;
    for (unsigned i = call.referenceLength > 1 ? 4 : 2; i-- > 0;)
        text += digits[(call.reference >> (4 * i)) & 15U];
    return text;
}

Field directionOf(const Call& call) {
    using enum capture::Role;
    return call.originRole == user ? "U>N" : call.originRole == network ? "N>U" : "?>?";
}

Field laterCausesOf(const Call& call) {
    std::string text;
    for (const calls::CauseGiven& cause : call.laterCauses)
        text += (text.empty() ? "" : " ") + std::to_string(cause.value);
    return text;
}

struct Column {
    const char* name;
    Field (*value)(const Call& call);
};

// clang-format off
constexpr std::array columns{
    Column{"first_frame",       [](const Call& c) { return Field(std::to_string(c.begin.frame)); }},
    Column{"last_frame",        [](const Call& c) { return Field(std::to_string(c.end.frame)); }},
    Column{"began",             [](const Call& c) { return timeOf(c.begin); }},
    Column{"ended",             [](const Call& c) { return c.endedBy == calls::EndedBy::open ? std::nullopt : timeOf(c.end); }},
    Column{"last_at",           [](const Call& c) { return timeOf(c.end); }},
    Column{"tei",               [](const Call& c) { return Field(std::to_string(c.tei)); }},
    Column{"callref",           referenceOf},
    Column{"origin",            [](const Call& c) { return textOf(c.origin == calls::Side::us ? "us" : "peer"); }},
    Column{"dir",               directionOf},
    Column{"kind",              [](const Call& c) { return textOf(nameOf(c.kind)); }},
    Column{"calling",           [](const Call& c) { return safeText(c.calling.digits); }},
    Column{"called",            [](const Call& c) { return safeText(c.called.digits); }},
    Column{"redirecting",       [](const Call& c) { return safeText(c.redirecting.digits); }},
    Column{"connected",         [](const Call& c) { return safeText(c.connected.digits); }},
    Column{"bearer",            [](const Call& c) { return safeText(c.bearer); }},
    Column{"channel_asked",     [](const Call& c) { return textOf(c.askedWords); }},
    Column{"exclusive",         [](const Call& c) { return c.asked ? textOf(c.asked->exclusive ? "t" : "f") : std::nullopt; }},
    Column{"channel",           [](const Call& c) { return textOf(c.granted ? c.grantedWords : c.askedWords); }},
    Column{"first_response_ms", [](const Call& c) { return millisecondsOf(c.firstResponse); }},
    Column{"progress_ms",       [](const Call& c) { return millisecondsOf(c.progress); }},
    Column{"alerting_ms",       [](const Call& c) { return millisecondsOf(c.alerting); }},
    Column{"connect_ms",        [](const Call& c) { return millisecondsOf(c.connect); }},
    Column{"duration_ms",       [](const Call& c) { return millisecondsOf(c.duration); }},
    Column{"outcome",           [](const Call& c) { return textOf(nameOf(c.outcome)); }},
    Column{"ended_by",          [](const Call& c) { return textOf(nameOf(c.endedBy)); }},
    Column{"cleared_by",        [](const Call& c) { return textOf(nameOf(c.clearedBy)); }},
    Column{"cause",             [](const Call& c) { return causeOf(c.cause); }},
    Column{"location",          [](const Call& c) { return textOf(c.cause ? isdn::locationName(c.cause->location) : ""); }},
    Column{"made",              [](const Call& c) { return textOf(c.cause ? nameOf(madeBy(*c.cause)) : ""); }},
    Column{"cause_before",      [](const Call& c) { return causeOf(c.causeBefore); }},
    Column{"causes",            laterCausesOf},
    Column{"flags",             [](const Call& c) { return Field(flagsOf(c)); }},
    Column{"failed",            [](const Call& c) { return textOf(hasFailed(c) ? "t" : "f"); }},
};
// clang-format on

constexpr std::size_t ofTheRun = 2;
static_assert(std::tuple_size_v<CallRow> == ofTheRun + columns.size());

StagedTable<std::tuple_size_v<CallRow>> makeCallsTable() {
    StagedTable<std::tuple_size_v<CallRow>> table{
        "calls", {"trunk", "run"}, "(trunk, run, first_frame) DO UPDATE SET "};
    for (std::size_t i = 0; i < columns.size(); ++i) {
        const std::string name = columns[i].name;
        table.columns[ofTheRun + i] = name;
        if (i != 0)
            table.onConflict += ", ";
        (table.onConflict += name) += " = EXCLUDED.";
        table.onConflict += name;
    }
    return table;
}

}  // namespace

const StagedTable<std::tuple_size_v<CallRow>>& callsTable() {
    static const auto table = makeCallsTable();
    return table;
}

CallRow rowOf(const RunKey& run, const Call& call) {
    CallRow row{std::to_string(run.trunk), std::to_string(run.run)};
    for (std::size_t i = 0; i < columns.size(); ++i)
        row[ofTheRun + i] = columns[i].value(call);
    return row;
}

const StagedTable<std::tuple_size_v<FindingRow>>& findingsTable() {
    static const StagedTable<std::tuple_size_v<FindingRow>> table{
        "findings",
        {"trunk", "run", "frame", "kind", "ordinal", "severity", "at", "first_frame", "count", "sentence"},
        "DO NOTHING"};
    return table;
}

FindingRow rowOf(const RunKey& run, const calls::Finding& finding, std::uint32_t ordinal,
                 std::optional<std::uint64_t> firstFrame) {
    return {std::to_string(run.trunk),
            std::to_string(run.run),
            std::to_string(finding.frame),
            textOf(finding.kind->id),
            std::to_string(ordinal),
            std::to_string(static_cast<int>(finding.severity)),
            timeOf({finding.frame, 0, finding.clock, finding.time}),
            numberOf(firstFrame),
            std::to_string(finding.count),
            safeText(finding.sentence)};
}

}  // namespace fleet
