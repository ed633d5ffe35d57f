// What a stream of frames consists of: the frames, and what the recorder says between them.
#ifndef CAPTURE_ITEM_H
#define CAPTURE_ITEM_H

#include <cstdint>
#include <optional>
#include <string_view>

#include "capture/Frame.h"

namespace capture {

struct Item {
    enum class Kind : std::uint8_t {
        frame,
        oversized,  // a frame of more than 257 octets, which a log names without its octets
        cut,        // a frame that the input ends in, or that was not captured whole; octets: those there are
        lost,       // the recorder could not write `count` frames ("Frames Lost")
        notQueued,  // the recorder had no room for one frame ("Enqueue Failed")
        notTaken,   // the recorder could not take an entry of its queue ("Get iemsg failed")
        dropped,    // a capture's writer says that it dropped `count` packets before this place
        run,        // a recorder started here; interface->variant is what it said of the trunk
        restart,    // ticks fell without a head: the board restarted, or a head is missing
        replaced,   // a followed file was emptied or replaced by a new one
        mixed,      // lines of two traces stand between each other; see `text`
        unproved,   // `count` lines that no recorder can have written so; `text` says what is wrong
        damaged,    // the input cannot be read from here on, or a part of it was passed over; see `text`
        comment     // a comment of the capture's author, in `text`
    };

    Kind kind = Kind::frame;
    // Complete if the kind is frame. For other kinds it has what is known of direction, ticks and time, and
    // always interface and place. Only frame and cut have octets.
    Frame frame;
    std::uint64_t count = 0;
    // Words for a message, without line end. Control characters of the input are left in it. Valid until the
    // next item is asked for.
    std::string_view text;

    bool isFrame() const { return kind == Kind::frame; }
};

// "frame", "oversized", "frames-lost", ...: the names of kinds wherever programs read them. `kindNamed` is
// the reverse; nothing for any other name.
std::string_view kindName(Item::Kind kind);
std::optional<Item::Kind> kindNamed(std::string_view name);

}  // namespace capture

#endif
