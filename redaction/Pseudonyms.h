// What stands in place of numbers, names and user data.
#ifndef REDACTION_PSEUDONYMS_H
#define REDACTION_PSEUDONYMS_H

#include <cstdint>
#include <memory>
#include <span>
#include <string>

#include "redaction/Key.h"

namespace redaction {

// Replaces octets where they stand. Length stays. Used by one thread at a time.
class Pseudonyms {
  public:
    enum class Characters : std::uint8_t { number, text };

    Pseudonyms() = default;
    Pseudonyms(const Pseudonyms&) = delete;
    Pseudonyms& operator=(const Pseudonyms&) = delete;
    virtual ~Pseudonyms() = default;

    // Characters of a number or text. `before` holds what precedes them in it, as it is without pseudonyms;
    // the same of these characters is appended to it. `*` and `#` stay.
    virtual void replaceCharacters(std::span<std::uint8_t> octets, std::string& before, Characters kind) = 0;
    // Octets of which only the whole is known: a subaddress, user data.
    virtual void replaceOctets(std::span<std::uint8_t> octets) = 0;
};

enum class Direction : std::uint8_t { redact, restore };

// By a key. A digit becomes another digit, a letter another letter of its case, and so on. What it becomes
// depends on the key and, for a digit, on the digits before it in its run of digits; for any other character
// on all that is before it in the text. So a number has one pseudonym wherever it stands, whether it comes in
// one piece or digit by digit, and numbers with the same beginning have pseudonyms with the same beginning.
std::unique_ptr<Pseudonyms> makePseudonyms(const Key& key, Direction direction);

}  // namespace redaction

#endif
