// Elements and messages in a few words, as they stand in one line of a list.
#ifndef ISDN_WORDS_H
#define ISDN_WORDS_H

#include <cstdint>
#include <string>

#include "isdn/Layer2.h"
#include "isdn/Layer3.h"
#include "isdn/Variant.h"

namespace isdn {

// Which side of the link has sent a message. It decides whose "user" a location means.
enum class Sender : std::uint8_t { unknown, user, network };

// Each function appends to `line`, without a blank in front or behind. Texts of a frame are appended as they
// are coded, control characters included: whoever prints them makes them harmless.

// An element: "channel 30!", "cause 17 user busy, remote user", "calling 123 national/ISDN restricted". An
// element that says nothing worth a place in a line appends nothing, one that no table knows its name and
// hex.
void appendWords(std::string& line, const Element& element, Variant variant, Sender sender = Sender::unknown);

// All elements of a message that matter, two blanks between them.
void appendWords(std::string& line, const Layer3& message, Variant variant, Sender sender = Sender::unknown);

// "identity assigned, Ri 4660, TEI 67".
void appendWords(std::string& line, const TeiMessage& message);

// "rejected control 0b0e, V(S) 3, V(R) 4, N(R) invalid".
void appendWords(std::string& line, const FrameReject& reject);

}  // namespace isdn

#endif
