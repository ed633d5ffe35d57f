// The two link types whose packets carry LAPD, and how to get the frames out of them.
#ifndef CAPTURE_LINK_H
#define CAPTURE_LINK_H

#include <array>
#include <cstdint>
#include <optional>
#include <span>
#include <string>

#include "capture/Directions.h"
#include "capture/Frame.h"

namespace capture {

inline constexpr std::uint32_t linuxLapd = 177;  // a pseudo-header of 16 octets stands in front of each frame
inline constexpr std::uint32_t plainLapd = 203;

inline constexpr std::size_t pseudoHeaderSize = 16;
// Big-endian: packet type (4: sent), hardware type, address length, address (bit 0 of its first octet: our
// side is the network), protocol 0x0030. An unknown role is written as user.
std::array<std::uint8_t, pseudoHeaderSize> pseudoHeaderOf(const Frame& frame);

// "link type 1 (EN10MB); a D-channel capture has 177 (LINUX_LAPD) or 203 (LAPD)", or empty for these two.
std::string complaintAbout(std::uint32_t linkType);

// Gets the frames out of the packets of one interface, which must be given in their order.
class Link {
  public:
    // `checkSequence` is the number of octets of check sequence at the end of each packet.
    explicit Link(std::uint32_t type, std::size_t checkSequence = 0)
        : type_(type), checkSequence_(checkSequence) {}

    // The number of octets in a packet before the frame.
    std::size_t before() const { return type_ == linuxLapd ? pseudoHeaderSize : 0; }
    // Sets the frame's octets, direction and role. `told` is the direction that the capture gives besides the
    // packet, if any; it is used for packets without a direction. Returns false for a packet that ends within
    // its pseudo-header.
    bool take(std::span<const std::uint8_t> packet, std::optional<bool> told, Frame& frame);

  private:
    std::uint32_t type_;
    std::size_t checkSequence_;
    Directions directions_;
};

}  // namespace capture

#endif
