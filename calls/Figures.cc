#include "calls/Figures.h"

namespace calls {

namespace {

using Nanoseconds = std::optional<std::int64_t>;

constexpr std::array<Measure, measureCount> rows{
    Measure{"first response", "SETUP to the first message of the other side",
            [](const Call& call) -> Nanoseconds { return call.firstResponse; }},
    Measure{"progress", "SETUP to PROGRESS", [](const Call& call) -> Nanoseconds { return call.progress; }},
    Measure{"alerting", "SETUP to ALERTING", [](const Call& call) -> Nanoseconds { return call.alerting; }},
    Measure{"alerting after digits", "the last digit of overlap sending to ALERTING",
            [](const Call& call) -> Nanoseconds {
                if (!call.alerting || !call.lastDigit || *call.alerting < *call.lastDigit)
                    return std::nullopt;
                return *call.alerting - *call.lastDigit;
            }},
    Measure{"connect", "SETUP to CONNECT", [](const Call& call) -> Nanoseconds { return call.connect; }},
    Measure{"conversation", "CONNECT to the first clearing message",
            [](const Call& call) -> Nanoseconds { return call.duration; }},
    Measure{"clearing", "the first clearing message of an answered call to its end",
            [](const Call& call) -> Nanoseconds {
                if (!call.connect || !call.duration || !call.clearingSeen || call.endedBy != EndedBy::release)
                    return std::nullopt;
                return call.end.at - call.begin.at - *call.connect - *call.duration;
            }},
};

CauseKey keyOf(const CauseGiven& cause) {
    return {cause.codingStandard, cause.value, cause.location, cause.from, cause.role, madeBy(cause)};
}

// Whether the network did its part, so that only the called party decided how the call went on (E.425).
bool hasReached(const Call& call) {
    switch (call.outcome) {
        case Outcome::answered:
        case Outcome::busy:
        case Outcome::noAnswer:
        case Outcome::rejected:
            return true;
        case Outcome::abandoned:
            return call.alerting.has_value();
        default:
            return false;
    }
}

std::optional<double> shareOf(std::uint64_t part, std::uint64_t all) {
    if (all == 0)
        return std::nullopt;
    return static_cast<double>(part) / static_cast<double>(all);
}

}  // namespace

std::span<const Measure> measures() { return rows; }

std::optional<double> Traffic::answerSeizureRatio() const { return shareOf(answered, seizures); }

std::optional<double> Traffic::networkEffectivenessRatio() const { return shareOf(reached, seizures); }

void Figures::count(Messages& messages, const Message& message) {
    const isdn::Layer3& layer3 = message.layer3;
    const bool known = layer3.discriminator == isdn::callControl || isdn::isMaintenance(layer3.discriminator);
    MessageKind kind;
    if (known && layer3.hasType)
        kind = {layer3.discriminator, true, layer3.national, layer3.type};
    ++messages[kind][indexOf(message.from())];
}

void Figures::heard(const Messages& messages) {
    for (const auto& [kind, bySide] : messages) {
        for (std::size_t side = 0; side < bySide.size(); ++side)
            messages_[kind][side] += bySide[side];
    }
}

void Figures::gone(const Call& call) {
    countCauses(call);
    countTraffic(call);
    for (std::size_t i = 0; i < rows.size(); ++i) {
        if (const Nanoseconds time = timeOf(call, rows[i].of(call)))
            times_[i][indexOf(call.origin)].add(*time);
    }
}

void Figures::countCauses(const Call& call) {
    if (call.cause)
        ++causes_[keyOf(*call.cause)].first;
    else if (call.clearingSeen)
        ++withoutCause_;
    if (call.causeBefore)
        ++causes_[keyOf(*call.causeBefore)].before;
    for (const CauseGiven& cause : call.laterCauses)
        ++causes_[keyOf(cause)].later;
}

void Figures::countTraffic(const Call& call) {
    Traffic& own = traffic_[indexOf(call.origin)];
    if (call.setupRepeated)
        ++own.setupRepeated;
    std::uint64_t* const excluded = call.kind == Kind::signalling   ? &own.signalling
                                    : call.beforeTrace              ? &own.beforeTrace
                                    : call.gaveWay                  ? &own.gaveWay
                                    : call.outcome == Outcome::open ? &own.open
                                                                    : nullptr;
    if (excluded != nullptr) {
        ++*excluded;
        return;
    }
    const bool answered = call.outcome == Outcome::answered;
    ++own.seizures;
    ++own.byOutcome[static_cast<std::size_t>(call.outcome)];
    own.answered += answered ? 1 : 0;
    own.reached += hasReached(call) ? 1 : 0;
    own.failed += hasFailed(call) ? 1 : 0;
    const std::optional<HourKey> key = hourOf(call.begin);
    if (!key || (hours_.size() >= Occupancy::mostHours && !hours_.contains(*key)))
        return;
    HourFigures& hour = hours_[*key];
    ++hour.seizures[indexOf(call.origin)];
    hour.answered[indexOf(call.origin)] += answered ? 1 : 0;
    hour.failed += hasFailed(call) ? 1 : 0;
}

}  // namespace calls
