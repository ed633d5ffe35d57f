// How much the B channels were in use: by channel, at once, and by the hour.
#ifndef CALLS_OCCUPANCY_H
#define CALLS_OCCUPANCY_H

#include <compare>
#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "calls/Analysis.h"
#include "calls/Maintenance.h"

namespace calls {

// An hour of the clock that frames' times count on: whole hours since its beginning.
struct HourKey {
    capture::Clock clock = capture::Clock::none;
    std::int64_t hour = 0;
    auto operator<=>(const HourKey&) const = default;
};
// Nothing of a time that no clock has told.
std::optional<HourKey> hourOf(const Moment& moment);

// A channel is in use from the first answer to SETUP until its call has ended or is on hold.
class Occupancy {
  public:
    struct Channel {
        std::uint64_t calls = 0;  // that it was given to
        std::int64_t used = 0;    // nanoseconds
        bool usedAtEnd = false;   // a call held it when the trace ended
        bool stuck = false;       // there was a finding that says so
        std::vector<std::uint64_t> holders{};
        Moment since{};  // while there are holders
    };
    // Of the calls of one D channel, or of several that share their calls.
    struct Group {
        std::string dChannels;  // their names
        std::map<ChannelKey, Channel> channels{};
        unsigned inUse = 0;
        unsigned most = 0;               // channels in use at once
        std::optional<Moment> mostAt{};  // when that was so first
        std::int64_t used = 0;           // nanoseconds, of all channels together
        std::int64_t heard = 0;          // nanoseconds from the first frame to the last
        std::uint64_t unknown = 0;       // calls whose channel no message in the trace names
        bool primary = false;            // there are channels of a primary rate
        bool ofT1 = false;               // the variant is one of trunks with 24 channels

        // Channels in use on average.
        double erlangs() const;
    };

    // As a Listener is told.
    void heard(const Message& message, const Call& call);
    void ended(const Call& call);
    void found(const Finding& finding);
    // The trace has ended.
    void finish(const std::vector<Span>& spans);

    const std::map<std::uint32_t, Group>& groups() const { return groups_; }
    // Nanoseconds for which channels were in use, all together, in each hour in which one was.
    const std::map<HourKey, std::int64_t>& hours() const { return hours_; }

    // Beyond these, channels and hours are not told apart any more, and not counted.
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

// The channels that a trunk has: of a primary rate those of E1 or T1.
enum class TrunkSize : std::uint8_t { unknown, e1, t1, basic };
// What the channels in use and the variant suggest; unknown if no call has used one.
TrunkSize learntSize(const Occupancy::Group& group);
// The B channels of a trunk of this size on which no call was, for each interface that calls have named: 1 to
// 15 and 17 to 31, 1 to 23, or 1 and 2. None of an unknown size.
std::vector<ChannelKey> neverUsed(TrunkSize size, const Occupancy::Group& group);

}  // namespace calls

#endif
