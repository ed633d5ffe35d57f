// The two time lines that begin a frame in a log.
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
    cut,  // the text ends too early to say, and agrees so far
    bad
};

// Reads the time lines that `text` begins with, the empty line first. What it accepts is what the decoder
// writes, but for the date, which is any text of 24 characters here.
Reading readHeader(std::string_view text, Header& header);

// Whether `text` begins with these pieces, one behind another; then sets `size` to their size.
Reading readPieces(std::string_view text, std::initializer_list<std::string_view> pieces, std::size_t& size);

// How many lines end in `text`.
std::uint64_t lineEndsIn(std::string_view text);

inline constexpr std::size_t dateSize = 24;

}  // namespace lapdlog

#endif
