// An item of the input as the commands see it: with its number, its headers read, and what the link says.
#ifndef READER_SEEN_H
#define READER_SEEN_H

#include <cstdint>
#include <optional>
#include <string_view>

#include "capture/Item.h"
#include "isdn/Layer2.h"
#include "isdn/Layer3.h"
#include "isdn/Variant.h"
#include "reader/TimeText.h"

namespace reader {

// Views point into the item, which must outlive this.
struct Seen {
    const capture::Item* item = nullptr;
    std::int64_t sinceFirst = 0;  // nanoseconds since the first frame of the run
    std::uint64_t number = 0;  // frames and what stands for one are counted from 1 over all inputs of a run
    isdn::Variant variant = isdn::Variant::net5;
    isdn::Layer2 link;
    isdn::Layer3 message;  // read only if hasMessage
    bool hasMessage = false;
    capture::Role role = capture::Role::unknown;  // of our side
    std::optional<bool> command;                  // nothing while the role is unknown
    bool keepAlive = false;                       // a poll or its answer that says nothing new
    std::string_view marks;                       // "retransmitted", "link up"; between commas

    bool isFrame() const { return item->isFrame(); }
    const capture::Frame& frame() const { return item->frame; }
    Instant instant() const { return {item->frame.clock, item->frame.time}; }
};

isdn::Variant standardVariant(capture::Variant variant);

// The side that sent the frame: "U>N", "N>U", or "?>?" while the role is unknown.
std::string_view direction(const Seen& seen);

}  // namespace reader

#endif
