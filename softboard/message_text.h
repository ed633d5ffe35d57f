// Messages as text, in the form of the journal.
#ifndef SOFTBOARD_MESSAGE_TEXT_H
#define SOFTBOARD_MESSAGE_TEXT_H

#include <cstdint>
#include <string>

#include "softboard/message.h"

namespace softboard {

// The name of the message's type, for example "SetParm"; "?" for a type without a name in the table. A
// message of type 0 without a body is "Wake": a host sends it to its own queue to wake its reader thread.
std::string messageName(const Message& message);

// The fields of the body, for example "{Parm 10 Val 1}"; "{}" for an empty body. Octets after the known
// fields follow as "+" and hexadecimal digits. If the body ends before a field, the text ends with "...".
std::string bodyText(const Message& message);

}  // namespace softboard

#endif
