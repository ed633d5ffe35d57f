#include "calls/LinkWatch.h"

#include <algorithm>
#include <utility>

#include "calls/FindingKinds.h"
#include "calls/linkWords.h"

namespace calls {

using isdn::FrameType;

namespace {

constexpr std::int64_t flapTime = 60 * second;
constexpr std::size_t flapTimes = 3;
constexpr std::int64_t hour = 3600 * second;
// Fewer repetitions, or on fewer occasions, do not show a line that loses frames.
constexpr std::uint64_t leastRepeated = 10, leastOccasions = 3;

bool isSetUp(FrameType type) { return type == FrameType::SABME || type == FrameType::SABM; }

bool isPoll(const Sample& sample) {
    return sample.layer2.hasNr() && sample.layer2.pf && sample.command.value_or(false);
}

bool isFinal(const Sample& sample) {
    return sample.layer2.hasNr() && sample.layer2.pf && sample.command && !*sample.command;
}

}  // namespace

std::string LinkWatch::linkWords() const { return "TEI " + std::to_string(tei_); }

void LinkWatch::observe(const FindingKind& kind, std::uint64_t frame, std::int64_t at, std::string sentence,
                        std::optional<Severity> severity) {
    observations_.push_back(
        {&kind, severity.value_or(kind.severity), frame, at, linkWords() + ": " + std::move(sentence)});
}

void LinkWatch::take(const DChannel& channel, const Sample& sample, const Circumstances& around) {
    const Marks& marks = channel.marks();
    const std::size_t from = indexOf(sample.from()), to = indexOf(other(sample.from()));
    demands_[to] = {};
    silent_[from] = false;
    for (std::array<Asked, 2>* const asked : {&polls_, &setUps_})
        (*asked)[to].heard = true;
    endSilence(channel, sample, around);
    keepAlives(sample, marks);
    polls(sample);
    setUps(sample, marks, around);
    demands(sample, around);
    if (sample.layer2.hasNr() && channel.link() != nullptr)
        windows(sample, *channel.link(), around);
    if (marks.linkUp || marks.linkDown)
        notReady_ = {};  // the link was set up again, so both sides are ready
    if (sample.layer2.type == FrameType::I)
        repetitions(sample, marks);
    up_ = marks.state == LinkState::up;
    keepAliveReported_ = false;
    lastFrame_ = sample.number;
    lastAt_ = sample.at;
    schedule(around);
}

// A frame with F answers a poll. SABME, DISC and DM end the wait for the answer.
void LinkWatch::polls(const Sample& sample) {
    if (isSetUp(sample.layer2.type) || sample.layer2.type == FrameType::DISC ||
        sample.layer2.type == FrameType::DM) {
        polls_ = {};
        return;
    }
    if (isPoll(sample)) {
        polls_[indexOf(sample.from())].add(sample);
    } else if (isFinal(sample)) {
        Asked& asked = polls_[indexOf(other(sample.from()))];
        if (asked.count > 1 && !asked.reported)
            observe(findings::pollUnanswered, asked.frame, asked.first,
                    std::to_string(asked.count - 1) + " of " + wordsOf(other(sample.from())) +
                        "'s polls got no answer before one was answered",
                    Severity::note);
        asked = {};
    }
}

void LinkWatch::setUps(const Sample& sample, const Marks& marks, const Circumstances& around) {
    const Side from = sample.from();
    if (isSetUp(sample.layer2.type)) {
        setUps_[indexOf(from)].add(sample);
    } else if (sample.layer2.type == FrameType::UA || sample.layer2.type == FrameType::DM) {
        setUps_[indexOf(other(from))] = {};
    } else if (sample.layer2.hasNr() && marks.state == LinkState::up) {
        setUps_ = {};
    }
    if (sample.layer2.type == FrameType::DISC)
        released_ = true;
    if (sample.layer2.type == FrameType::DM)
        lost_ = lost_ || up_;  // several DMs may tell of one loss
    flaps(sample, marks, around);
}

// Flaps are not reported on basic access, which sets its links up as needed, nor on a standby D channel,
// which carries nothing that could be lost.
void LinkWatch::flaps(const Sample& sample, const Marks& marks, const Circumstances& around) {
    const bool mayFlap =
        around.access != Access::basic && !around.outOfService && (sentInformation_ || !around.grouped);
    if (isSetUp(sample.layer2.type) && up_ && mayFlap)
        observe(findings::linkFlap, sample.number, sample.at,
                wordsOf(sample.from()) + " set the link up again while it was up");
    if (!marks.linkUp)
        return;
    const bool again = std::exchange(lost_, false) && !released_;
    released_ = false;
    if (!again)
        return;
    setUpTimes_.push_back(sample.at);
    if (setUpTimes_.size() > flapTimes)
        setUpTimes_.erase(setUpTimes_.begin());
    if (mayFlap && setUpTimes_.size() == flapTimes && sample.at - setUpTimes_.front() <= flapTime)
        observe(findings::linkFlap, sample.number, sample.at,
                "set up again " + std::to_string(flapTimes) + " times within " +
                    secondsOf(sample.at - setUpTimes_.front()));
}

// Once the window is full, the sender waits for the receiver, which may say that it is not ready.
void LinkWatch::windows(const Sample& sample, const Link& link, const Circumstances& around) {
    const FrameType type = sample.layer2.type;
    Since& notReady = notReady_[indexOf(sample.from())];
    if (type == FrameType::RNR)
        notReady.begin(sample);
    else if (type == FrameType::RR || type == FrameType::REJ)
        notReady = {};
    sentInformation_ = sentInformation_ || type == FrameType::I;
    for (const Side sender : bothSides) {
        const unsigned outstanding = link.sentBy(sender).outstanding();
        unsigned& window = window_[indexOf(sender)];
        window = std::max(window, outstanding);
        const unsigned least = around.access == Access::basic ? 1 : 7;
        Since& full = full_[indexOf(sender)];
        if (outstanding < std::max(window, least))
            full = {};
        else
            full.begin(sample);
    }
}

// I frames and polls demand some answer. A burst of them is one demand.
void LinkWatch::demands(const Sample& sample, const Circumstances& around) {
    if (sample.layer2.type != FrameType::I && !isPoll(sample))
        return;
    Asked& asked = demands_[indexOf(sample.from())];
    if (asked.count > 0 && sample.at - asked.last < around.timers->t200 * 9 / 10)
        return;
    asked.add(sample);
}

// Learns how often a side polls while nothing else happens.
void LinkWatch::keepAlives(const Sample& sample, const Marks& marks) {
    const bool keepsAlive = sample.layer2.type == FrameType::RR && sample.layer2.pf && !marks.pollUnanswered;
    if (!keepsAlive) {
        for (Idle& idle : idle_)
            idle.busy = true;
        return;
    }
    if (!isPoll(sample))
        return;
    Idle& idle = idle_[indexOf(sample.from())];
    if (idle.last && !idle.busy)
        learnPeriod(idle, sample.at - *idle.last);
    idle.last = sample.at;
    idle.busy = idle.missed = false;
}

// A time in which polls were missing is no period, unless it comes twice in a row. Then the side polls less
// often than before.
void LinkWatch::learnPeriod(Idle& idle, std::int64_t period) {
    if (idle.missed && !std::exchange(idle.slower, true))
        return;
    const bool same = std::abs(period - idle.period) <= idle.period / 4;
    if (same) {
        ++idle.seen;
        idle.slower = false;
    } else if (period > idle.period) {
        idle.seen = 1;
    }
    idle.period = std::max(idle.period, period);
}

// The silence was on the link only if the recorder has not missed frames meanwhile.
void LinkWatch::endSilence(const DChannel& channel, const Sample& sample, const Circumstances& around) {
    if (!silence_)
        return;
    if (!silenceEnd_)
        silenceEnd_ = sample.at;
    const Link* const link = channel.link();
    const bool lacksFrames =
        channel.marks().unseenSetUp ||
        (link != nullptr && (link->mayLackFramesOf(Side::us) || link->mayLackFramesOf(Side::peer))) ||
        std::ranges::any_of(channel.events(), [](const LinkEvent& event) {
            return event.kind == LinkEvent::Kind::hole && event.by != LostBy::line;
        });
    if (lacksFrames)
        silence_.reset();
    else if (channel.marks().state != LinkState::up || sample.at - *silenceEnd_ > around.timers->t203)
        tellSilence();
}

void LinkWatch::tellSilence() {
    if (silence_)
        observations_.push_back(*std::exchange(silence_, std::nullopt));
}

void LinkWatch::repetitions(const Sample& sample, const Marks& marks) {
    Repeated& repeated = repeated_[indexOf(sample.from())];
    if (repeated.sent > 0 && sample.at - repeated.since >= hour)
        endHour(repeated, sample.from());
    if (repeated.sent++ == 0)
        repeated.since = sample.at;
    if (marks.retransmitted) {
        ++repeated.again;
        if (!repeated.running)
            ++repeated.occasions;
        repeated.lastAgain = sample.number;
        repeated.lastAgainAt = sample.at;
    }
    repeated.running = marks.retransmitted;
}

void LinkWatch::endHour(Repeated& repeated, Side side) {
    if (repeated.again * 100 > repeated.sent && repeated.again >= leastRepeated &&
        repeated.occasions >= leastOccasions)
        observe(findings::retransmissions, repeated.lastAgain, repeated.lastAgainAt,
                std::to_string(repeated.again) + " of " + std::to_string(repeated.sent) + " I frames of " +
                    wordsOf(side) + " were sent again within an hour");
    repeated = {};
}

void LinkWatch::Asked::add(const Sample& sample) {
    if (count == 0)
        *this = {0, sample.number, sample.at, sample.at};
    ++count;
    last = sample.at;
    if (count == repetitions200 + 1)
        exhausted = sample.at;
}

void LinkWatch::forget() {
    polls_ = setUps_ = demands_ = {};
    full_ = notReady_ = {};
    for (Idle& idle : idle_)
        idle = {.last = std::nullopt, .busy = true, .period = idle.period, .seen = idle.seen};
    setUpTimes_.clear();
    silent_ = {};
    silence_.reset();
    released_ = lost_ = up_ = false;
    lastFrame_ = 0;
    due_ = never;
}

void LinkWatch::finish() {
    tellSilence();
    for (const Side side : bothSides)
        endHour(repeated_[indexOf(side)], side);
}

}  // namespace calls
