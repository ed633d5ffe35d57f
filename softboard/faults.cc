#include "softboard/faults.h"

#include <algorithm>
#include <charconv>
#include <stdexcept>

namespace softboard {

namespace {

using enum FaultKind;

constexpr uint32_t any = UINT32_MAX;
constexpr uint32_t longest = 1U << 20;

// clang-format off
constexpr FaultName names[] = {
    {allocateFails,         "allocate-fails",          true,  1,    1, any,     "the Nth allocation of a message buffer fails"},
    {openFails,             "open-fails",              true,  1,    1, any,     "the Nth opening of a queue fails"},
    {bindFails,             "bind-fails",              true,  1,    1, any,     "the Nth binding of a queue fails"},
    {replyLost,             "reply-lost",              true,  1,    1, any,     "the board's Nth reply does not come"},
    {replyLate,             "reply-late",              true,  1,    1, any,     "it comes just before the next one"},
    {replyTwice,            "reply-twice",             true,  1,    1, any,     "it comes twice"},
    {replyType0,            "reply-type-0",            true,  1,    1, any,     "its type is 0"},
    {replyGeneral,          "reply-general",           true,  1,    1, any,     "its type is 8388609"},
    {replyError,            "reply-error",             true,  1,    1, any,     "it is an error message, code 3"},
    {replyOtherSource,      "reply-other-source",      true,  1,    1, any,     "it comes from another instance"},
    {replyWrongTransaction, "reply-wrong-transaction", true,  1,    1, any,     "its transaction is another one"},
    {eventTruncated,        "event-truncated",         true,  10,   0, longest, "a frame's event is cut to N octets"},
    {eventOverlong,         "event-overlong",          true,  1000, 1, longest, "N octets follow the frame in its event"},
    {eventLength,           "event-length",            true,  any,  0, any,     "the event says that the frame has N octets"},
    {eventLabel,            "event-label",             true,  3,    0, any,     "the event's first field is N"},
    {eventType,             "event-type",              true,  999,  0, any,     "the event's message type is N"},
    {eventSource,           "event-source",            true,  99,   0, 65535,   "the event comes from instance N"},
    {burst,                 "burst",                   true,  101,  1, any,     "the first N frames come all at once"},
    {neverWaits,            "never-waits",             false, 0,    0, 0,       "frames come however many wait unread"},
    {eventsWhileStopping,   "events-while-stopping",   true,  200,  1, longest, "N events come before and after the reply to each command that ends the trace"},
    {silent,                "silent",                  true,  100,  0, any,     "after N frames neither frames nor replies come"},
    {offsetStays0,          "offset-stays-0",          false, 0,    0, 0,       "the library leaves the offset at 0 after a body's first field"},
};
// clang-format on

const FaultName& nameOf(FaultKind kind) {
    return *std::find_if(std::begin(names), std::end(names),
                         [kind](const FaultName& row) { return row.kind == kind; });
}

uint32_t parseArgument(const FaultName& row, const std::string& text) {
    uint32_t value = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    const bool whole = error == std::errc{} && end == text.data() + text.size();
    if (!whole || value < row.least || value > row.most) {
        throw std::invalid_argument("the fault " + std::string(row.name) + ": \"" + text +
                                    "\" is no number from " + std::to_string(row.least) + " to " +
                                    std::to_string(row.most));
    }
    return value;
}

}  // namespace

std::span<const FaultName> faultNames() { return names; }

Fault parseFault(const std::string& text) {
    const size_t equals = text.find('=');
    const std::string name = text.substr(0, equals);
    const auto* const row =
        std::find_if(std::begin(names), std::end(names), [&](const FaultName& r) { return name == r.name; });
    if (row == std::end(names)) {
        throw std::invalid_argument("there is no fault \"" + name + "\" (softboard --help lists them)");
    }
    if (equals == std::string::npos) {
        return {row->kind, row->otherwise};
    }
    if (!row->takesNumber) {
        throw std::invalid_argument("the fault " + name + " takes no number");
    }
    return {row->kind, parseArgument(*row, text.substr(equals + 1))};
}

std::string toText(const Fault& fault) {
    const FaultName& row = nameOf(fault.kind);
    return row.takesNumber ? row.name + ("=" + std::to_string(fault.argument)) : row.name;
}

}  // namespace softboard
