// What a pcapng capture has no field for travels in comments with a fixed prefix: the board's ticks, the
// second in which a log was written, and what its recorder said between frames.
#ifndef CAPTURE_NOTES_H
#define CAPTURE_NOTES_H

#include <string>
#include <string_view>

#include "capture/Item.h"

namespace capture {

inline constexpr std::string_view notePrefix = "lapdmon: ";

// "lapdmon: ticks 75 written 1795260333", as far as the frame has them; empty when it has neither.
std::string noteOfFrame(const Frame& frame);
// "lapdmon: Frames Lost: 17", "lapdmon: head net5", ... Of a frame: none. An oversized frame's note stands
// with its packet.
std::string noteOf(const Item& item);

// What stands in a note.
struct Note {
    enum class Kind : std::uint8_t {
        comment,    // none of ours
        frame,      // `ticks` and `written` of the packet's frame
        oversized,  // the packet is an oversized frame
        item        // `item`, with kind, count, text and the variant of a head
    };
    Kind kind = Kind::comment;
    std::optional<std::uint32_t> ticks;
    std::optional<std::int64_t> written;
    Item item;
    Variant variant = Variant::unknown;
};
// Views in the result are of `comment`.
Note noteIn(std::string_view comment);

// An interface's description: "KV9 D channel, variant net5"; without the variant when it is unknown.
std::string descriptionOf(Variant variant);
Variant variantIn(std::string_view description);

}  // namespace capture

#endif
