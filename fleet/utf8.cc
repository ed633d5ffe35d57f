#include "fleet/utf8.h"

#include <algorithm>
#include <cstdint>

namespace fleet {

namespace {

std::uint8_t octetAt(std::string_view text, std::size_t at) { return static_cast<std::uint8_t>(text[at]); }

// How many octets the character that begins here has; 0 if none does. RFC 3629, 4.
std::size_t characterAt(std::string_view text) {
    const std::uint8_t lead = octetAt(text, 0);
    if (lead < 0x80)
        return lead == 0 ? 0 : 1;
    const std::size_t size = lead < 0xC2 ? 0 : lead < 0xE0 ? 2 : lead < 0xF0 ? 3 : lead < 0xF5 ? 4 : 0;
    if (size == 0 || text.size() < size)
        return 0;
    const auto follows = [](char c) { return (static_cast<unsigned char>(c) & 0xC0U) == 0x80; };
    if (!std::all_of(text.begin() + 1, text.begin() + static_cast<std::ptrdiff_t>(size), follows))
        return 0;
    const std::uint8_t second = octetAt(text, 1);
    const bool isOverlong = (lead == 0xE0 && second < 0xA0) || (lead == 0xF0 && second < 0x90);
    const bool isSurrogate = lead == 0xED && second >= 0xA0;
    const bool isBeyond = lead == 0xF4 && second >= 0x90;
    return isOverlong || isSurrogate || isBeyond ? 0 : size;
}

}  // namespace

std::string cleanUtf8(std::string_view text, std::size_t most) {
    std::string clean;
    while (!text.empty()) {
        const std::size_t size = characterAt(text);
        const std::string_view character = size == 0 ? "?" : text.substr(0, size);
        if (clean.size() + character.size() > most)
            break;
        clean += character;
        text.remove_prefix(std::max<std::size_t>(size, 1));
    }
    return clean;
}

}  // namespace fleet
