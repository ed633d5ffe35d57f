#include "calls/Call.h"

#include <algorithm>
#include <array>

namespace calls {

namespace {

template <typename Enum, std::size_t N>
std::string_view named(const std::array<std::string_view, N>& names, Enum value) {
    return names[static_cast<std::size_t>(value)];
}

constexpr std::uint8_t normalClearing = 16;
constexpr std::uint8_t normalUnspecified = 31;

bool endedNormally(const Call& call) {
    if (call.endedBy == EndedBy::link || call.endedBy == EndedBy::restart)
        return false;
    return !call.cause || call.cause->value == normalClearing || call.cause->value == normalUnspecified;
}

}  // namespace

Moment momentOf(const Message& message) {
    const bool timed = message.frame->clock != capture::Clock::none || message.frame->ticks;
    return {message.number, message.at, message.frame->clock, message.frame->time, timed};
}

std::string_view nameOf(Kind kind) {
    return named(std::array<std::string_view, 2>{"call", "signalling"}, kind);
}

std::string_view nameOf(Phase phase) {
    return named(std::array<std::string_view, 5>{"set-up", "talking", "clearing", "held", "ended"}, phase);
}

std::string_view nameOf(EndedBy endedBy) {
    return named(
        std::array<std::string_view, 6>{"open", "release", "restart", "link", "replaced", "suspended"},
        endedBy);
}

std::string_view nameOf(ClearedBy clearedBy) {
    return named(std::array<std::string_view, 5>{"unknown", "us", "peer", "both", "nobody"}, clearedBy);
}

std::string_view nameOf(Outcome outcome) {
    return named(
        std::array<std::string_view, 11>{"open", "answered", "busy", "no-answer", "abandoned", "rejected",
                                         "number", "incompatible", "congestion", "protocol", "other"},
        outcome);
}

std::string flagsOf(const Call& call) {
    struct Flag {
        bool set;
        std::string_view name;
    };
    const std::array flags{
        Flag{call.beforeTrace, "before-trace"}, Flag{call.endedBy == EndedBy::open, "open"},
        Flag{call.uncertain, "uncertain"},      Flag{call.setupRepeated, "setup-repeated"},
        Flag{call.overlap, "overlap"},          Flag{call.broadcast, "broadcast"},
        Flag{call.resumes != 0, "resumed"},     Flag{call.gaveWay, "glare"},
    };
    std::string words;
    for (const Flag& flag : flags) {
        if (flag.set)
            words.append(words.empty() ? "" : " ").append(flag.name);
    }
    return words;
}

bool hasFailed(const Call& call) {
    switch (call.outcome) {
        case Outcome::answered:
            return call.endedBy != EndedBy::open && !endedNormally(call);
        case Outcome::open:
        case Outcome::busy:
        case Outcome::noAnswer:
        case Outcome::abandoned:
        case Outcome::rejected:
            return false;
        default:
            return (call.kind == Kind::call && !call.beforeTrace) || !endedNormally(call);
    }
}

bool isUnanswered(const Call& call) {
    return call.outcome != Outcome::answered && call.outcome != Outcome::open && call.kind == Kind::call;
}

}  // namespace calls
