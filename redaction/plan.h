// Finds the octets of a frame that identify a person, and says how each must be treated.
#ifndef REDACTION_PLAN_H
#define REDACTION_PLAN_H

#include <cstddef>
#include <cstdint>
#include <vector>

#include "isdn/Variant.h"
#include "isdn/octets.h"

namespace redaction {

enum class Treatment : std::uint8_t {
    blank,    // it is not known what they hold, so they are blanked
    number,   // a party's number
    dialled,  // the called number, or a piece of it, which the caller may dial digit by digit
    text,     // a name, or what a terminal shows
    octets,   // user data and the like
};

struct Part {
    std::size_t at = 0;  // counted from the first octet of the frame, or of the message
    std::size_t size = 0;
    Treatment treatment = Treatment::blank;
    // For octets that are blanked: the bits that are kept because they say how the element goes on, and the
    // bits that are set.
    std::uint8_t keptBits = 0;
    std::uint8_t setBits = 0;

    bool operator==(const Part&) const = default;
};

// The parts in their order; none is empty. Octets outside the parts are kept: headers, and codes that a table
// of the standards knows and that are no longer than the standard allows. A redacted frame has the same plan
// as the original, so that it can be restored.
using Plan = std::vector<Part>;

// The plan of a frame. If the frame carries a SEGMENT, the plan blanks the piece of a message in it.
Plan planOfFrame(isdn::Octets frame, isdn::Variant variant);

// The plan of a message, which may have been put together from segments.
Plan planOfMessage(isdn::Octets message, isdn::Variant variant);

}  // namespace redaction

#endif
