// Pieces of text that lines are made of.
#ifndef READER_TEXT_H
#define READER_TEXT_H

#include <charconv>
#include <concepts>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace reader {

// Appends text that may come from a frame or a file name. Control characters and octets that are not ASCII
// appear as \xHH, so that a terminal only ever gets what can be read; a backslash appears as two.
void appendSafe(std::string& to, std::string_view text);
std::string safe(std::string_view text);

// Text that is safe already, as text of XML or HTML, or as an attribute's value between double quotes.
void appendEntities(std::string& to, std::string_view text);
// Both: text that may come from a frame, for XML or HTML.
void appendXml(std::string& to, std::string_view text);

// What a terminal may get of the text of a log: line feeds and tabs stay, everything else that is no
// printable ASCII appears as \xHH.
void appendForTerminal(std::string& to, std::string_view text);

// Octets as lower-case hexadecimal digits, without blanks.
void appendHex(std::string& to, std::span<const std::uint8_t> octets);

template <std::integral Number>
void appendNumber(std::string& to, Number number, int base = 10) {
    char digits[24];
    to.append(digits, std::to_chars(digits, digits + sizeof digits, number, base).ptr);
}

// Fills up with blanks what was appended since `start`, so that it is `width` characters long.
void padTo(std::string& to, std::size_t start, std::size_t width, bool right = false);

// Without blanks, "-" and "_", in small letters: "RELEASE-COMPLETE" and "release complete" are one name.
std::string plainName(std::string_view name);

// The words between commas; no empty ones.
std::vector<std::string> splitAtCommas(std::string_view words);

// The whole text as a number; false when it is anything else or does not fit.
template <std::integral Number>
bool readNumber(std::string_view text, Number& number, int base = 10) {
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number, base);
    return error == std::errc() && end == text.data() + text.size() && !text.empty();
}

}  // namespace reader

#endif
