// Messages as text, for the journal.
#ifndef SOFTBOARD_MESSAGE_TEXT_H
#define SOFTBOARD_MESSAGE_TEXT_H

#include <cstdint>
#include <string>

#include "softboard/message.h"

namespace softboard {

// "SetParm"; "?" for a type that has no name here.
std::string messageName(uint32_t type);

// "{Parm 10 Val 1}". What a body holds beyond its known fields follows as "+" and octets in hexadecimal; a
// field that is missing ends the text with "...".
std::string bodyText(const Message& message);

}  // namespace softboard

#endif
