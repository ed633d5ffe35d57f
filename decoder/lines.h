// Composes the decoded text. Pieces are put together in memory, and flushLines hands them to the log in one
// piece. The text never goes to the screen.
//
// Text is made of literals, octets and numbers. There are no format strings to read while the program runs:
//
//     text("TEI=0x", hex(tei), "\n");        line("  3:     0x", hex(octet), "  Signal Value");
//
// Each thread composes text of its own. Callers must see to it that only one thread at a time calls
// flushLines.
#ifndef DECODER_LINES_H
#define DECODER_LINES_H

#include <algorithm>
#include <array>
#include <bit>
#include <charconv>
#include <concepts>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string_view>

#include "decoder/state.h"

namespace decoder {

// The text that a thread has composed and not yet handed to the log. It grows as needed and keeps its memory
// until the thread ends.
class LineBuffer {
  public:
    // Returns a place where n characters can be written. Afterwards call commit with the end of what was
    // written.
    char* room(std::size_t n) {
        if (static_cast<std::size_t>(end_ - at_) < n)
            grow(n);
        return at_;
    }
    void commit(char* at) { at_ = at; }

    std::string_view composed() const { return {begin_, static_cast<std::size_t>(at_ - begin_)}; }
    void clear() { at_ = begin_; }

  private:
    [[gnu::cold, gnu::noinline]] void grow(std::size_t n);

    // Another thread_local object owns the memory (lines.cc). This one has no destructor, so that the
    // compiler reaches it without checking whether it has been constructed.
    char* begin_ = nullptr;
    char* at_ = nullptr;
    char* end_ = nullptr;
};

inline constinit thread_local LineBuffer lineBuffer;

// Hands the text that this thread has composed so far to the log, by writeLog. Drops it when there is no log
// (file_output is false or ofp is null).
void flushLines();

// Takes the text of each flushLines. By default it writes the text to ofp. Whoever opens the log may set
// another function.
using LogWriter = void (*)(std::string_view composed);
void writeToStream(std::string_view composed);
inline constinit LogWriter writeLog = writeToStream;

// Takes the only line that the decoder has for the screen, oversizedFrame, without its line end. By default
// it writes the line to the standard output stream. A program may set another function.
using ScreenWriter = void (*)(std::string_view line);
void writeToStandardOutput(std::string_view line);
inline constinit ScreenWriter writeScreen = writeToStandardOutput;

// ---- pieces of text

namespace tables {

using Pair = std::array<char, 2>;

constexpr std::array<Pair, 256> makeHexPairs() {
    constexpr std::string_view digits = "0123456789abcdef";
    std::array<Pair, 256> pairs{};
    for (std::size_t i = 0; i < pairs.size(); ++i)
        pairs[i] = {digits[i >> 4], digits[i & 15]};
    return pairs;
}

// An octet as eight characters, most significant bit first: `set` for 1, `clear` for 0.
constexpr std::uint64_t patternOf(unsigned octet, char set, char clear) {
    std::array<char, 8> shown{};
    for (unsigned bit = 0; bit < 8; ++bit)
        shown[7 - bit] = ((octet >> bit) & 1U) != 0 ? set : clear;
    return std::bit_cast<std::uint64_t>(shown);
}

constexpr std::array<std::uint64_t, 256> makeDigits() {
    std::array<std::uint64_t, 256> patterns{};
    for (unsigned i = 0; i < patterns.size(); ++i)
        patterns[i] = patternOf(i, '1', '0');
    return patterns;
}

// fields[high][low] has all bits set in the characters that belong to the field, and none in those that show
// "-".
constexpr std::array<std::array<std::uint64_t, 9>, 9> makeFields() {
    std::array<std::array<std::uint64_t, 9>, 9> fields{};
    for (unsigned high = 1; high <= 8; ++high) {
        for (unsigned low = 1; low <= high; ++low)
            fields[high][low] = patternOf((1U << high) - (1U << (low - 1)), '\xff', '\0');
    }
    return fields;
}

inline constexpr auto hexPairs = makeHexPairs();
inline constexpr auto digits = makeDigits();
inline constexpr auto fields = makeFields();
inline constexpr std::uint64_t dashes = patternOf(0xFF, '-', '-');

}  // namespace tables

// Numbers as printf would write them: an octet with "%02x", "%x" and "%2x", a number with "%d". A char is
// written as itself.
struct Hex {
    unsigned char value;
};
struct HexUnpadded {
    unsigned char value;
};
struct HexBlankPadded {
    unsigned char value;
};
template <std::integral Number>
struct Decimal {
    Number value;
};
constexpr Hex hex(int octet) { return {static_cast<unsigned char>(octet)}; }
constexpr HexUnpadded hexUnpadded(int octet) { return {static_cast<unsigned char>(octet)}; }
constexpr HexBlankPadded hexBlankPadded(int octet) { return {static_cast<unsigned char>(octet)}; }
template <std::integral Number>
constexpr Decimal<Number> dec(Number value) {
    return {value};
}

// Six blanks and a bit pattern, "-" outside the field; 1 <= low <= high <= 8.
struct Bits {
    int value;
    int high;
    int low;
};

// For each kind of piece: sizeOf is the largest number of characters that it takes, and put writes it at `at`
// and returns the place after its last character.
template <std::size_t N>
constexpr std::size_t sizeOf(const char (&)[N]) {
    return N - 1;
}
template <std::size_t N>
std::size_t sizeOf(char (&)[N]) = delete;  // a char array that is no literal: pass it as a string_view
constexpr std::size_t sizeOf(std::string_view words) { return words.size(); }
constexpr std::size_t sizeOf(Hex) { return 2; }
constexpr std::size_t sizeOf(HexUnpadded) { return 2; }
constexpr std::size_t sizeOf(HexBlankPadded) { return 2; }
template <std::integral Number>
constexpr std::size_t sizeOf(Decimal<Number>) {
    return 3 * sizeof(Number) + 1;
}
template <std::same_as<char> Character>  // a char, and no other type that converts to one
constexpr std::size_t sizeOf(Character) {
    return 1;
}
constexpr std::size_t sizeOf(Bits) { return 14; }

template <std::size_t N>
char* put(char* at, const char (&literal)[N]) {
    return std::copy_n(literal, N - 1, at);
}
inline char* put(char* at, std::string_view words) {
    std::memcpy(at, words.data(), words.size());
    return at + words.size();
}
inline char* put(char* at, Hex octet) {
    std::memcpy(at, &tables::hexPairs[octet.value], 2);
    return at + 2;
}
inline char* put(char* at, HexUnpadded octet) {
    const tables::Pair& pair = tables::hexPairs[octet.value];
    if (pair[0] != '0')
        *at++ = pair[0];
    *at++ = pair[1];
    return at;
}
inline char* put(char* at, HexBlankPadded octet) {
    const tables::Pair& pair = tables::hexPairs[octet.value];
    *at++ = pair[0] == '0' ? ' ' : pair[0];
    *at++ = pair[1];
    return at;
}
template <std::integral Number>
char* put(char* at, Decimal<Number> number) {
    return std::to_chars(at, at + sizeOf(number), number.value).ptr;
}
template <std::same_as<char> Character>
char* put(char* at, Character character) {
    *at = character;
    return at + 1;
}
inline char* put(char* at, Bits bits) {
    const std::uint64_t field =
        tables::fields[static_cast<unsigned>(bits.high)][static_cast<unsigned>(bits.low)];
    const std::uint64_t shown =
        (tables::digits[static_cast<unsigned char>(bits.value)] & field) | (tables::dashes & ~field);
    at = put(at, "      ");
    std::memcpy(at, &shown, sizeof shown);
    return at + sizeof shown;
}

// ---- what decoders and the application write

inline constexpr char indent[] = "                                 ";  // 33 blanks
inline constexpr std::size_t indentSize = sizeof indent - 1;

// Writes the pieces one after another, without indent and line end.
template <typename... Pieces>
void text(Pieces&&... pieces) {
    char* at = lineBuffer.room((sizeOf(pieces) + ... + 0));
    ((at = put(at, pieces)), ...);
    lineBuffer.commit(at);
}

// Writes the frame's indent, the pieces and a line end.
template <typename... Pieces>
void line(Pieces&&... pieces) {
    char* at = lineBuffer.room(indentSize + (sizeOf(pieces) + ... + 1));
    std::memcpy(at, indent, indentSize);
    at += flag == 0 ? indentSize : 0;
    ((at = put(at, pieces)), ...);
    *at++ = '\n';
    lineBuffer.commit(at);
}

// Writes the indent of a line: 33 blanks when f is 0, nothing otherwise.
inline void output(int f) {
    if (f == 0)
        text(indent);
}

// Writes the frame's indent, six blanks, 8 - high dashes, the bits `high` to `low` of the value, and low - 1
// dashes; no line end. Bits are numbered 8 (most significant) to 1; a position outside 8..1 has no digit. A
// field inside the octet therefore makes eight characters; one outside can make more.
void bitwise(int value, int high, int low);

}  // namespace decoder

#endif
