#include "calls/Link.h"

#include <utility>

namespace calls {

using isdn::FrameType;

namespace {

// Keep-alives are not hidden within this time of an event. It is as long as a link may be idle before it is
// polled (T203).
constexpr std::int64_t nearby = 10 * second;

}  // namespace

std::string_view nameOf(LinkState state) {
    constexpr std::array<std::string_view, 5> names{"unknown", "down", "establishing", "up", "releasing"};
    return names[static_cast<std::size_t>(state)];
}

Marks Link::take(Sample& sample, std::vector<LinkEvent>& events, std::vector<KeptFrame>& late) {
    Marks marks;
    const std::size_t eventsBefore = events.size();
    const CommandBits::Lesson lesson =
        commands_.learn(sample.layer2, sample.from(), sample.at, timers_->t200);
    marks.contradictsRole = lesson == CommandBits::Lesson::contradicted;
    if (lesson == CommandBits::Lesson::contradicted || lesson == CommandBits::Lesson::sameRole)
        events.push_back({lesson == CommandBits::Lesson::sameRole ? LinkEvent::Kind::sameRole
                                                                  : LinkEvent::Kind::contradiction,
                          sample.from(), sample.number, sample.at});
    if (!sample.command)
        sample.command = commands_.isCommand(sample.layer2.cr, sample.from());
    if (!sample.command)
        sample.command = sample.assumed;
    switch (sample.layer2.type) {
        case FrameType::SABME:
        case FrameType::SABM:
            setUp(sample, marks, events);
            break;
        case FrameType::UA:
            answer(sample, marks, events);
            break;
        case FrameType::DM:
            refuse(sample, marks, events);
            break;
        case FrameType::DISC:
            release(sample, events);
            break;
        case FrameType::FRMR:
            events.push_back({LinkEvent::Kind::frameReject, sample.from(), sample.number, sample.at});
            break;
        case FrameType::I:
            supervise(sample, events, late);
            information(sample, marks, events);
            break;
        case FrameType::RR:
        case FrameType::RNR:
        case FrameType::REJ:
            supervise(sample, events, late);
            break;
        case FrameType::UI:
            marks.accepted = true;
            break;
        default:
            break;
    }
    if (sample.layer2.hasNr() && sample.layer2.pf && sample.command)
        *sample.command ? poll(sample, marks) : polled(sample, marks);
    else
        betweenPolls_ = true;
    if (sample.layer2.hasNr())
        lastNr_[indexOf(sample.from())] = sample.layer2.nr;
    const bool quiet = sample.layer2.type == FrameType::RR || sample.layer2.type == FrameType::I ||
                       sample.layer2.type == FrameType::UI;
    if (!quiet || marks.retransmitted || marks.outOfSequence || marks.pollUnanswered ||
        events.size() != eventsBefore) {
        eventAt_ = sample.at;
        hadEvent_ = true;
    }
    marks.command = sample.command;
    marks.role = commands_.role();
    marks.state = state_;
    return marks;
}

void Link::enter(LinkState state, const Sample& sample) {
    heard_ = {};
    if (state == state_)
        return;
    state_ = state;
    since_ = sample.at;
    sinceFrame_ = sample.number;
    sawSetUp_ = false;
}

void Link::setUp(const Sample& sample, Marks& marks, std::vector<LinkEvent>& events) {
    const Side from = sample.from();
    if (state_ == LinkState::up) {
        events.push_back({LinkEvent::Kind::setUpAgain, from, sample.number, sample.at});
        marks.linkDown = true;
    }
    giveUpHoles(events);
    endPolls();
    settingUp_[indexOf(from)] = true;
    releasing_ = {};
    enter(LinkState::establishing, sample);
}

void Link::answer(const Sample& sample, Marks& marks, std::vector<LinkEvent>& events) {
    const std::size_t asking = indexOf(other(sample.from()));
    if (settingUp_[asking]) {
        settingUp_[asking] = false;
        // When two SABMEs crossed, the second UA does not begin the numbers again, because numbered frames
        // may have passed since the first UA.
        if (state_ == LinkState::up)
            return;
        beginNumbers();
        enter(LinkState::up, sample);
        sawSetUp_ = marks.linkUp = true;
    } else if (releasing_[asking]) {
        releasing_ = {};
        enter(LinkState::down, sample);
        marks.linkDown = true;
    } else if (state_ != LinkState::unknown) {
        events.push_back({LinkEvent::Kind::unsolicitedAnswer, sample.from(), sample.number, sample.at});
    }
}

void Link::refuse(const Sample& sample, Marks& marks, std::vector<LinkEvent>& events) {
    if (settingUp_[indexOf(other(sample.from()))])
        events.push_back({LinkEvent::Kind::refused, sample.from(), sample.number, sample.at});
    giveUpHoles(events);
    endPolls();
    marks.linkDown = state_ != LinkState::down;
    settingUp_ = releasing_ = {};
    enter(LinkState::down, sample);
}

void Link::release(const Sample& sample, std::vector<LinkEvent>& events) {
    giveUpHoles(events);
    endPolls();
    settingUp_ = {};
    releasing_[indexOf(sample.from())] = true;
    enter(LinkState::releasing, sample);
}

// Numbered frames are exchanged only while the link is up, however it came up.
void Link::isAlive(const Sample& sample) {
    const std::size_t from = indexOf(sample.from());
    heard_[from] = true;
    if (state_ == LinkState::up)
        return;
    const bool both = heard_[0] && heard_[1];
    const bool waits = settingUp_[indexOf(other(sample.from()))] || releasing_[indexOf(other(sample.from()))];
    // A side that waits for the answer to its SABME or DISC sends no numbered frames. Those of the other side
    // may have been on their way already.
    const bool sends = sample.layer2.type == FrameType::I && !waits && state_ != LinkState::unknown;
    if (!both && !sends)
        return;
    const bool wasUnknown = state_ == LinkState::unknown;
    settingUp_ = releasing_ = {};
    enter(LinkState::up, sample);
    if (wasUnknown)
        return;
    ++numbering_;
    for (Stream& stream : streams_)
        stream.loosen();
}

void Link::poll(const Sample& sample, Marks& marks) {
    std::optional<Poll>& open = polls_[indexOf(sample.from())];
    marks.pollUnanswered = open.has_value();
    const std::optional<std::uint8_t>& nr = lastNr_[indexOf(sample.from())];
    marks.keepAlive = sample.layer2.type == FrameType::RR && state_ != LinkState::establishing && !open &&
                      (!nr || *nr == sample.layer2.nr) && (!hadEvent_ || sample.at - eventAt_ > nearby);
    open = Poll{sample.number, sample.at, marks.keepAlive};
    betweenPolls_ = false;
}

void Link::polled(const Sample& sample, Marks& marks) {
    std::optional<Poll>& open = polls_[indexOf(other(sample.from()))];
    if (!open)
        return;
    const std::optional<std::uint8_t>& nr = lastNr_[indexOf(sample.from())];
    if (open->keepAlive && sample.layer2.type == FrameType::RR && !betweenPolls_ &&
        (!nr || *nr == sample.layer2.nr) && sample.at - open->at <= timers_->t200)
        marks.answers = open->frame;
    open.reset();
}

void Link::mayMiss(Side side, std::string_view reason) { missing_[indexOf(side)].reason = reason; }

void Link::mayLack(Side side) {
    Missing& missing = missing_[indexOf(side)];
    ++missing.seen;
    if (missing.reason.empty())
        missing.reason = "frames without octets";
}

void Link::forget() {
    state_ = LinkState::unknown;
    sawSetUp_ = false;
    settingUp_ = releasing_ = heard_ = {};
    ++numbering_;
    streams_ = {};
    missing_ = {};
    beyond_ = {};
    lastNr_ = {};
    endPolls();
}

// A side that gets an N(R) of frames that it has not sent sets the link up again (Q.921 5.8.5). If it has not
// done that, it has probably sent them, and nobody can tell who lost them.
void Link::finish(std::vector<LinkEvent>& events) {
    for (const Side side : {Side::us, Side::peer}) {
        const std::optional<PendingNr> pending = std::exchange(beyond_[indexOf(side)], std::nullopt);
        const Stream& stream = streams_[indexOf(other(side))];
        if (!pending || stream.hasOpenHole())
            continue;
        const Hole hole{stream.next(), ahead(pending->nr, stream.next()), pending->frame, pending->at};
        events.push_back({.kind = LinkEvent::Kind::hole,
                          .from = other(side),
                          .frame = pending->frame,
                          .at = pending->at,
                          .hole = hole});
    }
    giveUpHoles(events);
}

}  // namespace calls
