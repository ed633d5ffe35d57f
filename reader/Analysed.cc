#include "reader/Analysed.h"

#include <array>
#include <string_view>

#include "calls/standardVariant.h"

namespace reader {

namespace {

// Why frames may be missing, in a few words, by kind of item; empty if none are.
std::string_view reasonOf(capture::Item::Kind kind) {
    using Kind = capture::Item::Kind;
    switch (kind) {
        case Kind::lost:
            return "Frames Lost";
        case Kind::notQueued:
            return "Enqueue Failed";
        case Kind::notTaken:
            return "Get iemsg failed";
        case Kind::dropped:
            return "packets dropped by the capture";
        case Kind::cut:
            return "a frame that is cut off";
        case Kind::mixed:
            return "two traces in one file";
        case Kind::unproved:
            return "lines that are no recorder's";
        case Kind::damaged:
            return "damage of the file";
        default:
            return {};
    }
}

}  // namespace

calls::Options analysisOptions(const Options& options) {
    calls::Options to;
    to.timers = options.calls.timers;
    to.role = options.input.role;
    to.groups = options.calls.groups;
    if (options.input.variant != capture::Variant::unknown)
        to.variant = calls::standardVariant(options.input.variant);
    return to;
}

void tell(calls::Analysis& analysis, const capture::Item& item) {
    const capture::Interface& interface = *item.frame.interface;
    if (item.kind == capture::Item::Kind::oversized)
        analysis.mayLack(interface, item.frame.transmitted ? calls::Side::us : calls::Side::peer);
    else if (item.kind == capture::Item::Kind::restart || item.kind == capture::Item::Kind::run ||
             item.kind == capture::Item::Kind::replaced)
        analysis.restarted(interface);
    else if (const std::string_view reason = reasonOf(item.kind); !reason.empty())
        analysis.mayMiss(interface, reason);
}

Analysed::Analysed(const Options& options)
    : analysis_(analysisOptions(options), *this), filtered_(!options.filters.empty()) {}

void Analysed::take(Chunk& chunk, std::size_t count) {
    std::size_t piece = 0;
    for (std::size_t i = 0; i < chunk.size(); ++i) {
        const bool passes = piece < count && chunk.pieces[piece].item == i;
        piece += passes ? 1 : 0;
        look(chunk.seen()[i], passes);
    }
}

void Analysed::look(const Seen& seen, bool passes) {
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
    if (seen.isFrame())
        analysis_.take(seen.frame(), seen.number);
    else
        tell(analysis_, *seen.item);
}

bool Analysed::hasPassed(std::uint64_t frame) const {
    return frame <= newest_ && newest_ - frame < passed_.size() &&
           passed_[passed_.size() - 1 - (newest_ - frame)];
}

void Analysed::heard(const calls::Message& message, const calls::Call* call) {
    if (filtered_ && call != nullptr && hasPassed(message.number))
        wanted_.insert(call->number);
}

void Analysed::gone(const calls::Call& call) { wanted_.erase(call.number); }

bool Analysed::isWanted(const calls::Call& call) const { return !filtered_ || wanted_.contains(call.number); }

bool Analysed::isWanted(const calls::Finding& finding) const {
    return !filtered_ || hasPassed(finding.frame) || (finding.call && wanted_.contains(*finding.call));
}

bool Analysed::isWanted(const calls::Message& message) const {
    return !filtered_ || hasPassed(message.number);
}

}  // namespace reader
