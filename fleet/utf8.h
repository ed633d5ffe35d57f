// Turns any octets into text for JSON and for a data base.
#ifndef FLEET_UTF8_H
#define FLEET_UTF8_H

#include <string>
#include <string_view>

namespace fleet {

// Returns the text with "?" in place of each octet that is a NUL or not part of valid UTF-8 (RFC 3629). A
// longer text is cut to at most `most` octets, between two characters.
std::string cleanUtf8(std::string_view text, std::size_t most);

}  // namespace fleet

#endif
