// Reads and writes message bodies: little-endian fields, packed, in order.
#ifndef SOFTBOARD_WIRE_H
#define SOFTBOARD_WIRE_H

#include <cstdint>
#include <span>

#include "softboard/message.h"

namespace softboard {

// Reads the fields of a body from front to back. If the body ends within a field, the field is 0, and ok() is
// false from then on. The body must outlive the reader.
class BodyReader {
  public:
    explicit BodyReader(std::span<const uint8_t> body) : rest_(body) {}

    uint8_t u8() { return static_cast<uint8_t>(number(1)); }
    uint16_t u16() { return static_cast<uint16_t>(number(2)); }
    uint32_t u32() { return number(4); }
    Address address();
    Octets rest();  // all that has not been read

    bool ok() const { return ok_; }
    size_t left() const { return rest_.size(); }  // octets

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
