// Makes writers of the forms of captures. Each writes to an open descriptor, which the caller owns; `name` is
// for messages. A writer leaves out items that its form has no place for.
#ifndef CAPTURE_WRITERS_H
#define CAPTURE_WRITERS_H

#include <memory>
#include <string>

#include "capture/Writer.h"

namespace capture {

// Writes pcapng: one section, and in it one interface for each D channel. An interface has link type 177, the
// name of the channel, the variant in its description, and times in nanoseconds. Packets have direction and
// drop counts. Board ticks, the second in which a log was written, and all items that are no frames are
// written as comments (notes.h) of the packet that follows, or of the interface's statistics at the end. A
// role that is not known is written as user.
std::unique_ptr<Writer> makePcapngWriter(int file, const std::string& name);

// Writes pcap: link type 177, times in nanoseconds, only frames.
std::unique_ptr<Writer> makePcapWriter(int file, const std::string& name);

// Writes hex lines, one a frame: "RX 2026-11-21T11:25:33.300000000Z 020101a5". Other items are comments ("#
// lapdmon: ...").
std::unique_ptr<Writer> makeHexWriter(int file, const std::string& name);

}  // namespace capture

#endif
