#include "fleet/ship/Outbox.h"

#include <algorithm>

namespace fleet {

namespace {

// A stream whose numbers are lower by this much is another one, which was made anew.
constexpr std::uint64_t mostForgotten = 100'000;

}  // namespace

bool Outbox::hasRoom(std::size_t dChannel) const {
    return parcels_.size() < rules_.most && waiting(dChannel) < rules_.mostOfOne &&
           octets_ < rules_.mostOctets;
}

std::size_t Outbox::waiting(std::size_t dChannel) const {
    return dChannel < ofDChannel_.size() ? ofDChannel_[dChannel].size() : 0;
}

std::optional<std::int64_t> Outbox::oldestWaiting(std::size_t dChannel) const {
    if (waiting(dChannel) == 0)
        return std::nullopt;
    return parcels_.at(ofDChannel_[dChannel].front()).time;
}

void Outbox::add(std::size_t dChannel, const Parcel& parcel) {
    const std::uint64_t token = ++tokens_;
    Sent sent{dChannel,
              toText(parcel.subject()),
              toText(parcel),
              parcel.id() + idEnding_,
              {parcel.run, parcel.first + parcel.frames.size(), parcel.end.has_value()},
              parcel.frames.empty() ? std::nullopt : parcel.frames.front().item.time};
    octets_ += sent.text.size();
    parcels_.emplace(token, std::move(sent));
    if (ofDChannel_.size() <= dChannel)
        ofDChannel_.resize(dChannel + 1);
    ofDChannel_[dChannel].push_back(token);
    nextDue_ = {};
}

void Outbox::pump(Carrier& carrier, std::chrono::milliseconds wait) {
    sendDue(carrier);
    while (const auto answer = carrier.answer(wait)) {
        take(*answer);
        wait = std::chrono::milliseconds(0);
    }
}

void Outbox::sendDue(Carrier& carrier) {
    const Clock::time_point now = Clock::now();
    if (now < nextDue_)
        return;
    nextDue_ = now + rules_.pause;  // if sending fails
    Clock::time_point next = Clock::time_point::max();
    for (auto& [token, sent] : parcels_) {
        if (sent.isKept)
            continue;
        if (sent.due <= now) {
            figures_.unanswered += sent.isOut ? 1 : 0;
            carrier.send(sent.subject, sent.text, sent.id, token);
            ++figures_.sent;
            figures_.octets += sent.text.size();
            sent.isOut = true;
            sent.due = now + rules_.patience;
        }
        next = std::min(next, sent.due);
    }
    nextDue_ = next;
}

void Outbox::take(const Carrier::Answer& answer) {
    if (answer.isKept)
        countKept(answer);
    else
        countRefusal(answer);
    const auto found = answer.token ? parcels_.find(*answer.token) : parcels_.end();
    if (found == parcels_.end() || found->second.isKept)
        return;  // a second answer to a parcel that was sent twice
    Sent& sent = found->second;
    if (!answer.isKept) {
        sent.isOut = false;
        sent.due = Clock::now() + rules_.pause;
        nextDue_ = std::min(nextDue_, sent.due);
        return;
    }
    ++figures_.kept;
    figures_.duplicates += answer.isDuplicate ? 1 : 0;
    figures_.isFull = false;
    figures_.refusal.clear();
    sent.isKept = true;
    octets_ -= sent.text.size();
    sent.text.clear();
    settle(sent.dChannel);
}

void Outbox::countRefusal(const Carrier::Answer& answer) {
    ++figures_.refused;
    figures_.failures += answer.isAtLimit ? 0 : 1;
    figures_.isFull = answer.isFull;
    figures_.refusal = answer.error;
}

// A stream numbers what it takes. If a number comes for the second time, the stream has lost what it had
// given that number before.
void Outbox::countKept(const Carrier::Answer& answer) {
    if (answer.isDuplicate)
        return;
    newestKept_ = Clock::now();
    if (answer.sequence == 0 || answer.sequence > highest_) {
        highest_ = std::max(highest_, answer.sequence);
        return;
    }
    ++figures_.forgotten;
    if (highest_ - answer.sequence > mostForgotten)
        highest_ = answer.sequence;
}

// A parcel after one that is not safe does not count yet, because a new start begins at the one that is not.
void Outbox::settle(std::size_t dChannel) {
    std::deque<std::uint64_t>& tokens = ofDChannel_[dChannel];
    SafeUpTo safe;
    while (!tokens.empty()) {
        const auto found = parcels_.find(tokens.front());
        if (!found->second.isKept)
            break;
        safe = found->second.then;
        parcels_.erase(found);
        tokens.pop_front();
    }
    if (safe.run != 0)
        safe_(dChannel, safe);
}

void Outbox::drop(std::size_t dChannel) {
    if (waiting(dChannel) == 0)
        return;
    for (const std::uint64_t token : ofDChannel_[dChannel]) {
        const auto found = parcels_.find(token);
        octets_ -= found->second.text.size();  // empty once it is kept
        parcels_.erase(found);
    }
    ofDChannel_[dChannel].clear();
}

void Outbox::sendAllAgain() {
    for (auto& [token, sent] : parcels_) {
        sent.isOut = false;
        sent.due = {};
    }
    nextDue_ = {};
}

}  // namespace fleet
