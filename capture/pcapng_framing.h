// Divides a pcapng stream into its blocks.
#ifndef CAPTURE_PCAPNG_FRAMING_H
#define CAPTURE_PCAPNG_FRAMING_H

#include <string>
#include <string_view>

#include "capture/Source.h"
#include "capture/octets.h"

namespace capture::pcapng {

class Framing {
  public:
    enum class Next : std::uint8_t { block, pause, end, damaged };

    explicit Framing(Source& source) : source_(source) {}

    // Moves on to the next block. The header of a section sets the order of octets for the blocks that
    // follow. After `damaged` nothing more can be read.
    Next next();

    std::uint32_t type() const { return type_; }
    std::string_view body() const { return body_; }  // without both lengths; valid until the next call
    Order order() const { return order_; }
    const std::string& damage() const { return damage_; }  // what is wrong, in words

  private:
    Next readHeader(std::size_t& size);
    bool readOrder();
    Next damaged(std::string words);

    Source& source_;
    Order order_ = Order::little;
    std::uint32_t type_ = 0;
    std::string_view body_;
    std::size_t toConsume_ = 0;
    std::string damage_;
};

}  // namespace capture::pcapng

#endif
