// Comments with a fixed prefix carry what a pcapng capture has no field for: the board's ticks, the second in
// which a log was written, and what the recorder said between frames.
#ifndef CAPTURE_NOTES_H
#define CAPTURE_NOTES_H

#include <string>
#include <string_view>

#include "capture/Item.h"

namespace capture {

inline constexpr std::string_view notePrefix = "lapdmon: ";
// Begins a comment that says with which key a trace was redacted; the check of the key follows. Hex lines
// have it too.
inline constexpr std::string_view redactedPrefix = "lapdread: redacted with key ";

// "lapdmon: ticks 75 written 1795260333", as far as the frame has them; empty when it has neither.
std::string noteOfFrame(const Frame& frame);
// "lapdmon: Frames Lost: 17", "lapdmon: head net5", ...; empty for a frame. The note of an oversized frame
// belongs into the comment of its packet.
std::string noteOf(const Item& item);

// What a comment says.
struct Note {
    enum class Kind : std::uint8_t {
        comment,    // it is no note of ours
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
// Reads a comment. Views in the result point into `comment`.
Note noteIn(std::string_view comment);

// An interface's description: "KV9 D channel, variant net5"; without the variant when it is unknown.
std::string descriptionOf(Variant variant);
Variant variantIn(std::string_view description);

}  // namespace capture

#endif
