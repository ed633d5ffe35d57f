// Messages as text, for the journal.
#ifndef SOFTBOARD_MESSAGE_TEXT_H
#define SOFTBOARD_MESSAGE_TEXT_H

#include <cstdint>
#include <string>

#include "softboard/message.h"

namespace softboard {

// "SetParm"; "?" for a type that has no name here, "Wake" for the message without type or body with which a
// host wakes its own reader.
std::string messageName(const Message& message);

// "{Parm 10 Val 1}". What a body holds beyond its known fields follows as "+" and octets in hexadecimal; a
// field that is missing ends the text with "...". An empty body is "{}".
std::string bodyText(const Message& message);

}  // namespace softboard

#endif
