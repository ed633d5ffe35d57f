// Values as the database reads them.
#ifndef FLEET_STORE_SQL_TEXT_H
#define FLEET_STORE_SQL_TEXT_H

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace fleet {

// A field of a row that COPY takes; nothing is NULL.
using Field = std::optional<std::string>;
template <std::size_t width>
using Row = std::array<Field, width>;

// "2026-11-21 11:25:33.300000+00", of nanoseconds since 1970; parts of a microsecond are cut off.
std::string timestampText(std::int64_t nanoseconds);
// "2026-11-21", of the same, in UTC.
std::string dayText(std::int64_t nanoseconds);
// "\x0201", a bytea.
std::string octetsText(const std::vector<std::uint8_t>& octets);
// What is no printable ASCII becomes "?", and what is too long is cut.
std::string printable(std::string_view text, std::size_t longest);

}  // namespace fleet

#endif
