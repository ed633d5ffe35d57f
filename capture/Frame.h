// One frame of a D channel, as every input gives it and every output takes it.
#ifndef CAPTURE_FRAME_H
#define CAPTURE_FRAME_H

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace capture {

// Which end of the link our side is (Q.921 3.3.2). Our side is the one whose frames count as transmitted.
enum class Role : std::uint8_t { unknown, user, network };

// The switch variant of a trunk. `variantName` gives "4ess", "5ess", "dms100", "ntt", "net5", "ni2", and ""
// for unknown; `variantNamed` is its reverse, and unknown for any other name.
enum class Variant : std::uint8_t { unknown, att4ess, ess5, dms100, ntt, net5, ni2 };
std::string_view variantName(Variant variant);
Variant variantNamed(std::string_view name);

// What a frame's time counts from. none: there is no time; relative: the first frame of the input; absolute:
// 1 January 1970, UTC.
enum class Clock : std::uint8_t { none, relative, absolute };

// The D channel that a frame was recorded on. Frames of one name belong to one trunk, also across files.
struct Interface {
    std::string name;  // a pcapng interface name, or else the file name up to its start time
    Variant variant = Variant::unknown;

    bool operator==(const Interface&) const = default;
};

// The place in an input where something stood, for messages: the line of a text or the packet of a capture,
// counted from 1.
struct Place {
    enum class Unit : std::uint8_t { line, packet };

    std::string_view file;  // valid as long as the reader; "-" is the standard input
    std::uint64_t number = 0;
    Unit unit = Unit::line;
};
// "day.log:17" for a line, "day.pcap: packet 17" for a packet.
std::string toString(const Place& place);

inline constexpr std::int64_t nanosecondsPerTick = 4'000'000;  // of the board's clock

struct Frame {
    // Address, control and information, without the check sequence. The reader that gave the frame owns them,
    // and they are valid until it is asked for the next item; Batch keeps copies.
    std::span<const std::uint8_t> octets;
    // Whether our side sent the frame. If the input does not tell directions, the user side counts as ours
    // (Directions), and `role` is user.
    bool transmitted = false;
    Role role = Role::unknown;
    Clock clock = Clock::none;
    std::int64_t time = 0;               // nanoseconds, as `clock` says
    std::optional<std::uint32_t> ticks;  // the board's time stamp, which wraps at 2^32
    std::optional<std::int64_t>
        // the second, since 1970 on the host's clock, in which the recorder wrote the frame; known from logs
        written;
    const Interface* interface = nullptr;  // never null in what a reader gives; valid as long as the reader
    Place place;
};

}  // namespace capture

#endif
