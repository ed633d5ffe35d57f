// The key from which pseudonyms are made, and its file.
#ifndef REDACTION_KEY_H
#define REDACTION_KEY_H

#include <array>
#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>

namespace redaction {

// Thrown for a key file that cannot be read or made, or that other users may read. what() names the file and
// the reason.
class KeyError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// How pseudonyms are made. It is stored with the key, so that one key always gives the same pseudonyms.
struct Manner {
    static constexpr unsigned mostKept = 9;

    unsigned keepPrefix = 0;  // how many digits at the beginning of each number are kept
    bool blankShort = false;  // whether numbers of fewer than six digits are blanked

    bool operator==(const Manner&) const = default;
};

struct Key {
    std::array<std::uint8_t, 32> secret{};
    Manner manner;
};

// Makes a key from the system's source of random numbers. Throws KeyError if that fails.
Key randomKey(const Manner& manner);

// Reads a key file; returns nothing if the file does not exist. Throws KeyError if the file holds no key, or
// if anybody but its owner may read or write it.
std::optional<Key> readKey(const std::string& path);

// Makes a key file with mode 0600. Throws KeyError if it cannot, or if the file exists.
void writeKey(const std::string& path, const Key& key);

}  // namespace redaction

#endif
