// Moves one field of a body, as nvMsgVarFieldGet and nvMsgVarFieldPut do for each of their descriptors.
#ifndef SOFTBOARD_FIELDS_H
#define SOFTBOARD_FIELDS_H

#include <cstdint>
#include <span>

namespace softboard {

// The size in octets of the field that a descriptor describes. Bits 11 to 18 are the number of elements less
// one, bits 19 to 23 the element type.
uint32_t fieldOctets(uint32_t descriptor);

// getField copies a field from the body at `offset` to the caller's storage, putField the other way. The
// offset advances past the field in any case. If the field is not wholly inside the body, nothing is copied
// and the result is false.
bool getField(std::span<const uint8_t> body, uint32_t& offset, uint32_t descriptor, void* storage);
bool putField(std::span<uint8_t> body, uint32_t& offset, uint32_t descriptor, const void* storage);

}  // namespace softboard

#endif
