// Writers of the forms that captures have. Each writes to an open descriptor, which stays the caller's;
// `name` is for messages. Items that a form has no place for are left out.
#ifndef CAPTURE_WRITERS_H
#define CAPTURE_WRITERS_H

#include <memory>
#include <string>

#include "capture/Writer.h"

namespace capture {

// One section, an interface a D channel: link type 177, named after the channel, with the variant in its
// description, times in nanoseconds. Packets have direction and drop counts. Board ticks, the second in which
// a log was written and all items that are no frames travel in comments (notes.h), with the packet that
// follows, or at the end with the interface's statistics. A role that is not known is written as user.
std::unique_ptr<Writer> makePcapngWriter(int file, const std::string& name);

// Link type 177, times in nanoseconds. Frames alone.
std::unique_ptr<Writer> makePcapWriter(int file, const std::string& name);

// "RX 2026-11-21T11:25:33.300000000Z 020101a5", a line a frame; other items are comments ("# lapdmon: ...").
std::unique_ptr<Writer> makeHexWriter(int file, const std::string& name);

}  // namespace capture

#endif
