// Describes elements and messages in a few words, for one line of a list.
#ifndef ISDN_WORDS_H
#define ISDN_WORDS_H

#include <cstdint>
#include <string>

#include "isdn/Layer2.h"
#include "isdn/Layer3.h"
#include "isdn/Variant.h"

namespace isdn {

// Which side of the link has sent a message. It decides which user the location "user" of a cause means.
enum class Sender : std::uint8_t { unknown, user, network };

// Each function appends to `line`, without a blank before or after. Texts of a frame are appended as they are
// coded, control characters included; the code that prints the line must make them harmless.

// Describes an element: "channel 30!", "cause 17 user busy, remote user", "calling 123 national/ISDN
// restricted". Appends nothing for an element that is not worth a place in a line, and identifier and octets
// in hexadecimal for one that no table knows.
void appendWords(std::string& line, const Element& element, Variant variant, Sender sender = Sender::unknown);

// Describes all elements of a message that are worth a place, with two blanks between them.
void appendWords(std::string& line, const Layer3& message, Variant variant, Sender sender = Sender::unknown);

// "identity assigned, Ri 4660, TEI 67".
void appendWords(std::string& line, const TeiMessage& message);

// "rejected control 0b0e, V(S) 3, V(R) 4, N(R) invalid".
void appendWords(std::string& line, const FrameReject& reject);

}  // namespace isdn

#endif
