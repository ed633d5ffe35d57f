// Recorded D-channel frames from a capture file.
#ifndef SOFTBOARD_CAPTURE_H
#define SOFTBOARD_CAPTURE_H

#include <set>
#include <string>

#include "softboard/scenario.h"

namespace softboard {

// Reads a pcap or pcapng file of link type 177 (LAPD with a 16-octet pseudo-header, which tells the
// direction) or 203 (LAPD alone, where Directions finds it out). Throws BadInput, which names the file, the
// frame and the reason.
Frames readCapture(const std::string& path);

// Tells the direction of LAPD frames, seen from the user side of the link, by the C/R bit (Q.921 3.3.2): the
// network sends commands with 1 and responses with 0, the user the other way round. A supervisory frame may
// be either: with P/F clear it is taken for a response, with P/F set for a command unless it answers one.
class Directions {
  public:
    // Whether the next frame of the capture was transmitted by the user side.
    bool isTransmitted(const std::vector<uint8_t>& octets);

  private:
    bool isCommand(uint8_t control, bool pollFinal, uint32_t address);

    std::set<uint32_t> polled_;  // addresses, C/R bit included, with which a poll waits for its answer
};

}  // namespace softboard

#endif
