// Writes frames as the text of lapdmon's log.
#ifndef LAPDLOG_LOG_WRITER_H
#define LAPDLOG_LOG_WRITER_H

#include <memory>
#include <string>

#include "capture/Writer.h"

namespace lapdlog {

// Writes what lapdmon would have written: heads, frames, the recorder's lines between them. A frame is
// decoded for the variant of its interface, or else for `fallback`; local times are of this host's zone (TZ).
//
// If the input does not have what a log shows, the writer makes it up: ticks from the time since the first
// such frame, and the second of the time line from the frame's time. It writes a head before the first frame
// that was never in a log. It leaves out items that a log has no text for: frames that are cut, lines that
// prove nothing, comments.
//
// Changes the decoder's variables (decoder/state.h) of the thread that calls it.
std::unique_ptr<capture::Writer> makeLogWriter(int file, const std::string& name,
                                               capture::Variant fallback = capture::Variant::net5);

}  // namespace lapdlog

#endif
