// Text of any origin, made fit for JSON and for a data base.
#ifndef FLEET_UTF8_H
#define FLEET_UTF8_H

#include <string>
#include <string_view>

namespace fleet {

// The text with "?" for each octet that is a NUL or no part of valid UTF-8 (RFC 3629), cut at a character's
// boundary to at most `most` octets.
std::string cleanUtf8(std::string_view text, std::size_t most);

}  // namespace fleet

#endif
