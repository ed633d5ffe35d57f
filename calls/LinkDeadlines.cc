// The part of LinkWatch that finds what should have happened on a link by some moment, and has not.
#include <algorithm>

#include "calls/FindingKinds.h"
#include "calls/LinkWatch.h"
#include "calls/linkWords.h"

namespace calls {

namespace {

constexpr std::int64_t notReadyTime = 10 * second;
constexpr unsigned idlePeriods = 3, leastPeriods = 2;

}  // namespace

void LinkWatch::schedule(const Circumstances& around) {
    due_ = never;
    const std::int64_t wait = around.timers->t200 + around.timers->slack;
    const auto by = [&](bool waits, std::int64_t at) {
        if (waits)
            due_ = std::min(due_, at);
    };
    for (const std::size_t side : {std::size_t{0}, std::size_t{1}}) {
        for (const Asked* const asked : {&polls_[side], &setUps_[side], &demands_[side]})
            due_ = std::min(due_, dueOf(*asked, around));
        by(full_[side].holds && !full_[side].reported, full_[side].at + wait);
        by(notReady_[side].holds && !notReady_[side].reported, notReady_[side].at + notReadyTime);
        due_ = std::min(due_, dueOf(idle_[side], around));
    }
    by(silence_ && !silenceEnd_, lastAt_);
}

void LinkWatch::expire(std::int64_t at, const Circumstances& around) {
    if (!silenceEnd_)
        tellSilence();  // the clock goes on and no frame has come
    for (const Side side : bothSides) {
        expireDemands(side, at, around);
        expireSetUps(side, at, around);
        expireWindows(side, at, around);
        expireKeepAlives(side, at, around);
    }
    schedule(around);
}

// When the answer to the last allowed repetition is overdue. Some equipment repeats for ever.
std::int64_t LinkWatch::dueOf(const Asked& asked, const Circumstances& around) {
    if (asked.count <= repetitions200 || asked.reported)
        return never;
    return asked.exhausted + around.timers->t200 + around.timers->slack;
}

std::int64_t LinkWatch::dueOf(const Idle& idle, const Circumstances& around) const {
    const bool expected = idle.seen >= leastPeriods && up_ && around.access != Access::basic &&
                          !keepAliveReported_ && lastFrame_ != 0;
    return expected ? lastAt_ + idlePeriods * idle.period : never;
}

void LinkWatch::expireDemands(Side side, std::int64_t at, const Circumstances& around) {
    Asked& demand = demands_[indexOf(side)];
    if (around.bothHeard && at > dueOf(demand, around)) {
        demand.reported = silent_[indexOf(other(side))] = true;
        observe(findings::oneDirectionSilent, demand.frame, demand.first,
                wordsOf(other(side)) + " sent nothing for " + secondsOf(at - demand.first) + ", although " +
                    wordsOf(side) + " demanded an answer " + std::to_string(demand.count) + " times");
    }
    Asked& poll = polls_[indexOf(side)];
    if (around.bothHeard && at > dueOf(poll, around)) {
        poll.reported = true;
        if (poll.heard)
            observe(findings::pollUnanswered, poll.frame, poll.first,
                    std::to_string(poll.count) + " polls of " + wordsOf(side) + " got no answer");
    }
}

// SABMEs without an answer are not reported after the direction was reported silent, because they follow from
// that.
void LinkWatch::expireSetUps(Side side, std::int64_t at, const Circumstances& around) {
    Asked& setUp = setUps_[indexOf(side)];
    if (at <= dueOf(setUp, around))
        return;
    setUp.reported = true;
    if (!silent_[indexOf(other(side))])
        observe(findings::sabmeUnanswered, setUp.frame, setUp.first,
                wordsOf(side) + " sent SABME " + std::to_string(setUp.count) + " times without an answer");
}

void LinkWatch::expireWindows(Side side, std::int64_t at, const Circumstances& around) {
    Since& full = full_[indexOf(side)];
    if (full.holds && !full.reported && at > full.at + around.timers->t200 + around.timers->slack) {
        full.reported = true;
        if (around.bothHeard && up_ && !notReady_[indexOf(other(side))].holds)
            observe(findings::windowStalled, full.frame, full.at,
                    std::to_string(window_[indexOf(side)]) + " frames of " + wordsOf(side) +
                        " wait for an acknowledgement longer than " + secondsOf(around.timers->t200));
    }
    Since& notReady = notReady_[indexOf(side)];
    if (notReady.holds && !notReady.reported && at > notReady.at + notReadyTime) {
        notReady.reported = true;
        observe(findings::receiverNotReady, notReady.frame, notReady.at,
                wordsOf(side) + " has been not ready to receive for more than " + secondsOf(notReadyTime));
    }
}

void LinkWatch::expireKeepAlives(Side side, std::int64_t at, const Circumstances& around) {
    const Idle& idle = idle_[indexOf(side)];
    if (at <= dueOf(idle, around))
        return;
    keepAliveReported_ = true;
    for (Idle& each : idle_)
        each.missed = true;
    tellSilence();
    silenceEnd_.reset();
    silence_ =
        Observation{&findings::keepAliveMissing, findings::keepAliveMissing.severity, lastFrame_, lastAt_,
                    linkWords() + ": " + wordsOf(side) + " polled every " + secondsOf(idle.period) +
                        ", and then nothing was sent for " + secondsOf(at - lastAt_)};
}

}  // namespace calls
