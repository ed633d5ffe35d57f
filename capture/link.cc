#include "capture/link.h"

#include <pcap/pcap.h>

#include <algorithm>

namespace capture {

namespace {

constexpr std::uint8_t outgoing = 4;
constexpr std::size_t addressAt = 6;
constexpr std::uint8_t networkBit = 0x01;

}  // namespace

std::array<std::uint8_t, pseudoHeaderSize> pseudoHeaderOf(const Frame& frame) {
    std::array<std::uint8_t, pseudoHeaderSize> header{};
    header[1] = frame.transmitted ? outgoing : 0;
    header[addressAt] = frame.role == Role::network ? networkBit : 0;
    header[pseudoHeaderSize - 1] = 0x30;
    return header;
}

std::string complaintAbout(std::uint32_t linkType) {
    if (linkType == linuxLapd || linkType == plainLapd)
        return {};
    const char* const name = pcap_datalink_val_to_name(static_cast<int>(linkType));
    return "link type " + std::to_string(linkType) + (name != nullptr ? " (" + std::string(name) + ")" : "") +
           "; a D-channel capture has 177 (LINUX_LAPD) or 203 (LAPD)";
}

bool Link::take(std::span<const std::uint8_t> packet, std::optional<bool> told, Frame& frame) {
    if (packet.size() < before())
        return false;
    const std::span<const std::uint8_t> rest = packet.subspan(before());
    frame.octets = rest.first(rest.size() - std::min(rest.size(), checkSequence_));
    if (type_ == linuxLapd) {
        frame.transmitted = (packet[0] << 8U | packet[1]) == outgoing;
        frame.role = (packet[addressAt] & networkBit) != 0 ? Role::network : Role::user;
    } else {
        frame.transmitted = told ? *told : directions_.isTransmitted(frame.octets);
        frame.role = told ? Role::unknown : Role::user;
    }
    return true;
}

}  // namespace capture
