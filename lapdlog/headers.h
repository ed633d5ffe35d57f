// Reads the two time lines with which a frame begins in a log.
#ifndef LAPDLOG_HEADERS_H
#define LAPDLOG_HEADERS_H

#include <cstdint>
#include <initializer_list>
#include <string_view>

namespace lapdlog {

struct Header {
    bool transmitted = false;
    std::string_view written;  // "Sat Nov 21 11:25:33 2026"
    std::uint32_t ticks = 0;
    std::size_t size = 0;  // octets of the empty line and both time lines
};

enum class Reading : std::uint8_t {
    good,
    cut,  // the text agrees as far as it goes, and ends too early
    bad
};

// Reads the time lines that `text` begins with, including the empty line before them. Accepts exactly what
// the decoder writes, except that the date may be any text of 24 characters.
Reading readHeader(std::string_view text, Header& header);

// Checks whether `text` begins with these pieces, one after another. If so, sets `size` to their total size.
Reading readPieces(std::string_view text, std::initializer_list<std::string_view> pieces, std::size_t& size);

// The number of line ends in `text`.
std::uint64_t lineEndsIn(std::string_view text);

inline constexpr std::size_t dateSize = 24;

}  // namespace lapdlog

#endif
