// The key that pseudonyms are made with, and its file.
#ifndef REDACTION_KEY_H
#define REDACTION_KEY_H

#include <array>
#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>

namespace redaction {

// A key file that cannot be read or made, or that others may read. what() names the file and the reason.
class KeyError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// How pseudonyms are made. It goes with the key, so that one key always gives the same pseudonyms.
struct Manner {
    static constexpr unsigned mostKept = 9;

    unsigned keepPrefix = 0;  // so many digits at the beginning of each number stay
    bool blankShort = false;  // numbers of fewer than six digits are blanked

    bool operator==(const Manner&) const = default;
};

struct Key {
    std::array<std::uint8_t, 32> secret{};
    Manner manner;
};

// From the system's source of random numbers. Throws KeyError if that fails.
Key randomKey(const Manner& manner);

// Nothing if there is no such file. Throws KeyError for a file that holds no key, or that anybody but its
// owner may read or write.
std::optional<Key> readKey(const std::string& path);

// Makes the file, with mode 0600. Throws KeyError, also if it exists.
void writeKey(const std::string& path, const Key& key);

}  // namespace redaction

#endif
