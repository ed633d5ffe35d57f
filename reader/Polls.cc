#include "reader/Polls.h"

#include <algorithm>

namespace reader {

namespace {

constexpr std::chrono::seconds t200{1};

}  // namespace

void Polls::take(Chunk& chunk, Seen& seen) {
    if (!seen.marks.answers)
        return;
    const auto poll = std::find_if(chunk.seen().rbegin(), chunk.seen().rend(),
                                   [&](const Seen& other) { return other.number == *seen.marks.answers; });
    if (poll == chunk.seen().rend())
        return;
    poll->keepAlive = true;
    seen.keepAlive = true;
}

std::size_t Polls::open(Chunk& chunk, bool inputHasEnded) {
    if (chunk.empty() || inputHasEnded)
        return chunk.size();
    const std::int64_t now = chunk.seen().back().sinceFirst;
    constexpr std::int64_t longest = std::chrono::nanoseconds(t200).count();
    const auto poll = std::find_if(chunk.seen().begin(), chunk.seen().end(), [&](const Seen& seen) {
        return seen.marks.keepAlive && !seen.keepAlive && now - seen.sinceFirst <= longest;
    });
    if (poll == chunk.seen().end())
        return chunk.size();
    if (poll->number != waitingFor_) {
        waitingFor_ = poll->number;
        since_ = HostClock::now();
    }
    return HostClock::now() - since_ > t200 ? chunk.size()
                                            : static_cast<std::size_t>(poll - chunk.seen().begin());
}

}  // namespace reader
