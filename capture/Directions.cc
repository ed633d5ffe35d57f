#include "capture/Directions.h"

namespace capture {

bool Directions::isTransmitted(std::span<const std::uint8_t> octets) {
    const auto octet = [&](std::size_t at) -> std::uint8_t { return at < octets.size() ? octets[at] : 0; };
    const bool commandResponse = (octet(0) & 0x02) != 0;
    const bool pollFinal = (octet(3) & 0x01) != 0;
    const std::uint32_t address = octet(0) << 8U | octet(1);
    return isCommand(octet(2), pollFinal, address) != commandResponse;
}

bool Directions::isCommand(std::uint8_t control, bool pollFinal, std::uint32_t address) {
    constexpr std::uint8_t pollFinalBit = 0x10;  // of an unnumbered frame
    if ((control & 0x01) == 0)
        return true;  // I
    if ((control & 0x03) == 0x03) {
        const int frame = control & ~pollFinalBit;
        return frame != 0x0f && frame != 0x63 && frame != 0x87;  // DM, UA, FRMR
    }
    const bool answers = pollFinal && polled_[address];
    polled_[address] = pollFinal && !answers;
    return pollFinal && !answers;
}

}  // namespace capture
