#include "calls/LinkFindings.h"

#include <algorithm>
#include <utility>

#include "calls/FindingKinds.h"
#include "isdn/values.h"
#include "isdn/words.h"

namespace calls {

namespace {

// What is seen within this time after the recorder has missed frames may only be a consequence of that.
constexpr std::int64_t nearLoss = 10 * second;
// Fewer frames than these do not show that a direction is absent.
constexpr std::uint64_t fewFrames = 4;

std::uint16_t addressOf(const isdn::Layer2& frame) {
    return static_cast<std::uint16_t>(frame.sapi << 7 | frame.tei);
}

bool isAutomatic(std::uint8_t tei) { return tei >= 64 && tei != isdn::groupTei; }

std::string senderOf(const LinkEvent& event) {
    return event.from == Side::us ? "our side" : "the other side";
}

std::string wordsOf(const Hole& hole) {
    std::string words = std::to_string(hole.count) + (hole.count == 1 ? " frame is" : " frames are") +
                        " missing from N(S) " + std::to_string(hole.first) + " on";
    if (!hole.reason.empty())
        words.append(": ").append(hole.reason);
    return words;
}

const FindingKind& kindOf(LostBy by) {
    switch (by) {
        case LostBy::line:
            return findings::nsGapLine;
        case LostBy::recorder:
            return findings::nsGapRecorder;
        default:
            return findings::nsGapUnknown;
    }
}

}  // namespace

LinkFindings::LinkFindings(Options options, FindingSink& sink)
    : options_(std::move(options)),
      findings_(sink),
      around_{.timers = &options_.timers, .access = options_.access, .grouped = options_.grouped} {}

void LinkFindings::take(const DChannel& channel) {
    const Sample& sample = channel.sample();
    lastAt_ = sample.at;
    expire(sample.at);
    lastFrame_ = sample.number;
    offset_ = sample.frame->time - sample.at;
    clock_ = sample.frame->clock;
    ++heard_[indexOf(sample.from())];
    around_.bothHeard = heard_[0] > 0 && heard_[1] > 0;
    if (channel.link() != nullptr)
        takeOfLink(channel);
    findings_.advance(sample.at);
}

void LinkFindings::takeOfLink(const DChannel& channel) {
    const Sample& sample = channel.sample();
    const isdn::Layer2& frame = sample.layer2;
    const bool sameRole = std::ranges::any_of(
        channel.events(), [](const LinkEvent& event) { return event.kind == LinkEvent::Kind::sameRole; });
    if (std::optional<Observation> found = roles_.take(sample, sameRole))
        observe(std::move(*found), frame.tei);
    learn(sample);
    for (const LinkEvent& event : channel.events())
        this->event(event, sample);
    if (frame.carriesTeiMessage()) {
        std::vector<Observation> found;
        teis_.take(sample, options_.timers.t201, found);
        for (Observation& observation : found)
            observe(std::move(observation), frame.tei);
    }
    if (frame.tei == isdn::groupTei)
        return;
    LinkWatch& watch = watches_.try_emplace(addressOf(frame), frame.tei).first->second;
    watch.take(channel, sample, around_);
    collect(watch, frame.tei);
    due_ = std::min(due_, watch.due());
}

// Learns which access it is. A channel identification says so; a TEI that was assigned suggests it.
void LinkFindings::learn(const Sample& sample) {
    if (sample.layer2.carriesMessage())
        learnFromMessage(sample);
    if (around_.access == Access::unknown && sample.layer2.sapi == isdn::callControlSapi &&
        isAutomatic(sample.layer2.tei) && sample.layer2.type == isdn::FrameType::I)
        around_.access = Access::basic;
    if (around_.access == Access::primary)
        if (std::optional<Observation> found = teis_.isPrimary())
            observe(std::move(*found), isdn::groupTei);
}

void LinkFindings::learnFromMessage(const Sample& sample) {
    const isdn::Layer3 message = isdn::parseLayer3(sample.layer2.information);
    if (message.discriminator == isdn::callControl && message.type == isdn::message::setup &&
        options_.access == Access::unknown && !channelSeen_) {
        const isdn::Element element = message.elements.find(isdn::element::channelIdentification);
        if (const std::optional<isdn::ChannelId> id = isdn::channelId(element)) {
            around_.access = id->primaryRate ? Access::primary : Access::basic;
            channelSeen_ = true;
        }
    }
    if (isdn::isMaintenance(message.discriminator) && message.type == isdn::message::service) {
        isdn::Element element = message.elements.find(isdn::element::changeStatus);
        if (element.octets.empty())
            element = message.elements.find(isdn::element::changeStatus, 6);
        constexpr std::uint8_t outOfService = 2;
        if (const std::optional<isdn::ChangeStatus> status = isdn::changeStatus(element);
            status && !status->channel)
            around_.outOfService = status->status == outOfService;
    }
}

void LinkFindings::event(const LinkEvent& event, const Sample& sample) {
    const std::string tei = "TEI " + std::to_string(event.tei) + ": ";
    const auto report = [&](const FindingKind& kind, std::string sentence,
                            std::optional<Severity> severity = {}) {
        observe({&kind, severity.value_or(kind.severity), event.frame, event.at, tei + std::move(sentence)},
                event.tei);
    };
    switch (event.kind) {
        case LinkEvent::Kind::hole:
            report(kindOf(event.by), "of what " + senderOf(event) + " sent, " + wordsOf(event.hole));
            break;
        case LinkEvent::Kind::nrInvalid:
            report(findings::nrInvalid, senderOf(event) + " acknowledged with N(R) " +
                                            std::to_string(event.number) + " what was never sent");
            break;
        case LinkEvent::Kind::unseenSetUp:
            report(findings::nsGapRecorder, "N(S) and N(R) begin at 0 again: a SABME is missing in the trace",
                   Severity::note);
            break;
        case LinkEvent::Kind::refused:
            if (!around_.grouped)
                report(findings::linkRefused, senderOf(event) + " answered SABME with DM");
            break;
        case LinkEvent::Kind::unsolicitedAnswer:
            if (!hasLost_ || event.at - lostAt_ > nearLoss)
                report(findings::teiDoubled,
                       senderOf(event) + " sent UA that answers nothing: two terminals may use one TEI");
            break;
        case LinkEvent::Kind::frameReject: {
            std::string words;
            isdn::appendWords(words, isdn::parseFrameReject(sample.layer2.information));
            report(findings::frameRejected, senderOf(event) + " rejected a frame: " + words);
            break;
        }
        case LinkEvent::Kind::contradiction:
            report(findings::roleContradicted,
                   senderOf(event) + " codes commands with another C/R value than before");
            break;
        case LinkEvent::Kind::setUpAgain:  // LinkWatch knows whether it is a flap
        case LinkEvent::Kind::sameRole:    // Roles tells it from a loop
            break;
    }
}

void LinkFindings::expire(std::int64_t at) {
    if (at <= due_)
        return;
    due_ = LinkWatch::never;
    for (auto& [address, watch] : watches_) {
        if (at > watch.due()) {
            watch.expire(at, around_);
            collect(watch, static_cast<std::uint8_t>(address & 0x7F));
        }
        due_ = std::min(due_, watch.due());
    }
}

void LinkFindings::advance(std::int64_t at) {
    lastAt_ = std::max(lastAt_, at);
    expire(lastAt_);
    findings_.advance(lastAt_);
}

void LinkFindings::collect(LinkWatch& watch, std::uint8_t tei) {
    for (Observation& observation : watch.observations())
        observe(std::move(observation), tei);
    watch.observations().clear();
}

// Drops other observations while two ends play one role or the line is looped, because these follow from
// that.
void LinkFindings::observe(Observation observation, std::uint8_t tei) {
    const bool isRole = observation.kind == &findings::sameRole || observation.kind == &findings::lineLooped;
    if (roles_.broken() && !isRole)
        return;
    Finding finding;
    finding.kind = observation.kind;
    finding.severity = observation.severity;
    finding.clause = observation.kind->clause;
    finding.frame = observation.frame;
    finding.clock = clock_;
    finding.time = observation.at + offset_;
    finding.dChannel = options_.dChannel;
    finding.sentence = std::move(observation.sentence);
    findings_.report(std::move(finding), tei, observation.at);
}

void LinkFindings::forgetWhatWaits() {
    hasLost_ = true;
    lostAt_ = lastAt_;
    for (auto& [address, watch] : watches_)
        watch.forget();
}

void LinkFindings::lost(std::string sentence) {
    forgetWhatWaits();
    observe({&findings::framesLost, findings::framesLost.severity, lastFrame_, lastAt_, std::move(sentence)},
            0);
}

void LinkFindings::restarted() {
    forgetWhatWaits();
    // A start before the first frame interrupts nothing. The recorder's report and the clock that falls are
    // one restart, so it is reported once for each frame.
    if (std::exchange(restartSaid_, lastFrame_) != lastFrame_)
        observe({&findings::boardRestarted, findings::boardRestarted.severity, lastFrame_, lastAt_,
                 "the recorder or the board was started again"},
                0);
}

void LinkFindings::finish(const DChannel& channel) {
    const Sample end{nullptr, lastFrame_, lastAt_, {}};
    for (const LinkEvent& event : channel.events())
        this->event(event, end);
    for (auto& [address, watch] : watches_) {
        watch.finish();
        collect(watch, static_cast<std::uint8_t>(address & 0x7F));
    }
    if (std::optional<Observation> found = roles_.finish())
        observe(std::move(*found), 0);
    const std::uint64_t frames = heard_[0] + heard_[1];
    if (frames >= fewFrames && !around_.bothHeard)
        observe({&findings::directionAbsent, findings::directionAbsent.severity, lastFrame_, lastAt_,
                 heard_[indexOf(Side::us)] > 0 ? "nothing that the other side sent is in the trace"
                                               : "nothing that our side sent is in the trace"},
                0);
    findings_.finish();
}

}  // namespace calls
