// Which octets of a frame name a person, and what is to become of them.
#ifndef REDACTION_PLAN_H
#define REDACTION_PLAN_H

#include <cstddef>
#include <cstdint>
#include <vector>

#include "isdn/Variant.h"
#include "isdn/octets.h"

namespace redaction {

enum class Treatment : std::uint8_t {
    blank,    // nobody can say what they hold
    number,   // a party's number
    dialled,  // the called number, or a piece of it, as the caller dials it
    text,     // a name, or what a terminal shows
    octets,   // user data and the like
};

struct Part {
    std::size_t at = 0;  // counted from the first octet of the frame, or of the message
    std::size_t size = 0;
    Treatment treatment = Treatment::blank;
    // Of octets that are blanked: the bits that stay, since they say how the element goes on, and those that
    // are set besides.
    std::uint8_t keptBits = 0;
    std::uint8_t setBits = 0;

    bool operator==(const Part&) const = default;
};

// Parts in their order, none of them empty. Octets of no part stay. The plan follows from identifiers,
// lengths and codes, never from what the parts hold: a redacted frame has the plan of the original.
using Plan = std::vector<Part>;

// Of a frame. The piece of a message that a SEGMENT carries is blank in it.
Plan planOfFrame(isdn::Octets frame, isdn::Variant variant);

// Of a message, which may have been put together from segments.
Plan planOfMessage(isdn::Octets message, isdn::Variant variant);

}  // namespace redaction

#endif
