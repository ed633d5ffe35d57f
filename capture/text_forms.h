// Reads frames from lines of text.
#ifndef CAPTURE_TEXT_FORMS_H
#define CAPTURE_TEXT_FORMS_H

#include "capture/Form.h"

namespace capture {

// Hex lines have one frame a line: direction, time if it is known, and octets, with blanks between them.
//
//     RX 2026-11-21T11:25:33.300Z 020101a5       1 1095 00019009        TX 02 01 7f
//
// The direction is TX or 1, RX or 0. The time is ISO 8601, of this host's zone when it names none; seconds
// ("12.345") or hours, minutes and seconds ("11:25:33") of a clock of the recorder's own; or a whole number
// of the board's ticks, which counts as one when one group of octets follows. Octets are pairs of hexadecimal
// digits, with or without blanks between pairs. "#" begins a comment.
Form::Match isHexLines(std::string_view beginning, bool isAll);
std::unique_ptr<Parser> readHexLines(const Context& context);
inline constexpr Form hexForm{"hex lines", isHexLines, readHexLines};

// Bracketed dumps stand in the debug logs of telephone exchanges made of software: octets in brackets after
// ">" (sent) or "<" (received). They may go on in the following lines. Other text is ignored. A time at the
// beginning of the line, with or without brackets, is the frame's: "2026-11-21 11:25:33.300", or "Nov 21
// 11:25:33", which counts from the first time of that kind.
//
//     [2026-11-21 11:25:33] > [ 00 01 7f ]
Form::Match isDumps(std::string_view beginning, bool isAll);
std::unique_ptr<Parser> readDumps(const Context& context);
inline constexpr Form dumpForm{"bracketed dumps", isDumps, readDumps};

}  // namespace capture

#endif
