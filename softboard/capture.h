// Recorded D-channel frames from a capture file.
#ifndef SOFTBOARD_CAPTURE_H
#define SOFTBOARD_CAPTURE_H

#include <string>

#include "softboard/scenario.h"

namespace softboard {

// Reads a pcap or pcapng file of link type 177 (LAPD with a 16-octet pseudo-header, which tells the
// direction) or 203 (LAPD alone, where capture::Directions finds it out unless the file says it). Throws
// BadInput, which names the file, the frame and the reason.
Frames readCapture(const std::string& path);

}  // namespace softboard

#endif
