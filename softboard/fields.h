// The run of body fields that nvMsgVarFieldGet and nvMsgVarFieldPut move.
#ifndef SOFTBOARD_FIELDS_H
#define SOFTBOARD_FIELDS_H

#include <cstdint>
#include <span>

namespace softboard {

// Octets that a descriptor stands for: bits 11 to 18 element count less one, bits 19 to 23 element type.
uint32_t fieldOctets(uint32_t descriptor);

// One field between the body at offset and the caller's storage. The offset advances past the field even when
// it does not lie whole inside the body; then nothing is moved and the result is false.
bool getField(std::span<const uint8_t> body, uint32_t& offset, uint32_t descriptor, void* storage);
bool putField(std::span<uint8_t> body, uint32_t& offset, uint32_t descriptor, const void* storage);

}  // namespace softboard

#endif
