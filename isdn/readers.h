// Functions that take apart contents which are no fields of bits: characters, diagnostics, subaddresses,
// maps, components. Each appends fields that cover all the contents.
#ifndef ISDN_READERS_H
#define ISDN_READERS_H

#include "isdn/Table.h"

namespace isdn {

Problem readCharacters(const Contents& contents, Fields& fields);
// a number of several octets, the most significant first
Problem readNumber(const Contents& contents, Fields& fields);
Problem readSubaddress(const Contents& contents, Fields& fields);   // Q.931 4.5.9
Problem readSlotMap(const Contents& contents, Fields& fields);      // Q.931 4.5.13, figures 4-20 and 4-21
Problem readDiagnostics(const Contents& contents, Fields& fields);  // Q.850 table 1
Problem readUserInformation(const Contents& contents, Fields& fields);

// DISPLAY. On North American trunks an octet with bit 8 set may come first, and then characters, or fields of
// tag, length and text, which readDisplayFields reads.
Problem readDisplay(const Contents& contents, Fields& fields);
Problem readDisplayFields(const Contents& contents, Fields& fields);

// FACILITY and EXTENDED FACILITY (Q.932 8.2).
Problem readFacility(const Contents& contents, Fields& fields);

// The name of a message type of call control, for fields that hold one.
std::string_view callControlMessageName(std::uint8_t type);

}  // namespace isdn

#endif
