// An item of the input as the commands see it, with its number, its headers, and what it means for its link.
#ifndef READER_SEEN_H
#define READER_SEEN_H

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "calls/Link.h"
#include "capture/Item.h"
#include "isdn/Layer2.h"
#include "isdn/Layer3.h"
#include "isdn/Variant.h"
#include "reader/TimeText.h"

namespace reader {

// Views point into the item, which must outlive this.
struct Seen {
    const capture::Item* item = nullptr;
    // When the item passed. For an input that has only ticks, seconds since its first frame.
    Instant when;
    std::int64_t at = 0;  // nanoseconds on a clock that follows the ticks and never goes back, for durations
    std::int64_t sinceFirst = 0;  // nanoseconds of that clock since the first frame of the run
    bool timeGoesBack = false;    // `when` is earlier than that of the frame before on the same D channel
    // numbers frames, and items that stand for one, from 1 over all inputs of a run
    std::uint64_t number = 0;
    isdn::Variant variant = isdn::Variant::net5;
    isdn::Layer2 link;
    isdn::Layer3 message;  // read only if hasMessage
    bool hasMessage = false;
    capture::Role role = capture::Role::unknown;  // of our side
    std::optional<bool> command;  // whether the frame is a command; empty while that is not known
    calls::Marks marks;           // what the frame means for its link
    // A poll with its answer, or such an answer, that only shows that the link is alive.
    bool keepAlive = false;

    bool isFrame() const { return item->isFrame(); }
    const capture::Frame& frame() const { return item->frame; }
};

// The side that sent the frame: "U>N", "N>U", or "?>?" while the role is unknown.
std::string_view direction(const Seen& seen);

// A mark that a frame may have.
struct MarkRow {
    std::string_view word;
    bool (*holds)(const Seen& seen);
};
std::span<const MarkRow> markRows();

// Appends the marks in words: "retransmitted, link up". Most frames have none.
void appendMarks(std::string& to, const Seen& seen);

}  // namespace reader

#endif
