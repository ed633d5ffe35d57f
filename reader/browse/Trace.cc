#include "reader/browse/Trace.h"

#include <algorithm>
#include <array>
#include <utility>

#include "calls/Segments.h"
#include "isdn/values.h"

namespace reader::browse {

namespace {

constexpr std::size_t mostLinkRungs = 2000;

bool isBefore(const CallFrame& a, const CallFrame& b) { return a.frame < b.frame; }

// Inserts a frame at its place, which is mostly the end. If the frame is there already, replaces it.
template <class Frames>
void insertInOrder(Frames& frames, const CallFrame& frame) {
    const auto at = std::lower_bound(frames.begin(), frames.end(), frame, isBefore);
    if (at != frames.end() && at->frame == frame.frame)
        *at = frame;
    else
        frames.insert(at, frame);
}

// The message of a frame, as the analysis has taken it.
calls::Message messageIn(const Seen& seen) {
    calls::Message message;
    message.frame = &seen.frame();
    message.number = seen.number;
    message.at = seen.at;
    message.role = seen.role;
    message.layer2 = seen.link;
    message.layer3 = seen.message;
    message.variant = seen.variant;
    return message;
}

// Puts a line in front that says how many messages are not kept any more.
void sayGone(CallLadder& ladder, std::size_t gone) {
    if (gone == 0)
        return;
    Rung words;
    words.kind = Rung::Kind::words;
    if (!ladder.rungs.empty())
        words.at = ladder.rungs.front().at;
    words.name = "messages before this, not in memory any more: " + std::to_string(gone);
    ladder.rungs.insert(ladder.rungs.begin(), std::move(words));
}

// Puts the segments of messages together.
class Whole {
  public:
    // A frame of one call. `carried` says that the message was heard by another frame.
    void take(calls::Message& message, bool carried) {
        const bool isSegment = message.layer3.type == isdn::message::segment;
        if (!carried || isSegment)
            static_cast<void>(segments_.take(message));
    }

  private:
    calls::Segments segments_;
};

}  // namespace

Changes Trace::apply(Update update) {
    Changes changes;
    frames_.add(std::move(update.page));
    for (auto& [number, call] : update.calls) {
        changes.calls.push_back(number);
        calls_.insert_or_assign(number, std::move(call));
    }
    for (const CallFrame& frame : update.frames)
        takeFrame(frame);
    for (const std::uint64_t number : update.unwanted) {
        framesOf_.erase(number);
        if (calls_.erase(number) != 0)
            changes.gone.push_back(number);
    }
    for (calls::Finding& finding : update.findings)
        findings_.push_back(std::move(finding));
    if (!update.trunks.empty())
        trunks_ = std::move(update.trunks);
    state_ = update.state;
    error_ = update.error.empty() ? std::move(error_) : std::move(update.error);
    callsDropped_ = update.callsDropped;
    changes.findings = !update.findings.empty();
    prune(changes);
    return changes;
}

void Trace::takeFrame(const CallFrame& frame) {
    insertInOrder(ofCalls_, frame);
    if (frame.call == 0)
        return;
    std::vector<CallFrame>& known = framesOf_[frame.call];
    if (known.size() < mostFramesOfCall)
        insertInOrder(known, frame);
}

void Trace::prune(Changes& changes) {
    while (findings_.size() > mostFindings ||
           (frames_.gone() != 0 && !findings_.empty() && findings_.front().frame < frames_.firstNumber())) {
        findings_.pop_front();
        ++firstFinding_;
        changes.findings = true;
    }
    if (frames_.gone() == 0)
        return;
    const std::uint64_t oldest = frames_.firstNumber();
    while (!ofCalls_.empty() && ofCalls_.front().frame < oldest)
        ofCalls_.pop_front();
    // Calls whose frames are gone are at the beginning, apart from a few between them that last long.
    constexpr int glance = 256;
    int looked = 0;
    for (auto each = framesOf_.begin(); each != framesOf_.end() && looked < glance; ++looked) {
        const std::uint64_t number = each->first;
        if (each->second.back().frame >= oldest) {
            ++each;
            continue;
        }
        const auto call = calls_.find(number);
        const bool isOver = call == calls_.end() || call->second.phase == calls::Phase::ended;
        if (!isOver) {
            ++each;
            continue;
        }
        each = framesOf_.erase(each);
        if (call != calls_.end()) {
            calls_.erase(call);
            changes.gone.push_back(number);
        }
    }
}

const calls::Call* Trace::call(std::uint64_t number) const {
    const auto found = calls_.find(number);
    return found == calls_.end() ? nullptr : &found->second;
}

std::uint64_t Trace::callOf(std::uint64_t frame) const {
    const CallFrame wanted{0, frame, false};
    const auto found = std::lower_bound(ofCalls_.begin(), ofCalls_.end(), wanted, isBefore);
    return found != ofCalls_.end() && found->frame == frame ? found->call : 0;
}

std::span<const CallFrame> Trace::framesOf(std::uint64_t call) const {
    const auto found = framesOf_.find(call);
    return found == framesOf_.end() ? std::span<const CallFrame>() : std::span(found->second);
}

// How many of the frames, counted from the first, are not kept any more.
std::size_t Trace::countGone(std::span<const CallFrame> frames) const {
    const CallFrame oldest{0, frames_.firstNumber(), false};
    return static_cast<std::size_t>(std::lower_bound(frames.begin(), frames.end(), oldest, isBefore) -
                                    frames.begin());
}

// The frames of the call itself, of RESTARTs meanwhile, and of its links (with call 0 and carried), in order.
std::vector<CallFrame> Trace::framesForLadder(const calls::Call& call) const {
    std::span<const CallFrame> own = framesOf(call.number);
    own = own.subspan(countGone(own));
    std::vector<CallFrame> all(
        own.begin(), own.begin() + static_cast<std::ptrdiff_t>(std::min(own.size(), Ladders::mostOfACall)));
    if (all.empty())
        return all;
    const CallFrame first = all.front();
    const bool isOpen = call.endedBy == calls::EndedBy::open;
    const CallFrame last{0, isOpen ? frames_.lastNumber() : std::max(call.end.frame, own.back().frame),
                         false};
    for (auto each = std::lower_bound(ofCalls_.begin(), ofCalls_.end(), first, isBefore);
         each != ofCalls_.end() && each->frame <= last.frame; ++each) {
        if (each->call == 0)
            all.push_back(*each);
    }
    std::sort(all.begin(), all.end(), isBefore);
    return all;
}

CallLadder Trace::ladderOf(const calls::Call& call, TimeText& times) const {
    Ladders ladders;
    Whole whole;
    Shown shown;
    const std::vector<CallFrame> frames = framesForLadder(call);
    const auto takeLinks = [&](std::uint64_t from, std::uint64_t to) {
        for (const std::uint64_t place : frames_.tellingOfLinks(from, to, mostLinkRungs)) {
            if (frames_.load(place, shown))
                ladders.see(shown.seen());
        }
    };
    std::uint64_t done = 0;  // the frames at all places before this one were looked at
    for (const CallFrame& frame : frames) {
        const auto place = frames_.placeOf(frame.frame);
        if (!place)
            continue;
        if (done != 0)
            takeLinks(done, *place);
        done = *place + 1;
        if (!frames_.load(*place, shown) || !shown.seen().hasMessage)
            continue;
        ladders.see(shown.seen());
        calls::Message message = messageIn(shown.seen());
        whole.take(message, frame.carried);
        if (frame.call == 0)
            ladders.restarted(message);
        else if (frame.carried)
            ladders.carried(message, call);
        else
            ladders.heard(message, call);
    }
    if (done != 0 && call.endedBy == calls::EndedBy::open)
        takeLinks(done, frames_.end());
    CallLadder ladder = ladders.take(call, times);
    sayGone(ladder, countGone(framesOf(call.number)));
    return ladder;
}

std::vector<ComparedMessage> Trace::messagesOf(const calls::Call& call) const {
    std::vector<ComparedMessage> messages;
    Whole whole;
    Shown shown;
    std::optional<std::int64_t> first;
    for (const CallFrame& frame : framesOf(call.number)) {
        const auto place = frames_.placeOf(frame.frame);
        if (!place || !frames_.load(*place, shown) || !shown.seen().hasMessage)
            continue;
        calls::Message message = messageIn(shown.seen());
        whole.take(message, frame.carried);
        if (frame.carried)
            continue;
        if (!first)
            first = message.at;
        messages.push_back(comparedMessage(message, *first, {}));
    }
    return messages;
}

std::optional<JoinedMessage> Trace::joinedOf(std::uint64_t frame) const {
    calls::Segments segments;
    std::array<std::vector<std::uint64_t>, 2> begun;  // frames of a message that is not complete, by side
    Shown shown;
    for (const CallFrame& each : framesOf(callOf(frame))) {
        const auto place = frames_.placeOf(each.frame);
        if (!place || !frames_.load(*place, shown) || !shown.seen().hasMessage)
            continue;
        calls::Message message = messageIn(shown.seen());
        std::vector<std::uint64_t>& frames = begun[static_cast<std::size_t>(message.from())];
        const auto header =
            isdn::segmentHeader(message.layer3.elements.find(isdn::element::segmentedMessage));
        const calls::Segments::Taken taken = segments.take(message);
        if (taken == calls::Segments::Taken::no)
            continue;
        if (taken == calls::Segments::Taken::outOfOrder || (header && header->first))
            frames.clear();
        frames.push_back(each.frame);
        if (taken != calls::Segments::Taken::complete)
            continue;
        if (std::find(frames.begin(), frames.end(), frame) != frames.end())
            return JoinedMessage{{message.layer3.octets.begin(), message.layer3.octets.end()}, frames};
        frames.clear();
    }
    return std::nullopt;
}

std::optional<ComparedMessage> Trace::messageOf(std::uint64_t frame) const {
    Shown shown;
    const auto place = frames_.placeOf(frame);
    if (!place || !frames_.load(*place, shown) || !shown.seen().hasMessage)
        return std::nullopt;
    const calls::Message message = messageIn(shown.seen());
    return comparedMessage(message, message.at, {});
}

}  // namespace reader::browse
