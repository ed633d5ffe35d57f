// lapdmon's log as an input.
#ifndef LAPDLOG_LOG_H
#define LAPDLOG_LOG_H

#include "capture/Form.h"

namespace lapdlog {

// A log shows a head, a frame's time lines or a line that the recorder writes between frames. A piece of one,
// without head, is a log too; so is one whose line feeds have become DOS line ends.
capture::Form::Match isLog(std::string_view beginning, bool isAll);

// Gives the frames that are proved: whose text, between the time lines and the end of the dump, is what the
// decoder writes for the dump's octets on a trunk of the log's variant. The variant is the one that was
// chosen (ReadOptions), or the head's, or without a head one whose texts agree with the dumps; when several
// do, a comment says so. All other text is said: lines that prove nothing, a frame that the log ends in,
// lines of two traces in one file.
//
// Frames have their ticks, the second in which they were written, and an absolute time, good to a second
// (their differences to 4 ms; see BoardClock). Dates are local times of this host's zone (TZ).
//
// Of DOS line ends the carriage return is left out, in the texts of frames as well.
//
// The parser uses the decoder's words of the thread that calls it.
std::unique_ptr<capture::Parser> readLog(const capture::Context& context);

inline constexpr capture::Form logForm{"lapdmon's log", isLog, readLog};

}  // namespace lapdlog

#endif
