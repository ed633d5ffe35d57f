#include "reader/Analysed.h"

#include <string>
#include <utility>

#include "reader/Feed.h"
#include "reader/forms.h"

namespace reader {

Analysed::Analysed(const Options& options)
    : callFilter_(options.filters),
      analysis_(analysisOptions(options), *this),
      filtered_(!Filter(options.filters).isEmpty() || options.skipped != 0) {}

void Analysed::run(Session& session, Chatter& chatter) {
    session.run(*this, [] { return std::make_unique<NoComposer>(); });
    end(chatter);
}

void Analysed::end(Chatter& chatter) {
    analysis_.finish();
    if (!callFilter_.isEmpty() && !isAnyWanted_ && analysis_.begun() != 0)
        chatter.note("no call passes the filters; calls: " + std::to_string(analysis_.begun()));
    if (hasFrames_ && !hasTimes_)
        chatter.note("the input has no times: durations are left out, and no answer is called missing");
    if (const std::uint64_t dropped = analysis_.dropped(); dropped != 0)
        chatter.note("calls that were let go before their end, since too many were alive: " +
                     std::to_string(dropped));
    if (letGo_ != 0)
        chatter.note("findings that were let go before the end of their call told whether it is wanted: " +
                     std::to_string(letGo_));
}

void Analysed::take(Chunk& chunk, std::size_t count) {
    std::size_t piece = 0;
    for (std::size_t i = 0; i < chunk.size(); ++i) {
        const bool passes = piece < count && chunk.pieces[piece].item == i;
        piece += passes ? 1 : 0;
        look(chunk.seen()[i], passes);
    }
}

void Analysed::look(const Seen& seen, bool passes) {
    hasFrames_ = hasFrames_ || seen.isFrame();
    hasTimes_ = hasTimes_ || seen.frame().clock != capture::Clock::none || seen.frame().ticks;
    if (filtered_) {
        while (newest_ + 1 < seen.number) {
            passed_.push_back(false);
            ++newest_;
        }
        if (seen.number > newest_) {
            passed_.push_back(passes);
            ++newest_;
        }
        while (passed_.size() > framesRemembered)
            passed_.pop_front();
    }
    see(seen);
    feed(analysis_, seen);
}

bool Analysed::hasPassed(std::uint64_t frame) const {
    return frame <= newest_ && newest_ - frame < passed_.size() &&
           passed_[passed_.size() - 1 - (newest_ - frame)];
}

void Analysed::heard(const calls::Message& message, const calls::Call* call) {
    if (filtered_ && call != nullptr && hasPassed(message.number))
        wanted_.insert(call->number);
}

void Analysed::gone(const calls::Call& call) {
    const bool isCallWanted = callFilter_.wants(call);
    isAnyWanted_ = isAnyWanted_ || isWanted(call);
    wanted_.erase(call.number);
    if (callFilter_.isEmpty())
        return;
    decided_[call.number] = isCallWanted;
    if (decided_.size() > callsRemembered)
        decided_.erase(decided_.begin());
    std::erase_if(held_, [&](const calls::Finding& finding) {
        const bool isItsOwn = finding.call == call.number;
        if (isItsOwn && isCallWanted)
            report(finding);
        return isItsOwn;
    });
}

bool Analysed::isWanted(const calls::Call& call) const {
    return callFilter_.wants(call) && hasFrameWanted(call);
}

void Analysed::found(const calls::Finding& finding) {
    if (filtered_ && !hasPassed(finding.frame) && !(finding.call && wanted_.contains(*finding.call)))
        return;
    std::optional<bool> isCallWanted =
        finding.call ? callFilter_.wants(*finding.call) : std::optional(callFilter_.wantsRest());
    if (!isCallWanted) {
        if (const auto gone = decided_.find(*finding.call); gone != decided_.end())
            isCallWanted = gone->second;
    }
    if (!isCallWanted)
        hold(finding);
    else if (*isCallWanted)
        report(finding);
}

void Analysed::hold(const calls::Finding& finding) {
    held_.push_back(finding);
    if (held_.size() <= mostFindingsHeld)
        return;
    held_.pop_front();
    ++letGo_;
}

std::optional<bool> Analysed::isWanted(const calls::Message& message, const calls::Call* call) const {
    if (filtered_ && !hasPassed(message.number))
        return false;
    return call == nullptr ? callFilter_.wantsRest() : callFilter_.wants(call->number);
}

}  // namespace reader
