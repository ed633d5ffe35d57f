// Octets as hexadecimal digits, lower case.
#ifndef SOFTBOARD_HEX_H
#define SOFTBOARD_HEX_H

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace softboard {

std::string hex(std::span<const uint8_t> octets);
// Throws std::invalid_argument for an odd number of characters and for any character but 0 to 9 and a to f.
std::vector<uint8_t> fromHex(std::string_view text);

}  // namespace softboard

#endif
