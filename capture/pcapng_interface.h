// An interface of a pcapng section, read from its description block.
#ifndef CAPTURE_PCAPNG_INTERFACE_H
#define CAPTURE_PCAPNG_INTERFACE_H

#include <optional>
#include <string>
#include <string_view>

#include "capture/Form.h"
#include "capture/link.h"
#include "capture/pcapng_blocks.h"

namespace capture::pcapng {

class DescribedInterface {
  public:
    static constexpr std::size_t fields = 8;  // octets in front of the options

    // Reads the body of a description block, which must have at least `fields` octets.
    DescribedInterface(std::string_view body, Order order);

    std::uint32_t linkType() const { return linkType_; }
    std::uint32_t snapLength() const { return snapLength_; }
    Clock clock() const { return clock_; }
    // Nanoseconds. A time that 64 bits cannot hold becomes the furthest time that they can.
    std::int64_t time(std::uint64_t units) const;
    // The interface of the frames: what the user has chosen, or else what the description says, or else
    // `unnamed`.
    Interface named(const Interface& unnamed, const ReadOptions& options) const;

    std::optional<Link> link;  // empty if the interface does not carry LAPD
    const Interface* interface = nullptr;
    std::uint64_t dropped = 0;  // dropped packets that the capture has reported so far

  private:
    void take(std::uint16_t code, std::string_view value, Order order);

    std::uint32_t linkType_;
    std::uint32_t snapLength_;
    Interface told_;
    Resolution resolution_;
    std::int64_t offset_ = 0;  // seconds
    std::size_t checkSequence_ = 0;
    Clock clock_ = Clock::absolute;
};

}  // namespace capture::pcapng

#endif
