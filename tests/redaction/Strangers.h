// Frames in which a number stands where no standard expects one, coded in one of several ways, and frames
// whose lengths are wrong.
#ifndef TESTS_REDACTION_STRANGERS_H
#define TESTS_REDACTION_STRANGERS_H

#include <cstddef>
#include <string>

#include "isdn/Variant.h"
#include "tests/redaction/redacted.h"

namespace redaction::test {

// How sixteen digits are put into octets.
enum class Coding { ia5, ia5WithParity, bcd, bcdSwapped, septets };

struct Stranger {
    std::string says;     // where the number stands, and what is wrong
    Bytes octets;         // of the frame
    Bytes number;         // as it stands in it
    std::size_t six = 0;  // so many octets of the number hold six digits
};

// A frame of the seed; another seed gives another one.
Stranger strangerOf(unsigned seed, isdn::Variant variant);

// The first six digits of the number that are still in the octets; empty if none are.
std::string sixDigitsIn(const Stranger& stranger, const Bytes& octets);

}  // namespace redaction::test

#endif
