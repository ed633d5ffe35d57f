// Traces made at random, in which numbers, names and user data stand wherever a frame can hold them.
#ifndef TESTS_REDACTION_PEOPLE_H
#define TESTS_REDACTION_PEOPLE_H

#include <random>
#include <string>
#include <vector>

#include "isdn/Variant.h"
#include "tests/redaction/redacted.h"

namespace redaction::test {

struct People {
    std::vector<Passed> frames;
    std::vector<std::string> secrets;  // numbers of six digits and more, names of four letters and more
};

// `structure` decides what the frames say, and `content` about which people: traces of one structure are
// alike but for what names a person.
People peopleOf(unsigned structure, unsigned content, isdn::Variant variant);

}  // namespace redaction::test

#endif
