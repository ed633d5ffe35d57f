// Writes values in the form that the database reads.
#ifndef FLEET_STORE_SQL_TEXT_H
#define FLEET_STORE_SQL_TEXT_H

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace fleet {

// A field of a row for COPY; nothing stands for NULL.
using Field = std::optional<std::string>;
template <std::size_t width>
using Row = std::array<Field, width>;

// "2026-11-21 11:25:33.300000+00" for nanoseconds since 1970; parts of a microsecond are cut off.
std::string timestampText(std::int64_t nanoseconds);
// "2026-11-21": the day in UTC, for nanoseconds since 1970.
std::string dayText(std::int64_t nanoseconds);
// "\x0201": a bytea.
std::string octetsText(const std::vector<std::uint8_t>& octets);
// Returns the text with "?" in place of each octet that is not printable ASCII, cut to `longest` octets.
std::string printable(std::string_view text, std::size_t longest);

}  // namespace fleet

#endif
