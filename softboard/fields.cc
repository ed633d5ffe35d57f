#include "softboard/fields.h"

#include <bit>
#include <cstddef>
#include <cstring>

namespace softboard {

static_assert(std::endian::native == std::endian::little, "elements are moved without changing their octets");

namespace {

uint32_t elementSize(uint32_t type) {
    switch (type) {
        case 0:
        case 4:
        case 10:
            return 1;
        case 1:
        case 5:
            return 2;
        default:
            return 4;
    }
}

// Sets `begin` to the place of a field of so many octets and advances the offset past it. Returns false when
// the field is not wholly inside a body of `size` octets; the offset advances all the same.
bool advance(size_t size, uint32_t& offset, uint32_t octets, uint32_t& begin) {
    begin = offset;
    offset += octets;
    return begin <= size && octets <= size - begin;
}

}  // namespace

uint32_t fieldOctets(uint32_t descriptor) {
    const uint32_t count = (descriptor >> 11 & 0xff) + 1;
    return count * elementSize(descriptor >> 19 & 0x1f);
}

bool getField(std::span<const uint8_t> body, uint32_t& offset, uint32_t descriptor, void* storage) {
    const uint32_t octets = fieldOctets(descriptor);
    uint32_t begin = 0;
    if (!advance(body.size(), offset, octets, begin)) {
        return false;
    }
    std::memcpy(storage, body.data() + begin, octets);
    return true;
}

bool putField(std::span<uint8_t> body, uint32_t& offset, uint32_t descriptor, const void* storage) {
    const uint32_t octets = fieldOctets(descriptor);
    uint32_t begin = 0;
    if (!advance(body.size(), offset, octets, begin)) {
        return false;
    }
    std::memcpy(body.data() + begin, storage, octets);
    return true;
}

}  // namespace softboard
