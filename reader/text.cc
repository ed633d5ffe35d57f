#include "reader/text.h"

#include <algorithm>

namespace reader {

namespace {

constexpr char hexDigits[] = "0123456789abcdef";

constexpr bool isPrintable(char character) { return character >= ' ' && character <= '~'; }
constexpr bool isSafe(char character) { return isPrintable(character) && character != '\\'; }

// Looks at every character, so that the compiler can look at many at once: hardly any text is unsafe.
bool isAllSafe(std::string_view text) {
    unsigned char unsafe = 0;
    for (const char character : text) {
        const auto octet = static_cast<unsigned char>(character);
        unsafe = static_cast<unsigned char>(unsafe | (octet < ' ') | (octet > '~') | (octet == '\\'));
    }
    return unsafe == 0;
}

void appendEscaped(std::string& to, char character) {
    const auto octet = static_cast<unsigned char>(character);
    const char escape[] = {'\\', 'x', hexDigits[octet >> 4], hexDigits[octet & 15]};
    to.append(escape, sizeof escape);
}

// Appends the text. Characters that are not plain are appended as `escape` shows them.
template <class IsPlain>
void appendEscaping(std::string& to, std::string_view text, IsPlain isPlain) {
    auto at = text.begin();
    while (at != text.end()) {
        const auto next = std::find_if_not(at, text.end(), isPlain);
        to.append(at, next);
        if (next == text.end())
            return;
        if (*next == '\\')
            to += "\\\\";
        else
            appendEscaped(to, *next);
        at = next + 1;
    }
}

}  // namespace

void appendSafe(std::string& to, std::string_view text) { appendEscaping(to, text, isSafe); }

void makeSafe(std::string& text, std::size_t start) {
    if (isAllSafe(std::string_view(text).substr(start)))
        return;
    const std::string unsafe = text.substr(start);
    text.resize(start);
    appendSafe(text, unsafe);
}

std::string safe(std::string_view text) {
    std::string result;
    appendSafe(result, text);
    return result;
}

void appendEntities(std::string& to, std::string_view text) {
    for (const char character : text) {
        switch (character) {
            case '&':
                to += "&amp;";
                break;
            case '<':
                to += "&lt;";
                break;
            case '>':
                to += "&gt;";
                break;
            case '"':
                to += "&quot;";
                break;
            default:
                to += character;
        }
    }
}

void appendXml(std::string& to, std::string_view text) { appendEntities(to, safe(text)); }

void appendForTerminal(std::string& to, std::string_view text) {
    appendEscaping(to, text, [](char character) {
        return isPrintable(character) || character == '\n' || character == '\t';
    });
}

void appendHex(std::string& to, std::span<const std::uint8_t> octets) {
    const std::size_t start = to.size();
    to.resize(start + 2 * octets.size());
    char* at = to.data() + start;
    for (const std::uint8_t octet : octets) {
        *at++ = hexDigits[octet >> 4];
        *at++ = hexDigits[octet & 15];
    }
}

std::string decimal(double value, int digits) {
    char text[64];
    const auto [end, error] =
        std::to_chars(text, text + sizeof text, value, std::chars_format::fixed, digits);
    return error == std::errc() ? std::string(text, end) : std::string();
}

void padTo(std::string& to, std::size_t start, std::size_t width, bool right) {
    const std::size_t length = to.size() - start;
    if (length < width)
        to.insert(right ? start : to.size(), width - length, ' ');
}

std::string plainName(std::string_view name) {
    std::string plain;
    for (const char character : name) {
        if (character != ' ' && character != '-' && character != '_')
            plain +=
                character >= 'A' && character <= 'Z' ? static_cast<char>(character - 'A' + 'a') : character;
    }
    return plain;
}

std::vector<std::string> splitAtCommas(std::string_view words) {
    std::vector<std::string> split;
    while (!words.empty()) {
        const std::size_t comma = std::min(words.find(','), words.size());
        if (comma > 0)
            split.emplace_back(words.substr(0, comma));
        words.remove_prefix(std::min(comma + 1, words.size()));
    }
    return split;
}

}  // namespace reader
