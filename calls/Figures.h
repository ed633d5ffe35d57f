// Figures of a trace: messages, causes, times, how many calls succeeded, by direction and by the hour.
#ifndef CALLS_FIGURES_H
#define CALLS_FIGURES_H

#include <array>
#include <compare>
#include <cstdint>
#include <map>
#include <optional>
#include <span>
#include <string_view>

#include "calls/Analysis.h"
#include "calls/Durations.h"
#include "calls/Occupancy.h"
#include "calls/causes.h"

namespace calls {

inline constexpr std::size_t outcomes = 11;  // the number of values of Outcome

// A kind of message. Those of protocols that are not known are one kind.
struct MessageKind {
    std::uint8_t discriminator = 0;
    bool hasType = false;
    bool national = false;  // announced by an escape
    std::uint8_t type = 0;
    auto operator<=>(const MessageKind&) const = default;
};

// A cause, the side that sent it, and where it was made as far as its location tells.
struct CauseKey {
    std::uint8_t codingStandard = 0;
    std::uint8_t value = 0;
    std::uint8_t location = 0;
    Side from = Side::us;
    capture::Role role = capture::Role::unknown;  // of the side that said it
    Made made = Made::unknown;
    auto operator<=>(const CauseKey&) const = default;
};
struct CauseCounts {
    std::uint64_t first = 0;   // it is the call's cause
    std::uint64_t later = 0;   // in a clearing message after the first
    std::uint64_t before = 0;  // in PROGRESS, or from a terminal that refused a call to all
};

// A duration that is measured in each call.
struct Measure {
    std::string_view name;  // "alerting"
    std::string_view meaning;
    std::optional<std::int64_t> (*of)(const Call& call);  // nanoseconds
};
std::span<const Measure> measures();
inline constexpr std::size_t measureCount = 7;

// The calls that one side began.
struct Traffic {
    // Attempts to take a B channel whose result is in the trace. A SETUP and its repetition are one attempt.
    // Not counted are calls that gave way to a call of the other side (they are tried again), connections
    // without a B channel, calls whose SETUP is not in the trace, and calls that are still being set up at
    // its end.
    std::uint64_t seizures = 0;
    std::uint64_t answered = 0;
    // Calls that were answered, or were not because of the called party: busy, no answer, rejected, or hung
    // up while it rang (E.425).
    std::uint64_t reached = 0;
    std::uint64_t failed = 0;
    std::array<std::uint64_t, outcomes> byOutcome{};
    std::uint64_t gaveWay = 0;
    std::uint64_t signalling = 0;
    std::uint64_t beforeTrace = 0;
    std::uint64_t open = 0;
    std::uint64_t setupRepeated = 0;  // calls whose SETUP was repeated

    // Answer-seizure ratio and network effectiveness ratio: shares of the seizures, 0 to 1; empty without
    // seizures.
    std::optional<double> answerSeizureRatio() const;
    std::optional<double> networkEffectivenessRatio() const;
};

struct HourFigures {
    std::array<std::uint64_t, 2> seizures{}, answered{};  // by the side that began the call; by its SETUP
    std::uint64_t failed = 0;
};

// Counts what a calls::Listener is told. Memory is bounded whatever the calls are.
class Figures {
  public:
    // The number of messages of each kind, by side.
    using Messages = std::map<MessageKind, std::array<std::uint64_t, 2>>;

    static void count(Messages& messages, const Message& message);

    void heard(const Message& message) { count(messages_, message); }
    // Adds messages that were counted elsewhere until it was known whether they count.
    void heard(const Messages& messages);
    // Counts a call in which nothing will change any more.
    void gone(const Call& call);

    const Messages& messages() const { return messages_; }
    const std::map<CauseKey, CauseCounts>& causes() const { return causes_; }
    // How many calls were cleared without a cause in the message that should have had one.
    std::uint64_t withoutCause() const { return withoutCause_; }
    // The values of a measure, of the calls that `origin` began.
    const Durations& times(std::size_t measure, Side origin) const {
        return times_[measure][static_cast<std::size_t>(origin)];
    }
    const Traffic& traffic(Side origin) const { return traffic_[static_cast<std::size_t>(origin)]; }
    const std::map<HourKey, HourFigures>& hours() const { return hours_; }

  private:
    void countCauses(const Call& call);
    void countTraffic(const Call& call);

    Messages messages_;
    std::map<CauseKey, CauseCounts> causes_;
    std::uint64_t withoutCause_ = 0;
    std::array<std::array<Durations, 2>, measureCount> times_;
    std::array<Traffic, 2> traffic_;
    std::map<HourKey, HourFigures> hours_;
};

}  // namespace calls

#endif
