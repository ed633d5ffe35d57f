// Replaces numbers, names and user data by pseudonyms.
#ifndef REDACTION_PSEUDONYMS_H
#define REDACTION_PSEUDONYMS_H

#include <cstdint>
#include <memory>
#include <span>
#include <string>

#include "redaction/Key.h"

namespace redaction {

// Replaces octets in place and keeps their number. Used by one thread at a time.
class Pseudonyms {
  public:
    enum class Characters : std::uint8_t { number, text };

    Pseudonyms() = default;
    Pseudonyms(const Pseudonyms&) = delete;
    Pseudonyms& operator=(const Pseudonyms&) = delete;
    virtual ~Pseudonyms() = default;

    // Replaces characters of a number or text. `before` holds the characters that precede them in it, without
    // pseudonyms; the function appends these characters to it, without pseudonyms as well. `*` and `#` are
    // kept.
    virtual void replaceCharacters(std::span<std::uint8_t> octets, std::string& before, Characters kind) = 0;
    // Replaces octets that are no characters: a subaddress, user data.
    virtual void replaceOctets(std::span<std::uint8_t> octets) = 0;
};

enum class Direction : std::uint8_t { redact, restore };

// Makes pseudonyms from a key. A digit becomes another digit, a letter another letter of its case, and so on.
// For a digit, the result depends on the key and on the digits before it in its run of digits. For any other
// character it depends on the key and on everything before it in the text. So a number has the same pseudonym
// everywhere, whether it comes in one piece or digit by digit, and numbers with the same beginning have
// pseudonyms with the same beginning.
std::unique_ptr<Pseudonyms> makePseudonyms(const Key& key, Direction direction);

// Sixteen hexadecimal digits that tell keys apart and say nothing else about them. Different keys have
// different ones, except with a chance of 1 in 2^64; so have different manners.
std::string checkOf(const Key& key);

}  // namespace redaction

#endif
