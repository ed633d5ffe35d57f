// What has been read so far, for the screens: items, calls, findings, trunks.
#ifndef READER_BROWSE_TRACE_H
#define READER_BROWSE_TRACE_H

#include <cstdint>
#include <deque>
#include <map>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "reader/CallLadder.h"
#include "reader/Comparison.h"
#include "reader/browse/FrameStore.h"
#include "reader/browse/Update.h"

namespace reader::browse {

// What an update has changed.
struct Changes {
    std::vector<std::uint64_t> calls{};  // new, or changed
    std::vector<std::uint64_t> gone{};   // calls that are not kept any more
    bool findings = false;               // there are new findings, or some are not kept any more
};

// A message that came in segments, put together.
struct JoinedMessage {
    std::vector<std::uint8_t> octets;   // from the protocol discriminator on
    std::vector<std::uint64_t> frames;  // the frames that carried it, in their order
};

// Memory is bounded: a call that has ended, and a finding, is dropped when its last frame is. Used on one
// thread.
class Trace {
  public:
    explicit Trace(std::size_t mostItems = FrameStore::usualMost) : frames_(mostItems) {}

    Changes apply(Update update);

    const FrameStore& frames() const { return frames_; }
    // All calls that are kept, by number.
    const std::map<std::uint64_t, calls::Call>& calls() const { return calls_; }
    // Null if the call is not kept. Valid until the next apply().
    const calls::Call* call(std::uint64_t number) const;
    // The number of the call that a frame belongs to; 0 if it belongs to none.
    std::uint64_t callOf(std::uint64_t frame) const;
    // The frames of a call in their order, also those that are not kept any more.
    std::span<const CallFrame> framesOf(std::uint64_t call) const;
    // The findings in the order in which they became certain. Their numbers count from 0; firstFinding() is
    // the number of the first that is kept.
    const std::deque<calls::Finding>& findings() const { return findings_; }
    std::uint64_t firstFinding() const { return firstFinding_; }
    const std::vector<TrunkView>& trunks() const { return trunks_; }

    Update::State state() const { return state_; }
    const std::string& error() const { return error_; }
    std::uint64_t callsDropped() const { return callsDropped_; }

    // The call as a ladder, as far as its frames are kept; its first rung says how many are not.
    CallLadder ladderOf(const calls::Call& call, TimeText& times) const;
    // The call's messages as the other side's layer 2 has accepted them.
    std::vector<ComparedMessage> messagesOf(const calls::Call& call) const;
    // The message of one frame; nothing if the frame carries none.
    std::optional<ComparedMessage> messageOf(std::uint64_t frame) const;
    // The whole message of which a frame carries a segment; nothing if another of its segments is not kept.
    std::optional<JoinedMessage> joinedOf(std::uint64_t frame) const;

    // The most findings that are kept, and the most frames that are noted for one call.
    static constexpr std::size_t mostFindings = 100'000;
    static constexpr std::size_t mostFramesOfCall = 65'536;

  private:
    void takeFrame(const CallFrame& frame);
    std::vector<CallFrame> framesForLadder(const calls::Call& call) const;
    std::size_t countGone(std::span<const CallFrame> frames) const;
    void prune(Changes& changes);

    FrameStore frames_;
    std::map<std::uint64_t, calls::Call> calls_;
    // By number of the call, also for calls that are not shown yet.
    std::map<std::uint64_t, std::vector<CallFrame>> framesOf_;
    std::deque<CallFrame> ofCalls_;  // the same in the order of the input, with RESTARTs
    std::deque<calls::Finding> findings_;
    std::uint64_t firstFinding_ = 0;
    std::vector<TrunkView> trunks_;
    Update::State state_ = Update::State::reading;
    std::string error_;
    std::uint64_t callsDropped_ = 0;
};

}  // namespace reader::browse

#endif
