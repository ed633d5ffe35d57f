// Functions that compose text.
#ifndef READER_TEXT_H
#define READER_TEXT_H

#include <charconv>
#include <concepts>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace reader {

// Appends text that may come from a frame or a file name. Control characters and octets that are not ASCII
// appear as \xHH, so that a terminal only ever gets what can be read; a backslash appears as two.
void appendSafe(std::string& to, std::string_view text);
std::string safe(std::string_view text);
// Gives the text from `start` on the form that appendSafe would have appended.
void makeSafe(std::string& text, std::size_t start);

// Appends text that is safe already, in the form that XML or HTML needs in text and between the double quotes
// of an attribute.
void appendEntities(std::string& to, std::string_view text);
// Does both: appends text that may come from a frame in the form that XML or HTML needs.
void appendXml(std::string& to, std::string_view text);

// Appends the text of a log in a form that is safe for a terminal: line feeds and tabs are kept, and
// everything else that is not printable ASCII becomes \xHH.
void appendForTerminal(std::string& to, std::string_view text);

// Appends octets as lower-case hexadecimal digits, without blanks.
void appendHex(std::string& to, std::span<const std::uint8_t> octets);

template <std::integral Number>
void appendNumber(std::string& to, Number number, int base = 10) {
    if (std::cmp_greater_equal(number, 0) && std::cmp_less(number, 10)) {
        to += static_cast<char>('0' + number);
        return;
    }
    char digits[24];
    to.append(digits, std::to_chars(digits, digits + sizeof digits, number, base).ptr);
}

// A number with this many digits after the point: "0.875", "41.7".
std::string decimal(double value, int digits);

// Adds blanks to the text that begins at `start` until it has `width` characters. `right`: the blanks go
// before it.
void padTo(std::string& to, std::size_t start, std::size_t width, bool right = false);

// The name in small letters without blanks, "-" and "_", so that "RELEASE-COMPLETE" and "release complete"
// are the same.
std::string plainName(std::string_view name);

// The words between commas, without empty ones.
std::vector<std::string> splitAtCommas(std::string_view words);

// Reads the whole text as a number. Returns false if it is no number or does not fit.
template <std::integral Number>
bool readNumber(std::string_view text, Number& number, int base = 10) {
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number, base);
    return error == std::errc() && end == text.data() + text.size() && !text.empty();
}

}  // namespace reader

#endif
