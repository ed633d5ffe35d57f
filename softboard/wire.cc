#include "softboard/wire.h"

namespace softboard {

uint32_t BodyReader::number(size_t octets) {
    if (rest_.size() < octets) {
        rest_ = {};
        ok_ = false;
        return 0;
    }
    uint32_t value = 0;
    for (size_t i = 0; i < octets; ++i) {
        value |= static_cast<uint32_t>(rest_[i]) << (8 * i);
    }
    rest_ = rest_.subspan(octets);
    return value;
}

Address BodyReader::address() {
    Address value;
    value.instance = u16();
    value.board = u8();
    value.processor = u8();
    value.component = u8();
    value.node = u8();
    return value;
}

Octets BodyReader::rest() {
    Octets taken(rest_.begin(), rest_.end());
    rest_ = {};
    return taken;
}

BodyWriter& BodyWriter::number(uint32_t value, size_t octets) {
    for (size_t i = 0; i < octets; ++i) {
        body_.push_back(static_cast<uint8_t>(value >> (8 * i)));
    }
    return *this;
}

BodyWriter& BodyWriter::address(const Address& value) {
    return u16(value.instance).u8(value.board).u8(value.processor).u8(value.component).u8(value.node);
}

BodyWriter& BodyWriter::octets(std::span<const uint8_t> value) {
    body_.insert(body_.end(), value.begin(), value.end());
    return *this;
}

}  // namespace softboard
