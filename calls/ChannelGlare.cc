// The part of Channels that finds channels for which both sides compete (Q.931 5.7).
#include <algorithm>

#include "calls/Channels.h"
#include "calls/FindingKinds.h"
#include "calls/Stream.h"
#include "calls/findingOf.h"

namespace calls {

namespace {

// Layer 2 sends a frame once and repeats it N200 (3) times. Then it has an acknowledgement, or the link is
// down.
constexpr std::int64_t transmissions = 4;
constexpr unsigned setupsToJudgeHunting = 20;  // SETUPs of each side

bool share(const std::vector<ChannelKey>& a, const std::vector<ChannelKey>& b) {
    return std::any_of(a.begin(), a.end(),
                       [&](const ChannelKey& key) { return std::find(b.begin(), b.end(), key) != b.end(); });
}

}  // namespace

// Two SETUPs of one link cross if neither side had received the other's: the N(R) of this one does not
// acknowledge the other.
void Channels::findGlare(Call& call, Seizure& seizure, const Message& message) {
    if (!seizure.numbered)
        return;
    const std::int64_t longest = transmissions * timers_.t200;
    for (auto& [number, opposite] : seizures_) {
        const Call& its = *opposite.call;
        if (its.tei != call.tei || its.dChannel != call.dChannel || its.origin == call.origin ||
            opposite.answered || !opposite.numbered || opposite.glare != 0 ||
            !share(opposite.asked, seizure.asked) || message.at - opposite.setupAt > longest ||
            isAhead(message.layer2.nr, opposite.setupNs))
            continue;
        seizure.glare = number;
        opposite.glare = call.number;
        return;
    }
}

void Channels::hunt(const Call& call, const Seizure& seizure, const Message& message) {
    if (seizure.asked.size() != 1 || glareProneSaid_)
        return;
    Hunting& own = hunting_[static_cast<std::size_t>(call.origin)];
    const std::uint32_t number = seizure.asked.front().number;
    if (own.last != 0 && number != own.last)
        ++(number > own.last ? own.up : own.down);
    own.last = number;
    const auto direction = [](const Hunting& side) {
        const unsigned all = side.up + side.down;
        if (all < setupsToJudgeHunting)
            return 0;
        return side.up * 10 >= all * 8 ? 1 : side.down * 10 >= all * 8 ? -1 : 0;
    };
    const int ofUs = direction(hunting_[0]);
    if (ofUs == 0 || ofUs != direction(hunting_[1]))
        return;
    glareProneSaid_ = true;
    sink_.report(
        findingOf(findings::glareProne, message, &call,
                  ofUs > 0 ? "both ends take channels upwards" : "both ends take channels downwards"));
}

// Glare is settled when one of the two calls is refused or moved to another channel. It persists when both
// calls have been given the channel.
void Channels::settleGlare(Call& call, Seizure& seizure, const Message* message) {
    if (seizure.glare == 0 || seizure.glareSettled)
        return;
    const auto found = seizures_.find(seizure.glare);
    if (found == seizures_.end())
        return;
    Seizure& opposite = found->second;
    const bool moved = message != nullptr && !share(seizure.held, seizure.asked);
    const bool bothGoOn = message != nullptr && opposite.answered && share(seizure.held, opposite.held);
    if (!moved && !bothGoOn && message != nullptr)
        return;  // the messages of the other call decide
    seizure.glareSettled = opposite.glareSettled = true;
    const std::string which = "SETUPs of call " + std::to_string(call.number) + " and call " +
                              std::to_string(seizure.glare) + " crossed";
    if (bothGoOn)
        sink_.report(findingOf(findings::glarePersists, *message, &call, which + ", and both calls went on"));
    else if (message != nullptr)
        sink_.report(
            findingOf(findings::glare, *message, &call, which + "; one was moved to another channel"));
    else {
        call.gaveWay = !seizure.answered;
        sink_.report(findingOf(findings::glare, call.end, call, which + "; one gave way"));
    }
}

}  // namespace calls
