// A scenario: what the software board simulates. Boards, their D channels, and the frames on them.
#ifndef SOFTBOARD_SCENARIO_H
#define SOFTBOARD_SCENARIO_H

#include <cstdint>
#include <string>
#include <vector>

#include "softboard/faults.h"

namespace softboard {

// One D-channel frame: address, control and information octets, no check sequence.
struct Frame {
    bool transmitted = false;  // by the board
    uint32_t ticks = 0;        // since the first frame, in units of 4 ms; never less than the frame before
    std::vector<uint8_t> octets;

    bool operator==(const Frame&) const = default;
};

using Frames = std::vector<Frame>;

struct Rate {
    enum class Kind { recorded, perSecond, max };

    // The limits, in frames a second. Beyond them the computation of times would overflow.
    static constexpr double slowest = 1e-6;
    static constexpr double fastest = 1e6;
    static constexpr bool isPossible(double perSecond) {
        return slowest <= perSecond && perSecond <= fastest;
    }

    Kind kind = Kind::recorded;
    double perSecond = 0;

    bool operator==(const Rate&) const = default;
};

enum Protocol : uint32_t { att4ess = 1, att5ess = 2, dms100 = 3, ntt = 4, net5 = 7, ni2 = 12 };

struct DChannel {
    uint8_t board = 1;
    uint16_t number = 1;       // of the CCS instance
    uint32_t protocol = net5;  // value of the protocol parameter: one of Protocol, or any other number
    Rate rate;
    bool loop = false;
    uint32_t label = 2;  // first field of each trace event
    size_t capture = 0;  // index into the scenario's captures: the frames of this D channel

    bool operator==(const DChannel&) const = default;
};

// The boards are those that the D channels name.
struct Scenario {
    std::vector<DChannel> channels;
    std::vector<Frames> captures;
    std::vector<Fault> faults;
    std::string journal;  // path of the file that the journal is written to; empty: no file

    bool operator==(const Scenario&) const = default;
};

// Board 1 with D channel 1, which plays the frames. Tests use it.
Scenario oneChannel(Frames frames, Rate rate = {Rate::Kind::max, 0});

// Board 1 with D channel 1, which plays the built-in capture again and again at recorded rate.
Scenario builtinScenario();
// The built-in capture: the frames of examples/net5.frames.
const Frames& builtinFrames();

// The text in which the launcher hands a scenario to the library. fromJson throws std::runtime_error for a
// text that is no scenario.
std::string toJson(const Scenario& scenario);
Scenario fromJson(const std::string& text);

}  // namespace softboard

#endif
