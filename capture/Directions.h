// Guesses which side sent a frame, for inputs that do not say so.
#ifndef CAPTURE_DIRECTIONS_H
#define CAPTURE_DIRECTIONS_H

#include <bitset>
#include <cstdint>
#include <span>

namespace capture {

// Tells the direction of LAPD frames, seen from the user side of the link, by the C/R bit (Q.921 3.3.2): the
// network sends commands with 1 and responses with 0, the user the other way round. A supervisory frame may
// be either: with P/F clear it is taken for a response, with P/F set for a command unless it answers one.
class Directions {
  public:
    // Whether the next frame of the capture was transmitted by the user side.
    bool isTransmitted(std::span<const std::uint8_t> octets);

  private:
    bool isCommand(std::uint8_t control, bool pollFinal, std::uint32_t address);

    std::bitset<65536> polled_;  // by address with C/R bit: whether a poll waits for its answer
};

}  // namespace capture

#endif
