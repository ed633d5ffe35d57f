// Measures how much the B channels were in use: each channel, at the same time, and in each hour.
#ifndef CALLS_OCCUPANCY_H
#define CALLS_OCCUPANCY_H

#include <compare>
#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "calls/Analysis.h"
#include "calls/Maintenance.h"
#include "calls/UseOverTime.h"

namespace calls {

// An hour of the clock that the frames' times belong to, as whole hours since that clock began.
struct HourKey {
    capture::Clock clock = capture::Clock::none;
    std::int64_t hour = 0;
    auto operator<=>(const HourKey&) const = default;
};
// The hour of a moment; nothing if the moment has no time.
std::optional<HourKey> hourOf(const Moment& moment);

// A channel is in use from the first answer to SETUP until its call has ended or is on hold.
class Occupancy {
  public:
    struct Channel {
        std::uint64_t calls = 0;  // the calls that it was given to
        std::int64_t used = 0;    // nanoseconds
        bool usedAtEnd = false;   // a call held it when the trace ended
        bool stuck = false;       // a finding says so
        std::vector<std::uint64_t> holders{};
        Moment since{};  // when the present use began, while there are holders
    };
    // The channels for the calls of one D channel, or of several D channels that share their calls.
    struct Group {
        std::string dChannels;  // their names
        std::map<ChannelKey, Channel> channels{};
        unsigned inUse = 0;
        unsigned most = 0;               // the largest number of channels in use at the same time
        std::optional<Moment> mostAt{};  // when that number was reached first
        std::int64_t used = 0;           // nanoseconds, of all channels together
        std::int64_t heard = 0;          // nanoseconds from the first frame to the last
        std::uint64_t unknown = 0;       // how many calls have a channel that no message in the trace names
        UseOverTime overTime{};
        bool primary = false;  // there are channels of a primary rate
        bool ofT1 = false;     // the variant is one of trunks with 24 channels

        // Channels in use on average.
        double erlangs() const;
    };

    // To be called as the functions of calls::Listener.
    void heard(const Message& message, const Call& call);
    void ended(const Call& call);
    void found(const Finding& finding);
    // The trace has ended.
    void finish(const std::vector<Span>& spans);

    const std::map<std::uint32_t, Group>& groups() const { return groups_; }
    // For each hour in which a channel was in use: the time in use of all channels together, in nanoseconds.
    const std::map<HourKey, std::int64_t>& hours() const { return hours_; }

    // The largest number of channels, and of hours. Others are not counted.
    static constexpr std::size_t mostChannels = 65536;
    static constexpr std::size_t mostHours = 20000;

  private:
    void begin(const Message& message, const Call& call);
    void end(const Call& call, const Moment& moment);
    void stop(Group& group, Channel& channel, const Moment& moment);
    void spread(const Moment& from, std::int64_t until);

    std::map<std::uint32_t, Group> groups_;
    std::map<HourKey, std::int64_t> hours_;
    std::map<std::uint64_t, std::vector<ChannelKey>> held_;  // by number of the call
    std::map<std::string, std::uint32_t> groupOf_;           // by name of the D channel
    std::size_t channels_ = 0;
};

// How many B channels a trunk has: 30 (E1), 23 (T1) or two (basic access).
enum class TrunkSize : std::uint8_t { unknown, e1, t1, basic };
std::string_view nameOf(TrunkSize size);  // "E1"
// The size that the channels in use and the variant suggest; unknown if no call has used a channel.
TrunkSize learntSize(const Occupancy::Group& group);
// The B channels of a trunk of this size that no call has used, for each interface that calls have named. The
// channels are 1 to 15 and 17 to 31, 1 to 23, or 1 and 2. Returns none if the size is unknown.
std::vector<ChannelKey> neverUsed(TrunkSize size, const Occupancy::Group& group);

}  // namespace calls

#endif
