// Views of octets, and what can be wrong with them.
#ifndef ISDN_OCTETS_H
#define ISDN_OCTETS_H

#include <cstdint>
#include <span>
#include <string_view>

namespace isdn {

// A view of octets of a frame. The code that handed in the frame must keep it as long as any view of it is
// used.
using Octets = std::span<const std::uint8_t>;

// The same octets as characters, whatever they are.
inline std::string_view asCharacters(Octets octets) {
    return {reinterpret_cast<const char*>(octets.data()), octets.size()};  // NOLINT(*-reinterpret-cast)
}

// What is wrong with a frame, a message or an element. Its octets are available nevertheless.
enum class Problem : std::uint8_t {
    none,
    truncated,  // the frame ends before the length octet says
    tooShort,   // an octet that the standard demands is absent
    tooLong,    // octets follow that the standard does not know
    unknown,    // no table knows the identifier, or the code
    invalid,    // the octets contradict the standard: a wrong extension bit of an address, a wrong length
};

// In words: "truncated", "too short". Empty for `none`.
constexpr std::string_view nameOf(Problem problem) {
    constexpr std::string_view names[] = {"", "truncated", "too short", "too long", "unknown", "invalid"};
    return names[static_cast<unsigned>(problem)];
}

}  // namespace isdn

#endif
