// Compares two series of messages, those of two calls or of two traces.
#ifndef READER_COMPARISON_H
#define READER_COMPARISON_H

#include <cstddef>
#include <cstdint>
#include <span>
#include <stdexcept>
#include <string>
#include <vector>

#include "calls/Message.h"

namespace reader {

// What is compared only on demand, because two calls always differ in it.
struct CompareAlso {
    bool references = false;  // call reference and TEI
    bool channels = false;    // numbers of channels and interfaces
    bool times = false;       // the time since the first message, and DATE/TIME
};

// A message, with everything that is compared turned into text.
struct ComparedMessage {
    struct Part {
        std::string element;  // "CAUSE", "CAUSE (2)" for the second one; empty for the message's header
        std::string field;    // "cause value", "number (2)"
        std::string value;    // "17 user busy"
    };
    struct Whole {
        std::string element;
        std::string words;  // the whole element in a few words, or its octets
    };

    std::uint64_t frame = 0;
    std::int64_t since = 0;  // nanoseconds since the first message
    calls::Side from = calls::Side::us;
    capture::Role role = capture::Role::unknown;  // the role of the side that sent it
    std::string name;                             // "SETUP"
    std::vector<Part> parts;
    std::vector<Whole> elements;
};

// `first` is the time of the first message of the series.
ComparedMessage comparedMessage(const calls::Message& message, std::int64_t first, const CompareAlso& also);

struct Difference {
    enum class Kind : std::uint8_t { message, element, field, time };

    Kind kind = Kind::message;
    std::string message{};
    std::string direction{};               // "U>N", "TX" where the roles are not known
    std::uint64_t frameA = 0, frameB = 0;  // 0 if that side has no such message
    std::string element{}, field{};
    std::string a{}, b{};  // values; empty if that side does not have it
};

struct Comparison {
    std::vector<Difference> differences;
    std::size_t alike = 0, differ = 0, onlyA = 0, onlyB = 0;  // messages

    bool same() const { return differences.empty(); }
};

// Thrown if the series differ in too many messages to be aligned.
class TooDifferent : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// Messages that stand side by side; null: the other one has no counterpart.
struct ComparedPair {
    const ComparedMessage* a = nullptr;
    const ComparedMessage* b = nullptr;
};

// Aligns the messages so that as many as possible stand beside one of their kind and direction, and of these
// as many as possible beside an equal one. Directions are those of the roles if both series know them, else
// those of the recorders. Throws TooDifferent.
std::vector<ComparedPair> pairsOf(std::span<const ComparedMessage> a, std::span<const ComparedMessage> b);
// The differences between messages that are paired so, and those that have no counterpart.
Comparison compare(std::span<const ComparedMessage> a, std::span<const ComparedMessage> b,
                   const CompareAlso& also);

}  // namespace reader

#endif
