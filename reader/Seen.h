// An item of the input as the commands see it: with its number, its headers read, and what the link says.
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
    // When it passed. Of an input that has ticks alone, seconds since its first frame.
    Instant when;
    std::int64_t at = 0;          // nanoseconds on a clock that goes by ticks and never back: for durations
    std::int64_t sinceFirst = 0;  // nanoseconds of that clock since the first frame of the run
    bool timeGoesBack = false;    // `when` is earlier than that of the frame before it on its D channel
    std::uint64_t number = 0;  // frames and what stands for one are counted from 1 over all inputs of a run
    isdn::Variant variant = isdn::Variant::net5;
    isdn::Layer2 link;
    isdn::Layer3 message;  // read only if hasMessage
    bool hasMessage = false;
    capture::Role role = capture::Role::unknown;  // of our side
    std::optional<bool> command;                  // nothing while the role is unknown
    calls::Marks marks;                           // what the frame is to its link
    // A poll or an answer that only says that nothing has happened, and that has its counterpart.
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

// "retransmitted, link up": what the link says of the frame, in words; nothing of most frames.
void appendMarks(std::string& to, const Seen& seen);

}  // namespace reader

#endif
