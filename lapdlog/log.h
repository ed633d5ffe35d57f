// Reads lapdmon's log.
#ifndef LAPDLOG_LOG_H
#define LAPDLOG_LOG_H

#include "capture/Form.h"

namespace lapdlog {

// Recognises a log by a head, the time lines of a frame, or a line that the recorder writes between frames.
// So a piece of a log, without a head, is recognised too, and so is a log with DOS line ends.
capture::Form::Match isLog(std::string_view beginning, bool isAll);

// Gives the frames that are proved. A frame is proved if its text, from the time lines to the end of the
// dump, is what the decoder writes for the dump's octets on a trunk of the log's variant. The variant is the
// one that was chosen (ReadOptions), or the one in the head, or, without a head, one that proves the frames;
// if several do, a comment item says so. All other text is reported in items: lines that prove nothing, a
// frame in which the log ends, lines of two traces in one file.
//
// Frames have their ticks, the second in which they were written, and an absolute time, good to a second
// (their differences to 4 ms; see BoardClock). Dates are local times of this host's zone (TZ).
//
// Where the log has DOS line ends, the carriage returns are left out, also in the texts of frames.
//
// The parser changes the decoder's variables (decoder/state.h) of the thread that calls it.
std::unique_ptr<capture::Parser> readLog(const capture::Context& context);

inline constexpr capture::Form logForm{"lapdmon's log", isLog, readLog};

}  // namespace lapdlog

#endif
