// Frames of a D channel, written as a story.
#ifndef TESTS_CALLS_SCRIPT_H
#define TESTS_CALLS_SCRIPT_H

#include <cstdint>
#include <deque>
#include <string_view>
#include <vector>

#include "calls/Message.h"
#include "capture/Frame.h"

namespace calls::testing {

struct ScriptFrame {
    std::vector<std::uint8_t> octets;
    capture::Frame frame;  // its octets are set by whoever hands it on: see frameOf
    std::int64_t at = 0;
};
// A view of it, valid as long as it.
capture::Frame frameOf(const ScriptFrame& scripted);

// A frame a line: seconds, direction, frame. ">" is sent by our side, "<" by the other one.
//
//     0.000 > SABME          a command
//     0.010 < UA             an answer
//     0.020 > I 0 0          N(S), N(R); with " P" a poll; "= 08 01..." sets its information
//     0.030 < RR 1           a response; "RR 1 P" a command with P, "RR 1 F" a response with F
//     0.040 < UI = 0F ...    at TEI 127; "sapi 63" and "tei 64" in front of the frame set its address
//
// Our side is the user; with `network` it is the network. Information of an I frame that the story does not
// set depends on N(S) alone, so that a repetition is octet for octet the same. Throws std::runtime_error
// naming the line.
std::vector<ScriptFrame> script(std::string_view story, bool network = false);

}  // namespace calls::testing

#endif
