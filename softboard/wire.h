// Message bodies: little-endian fields, packed, in order.
#ifndef SOFTBOARD_WIRE_H
#define SOFTBOARD_WIRE_H

#include <cstdint>
#include <span>

#include "softboard/message.h"

namespace softboard {

// Takes fields off the front of a body. A field that is not there whole reads as 0 and leaves ok() false.
class BodyReader {
  public:
    explicit BodyReader(std::span<const uint8_t> body) : rest_(body) {}

    uint8_t u8() { return static_cast<uint8_t>(number(1)); }
    uint16_t u16() { return static_cast<uint16_t>(number(2)); }
    uint32_t u32() { return number(4); }
    Address address();
    Octets rest();

    bool ok() const { return ok_; }
    size_t left() const { return rest_.size(); }

  private:
    uint32_t number(size_t octets);

    std::span<const uint8_t> rest_;
    bool ok_ = true;
};

class BodyWriter {
  public:
    BodyWriter& u8(uint8_t value) { return number(value, 1); }
    BodyWriter& u16(uint16_t value) { return number(value, 2); }
    BodyWriter& u32(uint32_t value) { return number(value, 4); }
    BodyWriter& address(const Address& value);
    BodyWriter& octets(std::span<const uint8_t> value);

    const Octets& body() const { return body_; }
    Octets take() { return std::move(body_); }

  private:
    BodyWriter& number(uint32_t value, size_t octets);

    Octets body_;
};

}  // namespace softboard

#endif
