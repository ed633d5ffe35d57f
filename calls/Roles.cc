#include "calls/Roles.h"

#include <algorithm>
#include <functional>
#include <string_view>
#include <utility>

#include "calls/FindingKinds.h"

namespace calls {

namespace {

constexpr std::int64_t loopTime = 200 * millisecond;
constexpr unsigned copiesOfALoop = 3;

std::size_t hashOf(const Sample& sample) {
    const isdn::Octets octets = sample.layer2.octets;
    return std::hash<std::string_view>()({reinterpret_cast<const char*>(octets.data()), octets.size()});
}

// Whether the frame may be a poll or an answer; these consist of the same octets when the N(R) of both sides
// are equal.
bool mayAnswer(const Sample& sample) {
    return sample.layer2.hasNr() && !sample.layer2.hasNs() && sample.layer2.pf;
}

}  // namespace

bool Roles::wasSent(const Sample& sample) const {
    return std::ranges::any_of(sent_, [&, hash = hashOf(sample)](const Sent& sent) {
        return sent.there && sent.hash == hash && sample.at - sent.at < loopTime;
    });
}

std::optional<Observation> Roles::report(const FindingKind& kind, std::uint64_t frame, std::int64_t at,
                                         std::string sentence) {
    suspected_.reset();
    if (std::exchange(reported_, true))
        return std::nullopt;
    return Observation{&kind, kind.severity, frame, at, std::move(sentence)};
}

std::optional<Observation> Roles::take(const Sample& sample, bool sameRole) {
    if (sameRole)
        suspected_ = Suspicion{sample.number, sample.at};
    if (sample.from() == Side::us) {
        sent_[next_] = {hashOf(sample), sample.at, true};
        next_ = (next_ + 1) % sent_.size();
        return std::nullopt;
    }
    if (!wasSent(sample)) {
        looped_ = false;
        copies_ = 0;
        return suspected_ ? finish() : std::nullopt;
    }
    if (mayAnswer(sample))
        return std::nullopt;
    if (++copies_ < copiesOfALoop)
        return std::nullopt;
    looped_ = true;
    return report(
        findings::lineLooped, sample.number, sample.at,
        std::to_string(copies_) + " frames that came in are copies of those sent less than 200 ms before");
}

std::optional<Observation> Roles::finish() {
    if (!suspected_)
        return std::nullopt;
    return report(findings::sameRole, suspected_->frame, suspected_->at,
                  "commands of both directions carry the same C/R value");
}

}  // namespace calls
