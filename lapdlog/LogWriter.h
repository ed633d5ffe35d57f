// Frames as the text of lapdmon's log.
#ifndef LAPDLOG_LOG_WRITER_H
#define LAPDLOG_LOG_WRITER_H

#include <memory>
#include <string>

#include "capture/Writer.h"

namespace lapdlog {

// Writes what lapdmon would have written: heads, frames, the recorder's lines between them. A frame is
// decoded for the variant of its interface, or else for `fallback`; local times are of this host's zone (TZ).
//
// What a log shows and an input does not have is made up: ticks from the time since the first such frame, the
// second of the time line from the frame's time. Frames that were never in a log get a head in front of the
// first. Items that a log has no text for (frames that are cut, lines that prove nothing, comments) are left
// out.
//
// Uses the decoder's words of the thread that calls it.
std::unique_ptr<capture::Writer> makeLogWriter(int file, const std::string& name,
                                               capture::Variant fallback = capture::Variant::net5);

}  // namespace lapdlog

#endif
