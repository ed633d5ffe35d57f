// How the calls of a table end: by a message, with their link, by RESTART, or with the trace.
#include <algorithm>
#include <utility>

#include "calls/CallTable.h"
#include "calls/Life.h"

namespace calls {

namespace {

namespace element = isdn::element;
namespace type = isdn::message;

bool namesNullState(const Message& message) {
    if (message.layer3.type != type::status)
        return false;
    const auto state = isdn::callState(message.layer3.elements.find(element::callState));
    return state && state->codingStandard == 0 && state->value == 0;
}

// The channels that a RESTART ACKNOWLEDGE names.
struct Restarted {
    static constexpr std::uint8_t channels = 0, oneInterface = 6, allInterfaces = 7;

    std::uint8_t kind;
    std::optional<isdn::ChannelId> channel;

    bool covers(const Call& call) const {
        const auto& held = call.held();
        if (kind == allInterfaces)
            return true;
        if (!held || (channel && channel->interface != held->interface))
            return false;
        return kind == oneInterface || (channel && (channel->channels & held->channels).any());
    }
};

}  // namespace

void CallTable::endIfLast(Life& life, const Message& message) {
    if (life.call.broadcast && !(life.winner && *life.winner == message.layer2.tei)) {
        endTerminal(life, message);
        return;
    }
    switch (message.layer3.type) {
        case type::release:
            life.call.released = true;
            if (!life.releasedBy)
                life.releasedBy = message.from();
            else if (*life.releasedBy != message.from())
                end(life, EndedBy::release, momentOf(message), &message);
            break;
        case type::releaseComplete:
        case type::resumeReject:
            end(life, EndedBy::release, momentOf(message), &message);
            break;
        case type::suspendAcknowledge:
            if (suspended_.size() < mostRemembered)
                suspended_.push_back({life.call.number, message.at, life.identity});
            end(life, EndedBy::suspended, momentOf(message), &message);
            break;
        case type::status:
            if (namesNullState(message))
                end(life, EndedBy::release, momentOf(message), &message);
            break;
        default:
            break;
    }
}

// A terminal leaves a call that was offered to all terminals. The call ends when the last terminal has left
// and no other can join any more.
void CallTable::endTerminal(Life& life, const Message& message) {
    if (message.layer3.type == type::releaseComplete)
        life.left.set(message.layer2.tei);
    if (life.winner || life.left != life.joined)
        return;
    if (message.at - life.lastSetup > timers_.t312 || life.call.clearingSeen)
        endIfAllTerminalsLeft(life, momentOf(message), &message);
}

void CallTable::endIfAllTerminalsLeft(Life& life, const Moment& moment, const Message* message) {
    if (life.winner || life.left != life.joined)
        return;
    if (!life.call.clearingSeen && life.refusal) {
        life.call.cause = std::move(life.refusal);
        if (life.call.causeBefore && isClearing(life.call.causeBefore->message))
            life.call.causeBefore.reset();
    }
    end(life, EndedBy::release, moment, message);
}

void CallTable::end(Life& life, EndedBy by, const Moment& moment, const Message* message) {
    conclude(life, by, moment);
    schedule(life, moment.at + timers_.t308 + timers_.slack);
    observer_.ended(life.call, message);
}

void CallTable::endLostLinks(std::int64_t at) {
    for (auto down = downSince_.begin(); down != downSince_.end();) {
        if (at - down->second <= timers_.t309) {
            ++down;
            continue;
        }
        const std::int64_t endedAt = down->second + timers_.t309;
        for (const auto& [key, life] : lives_) {
            if (life->ended || life->call.tei != down->first)
                continue;
            Moment moment = life->call.end;
            moment.at = endedAt;
            end(*life, EndedBy::link, moment, nullptr);
        }
        down = downSince_.erase(down);
    }
}

void CallTable::restarted(const Message& acknowledge) {
    advance(acknowledge.at);
    const isdn::Elements& elements = acknowledge.layer3.elements;
    const Restarted restarted{
        isdn::restartClass(elements.find(element::restartIndicator)).value_or(Restarted::channels),
        isdn::channelId(elements.find(element::channelIdentification))};
    for (const auto& [key, life] : lives_) {
        if (!life->ended && restarted.covers(life->call))
            end(*life, EndedBy::restart, momentOf(acknowledge), &acknowledge);
    }
}

void CallTable::finish() {
    std::vector<Life*> rest;
    for (const auto& [number, key] : inOrder_)
        rest.push_back(find(key));
    for (Life* life : rest) {
        if (!life->ended) {
            conclude(*life, EndedBy::open, life->call.end);
            observer_.ended(life->call, nullptr);
        }
    }
    std::stable_sort(rest.begin(), rest.end(), [](const Life* a, const Life* b) {
        const auto rank = [](const Life* life) {
            const bool isOpen = life->call.endedBy == EndedBy::open;
            return std::pair(isOpen, isOpen ? std::int64_t{0} : life->call.end.at);
        };
        return rank(a) < rank(b);
    });
    for (Life* life : rest)
        forget(*life);
}

}  // namespace calls
