// A connection to a host, which carries whole frames. Each frame must pass within a time limit.
#ifndef RELAY_STREAM_H
#define RELAY_STREAM_H

#include <chrono>
#include <cstdint>
#include <span>

#include "relay/descriptor.h"
#include "relay/frame.h"

namespace relay {

struct Patience {
    std::chrono::milliseconds frame{10000};  // in which a host finishes a frame, or sends its first one
    std::chrono::milliseconds write{10000};  // in which a host accepts a frame
};

// One thread may read while another writes. Any thread may shut the connection down.
class Stream {
  public:
    Stream(Descriptor socket, Patience patience);

    // Waits for the next frame without limit, and once its first octet has come, for the rest within the
    // patience for a frame. Throws Ended when the time is over, the connection has ended or the frame is too
    // large.
    Frame readFrame();
    // The same, but the first octet must come within that time as well.
    Frame readFirstFrame();
    // Sends all octets. Throws Ended when the host does not accept them in time or the connection has ended.
    void write(std::span<const std::uint8_t> octets);

    // Receives nothing more. What has arrived can still be read; then reading throws.
    void shutDownReading();
    // Ends reading and writing at once.
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
