// A connection to a host: whole frames, each within a time.
#ifndef RELAY_STREAM_H
#define RELAY_STREAM_H

#include <chrono>
#include <cstdint>
#include <span>

#include "relay/descriptor.h"
#include "relay/frame.h"

namespace relay {

struct Patience {
    std::chrono::milliseconds frame{10000};  // for a host to send the rest of a frame, or its first one
    std::chrono::milliseconds write{10000};  // for a host to take a frame
};

// One thread reads while another writes; any may shut it down.
class Stream {
  public:
    Stream(Descriptor socket, Patience patience);

    // The next frame, whose first octet may take for ever. Throws Ended.
    Frame readFrame();
    // As readFrame, but all of it within the patience for a frame.
    Frame readFirstFrame();
    // Throws Ended.
    void write(std::span<const std::uint8_t> octets);

    // Reads end once what has arrived is read.
    void shutDownReading();
    // Reads and writes end at once.
    void shutDown();

  private:
    using Time = std::chrono::steady_clock::time_point;

    Frame readRest(Time deadline);
    void read(std::span<std::uint8_t> into, Time deadline);

    Descriptor socket_;
    Patience patience_;
};

}  // namespace relay

#endif
