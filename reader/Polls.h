// Finds polls and answers that only show that the link is alive, so that they can be hidden.
#ifndef READER_POLLS_H
#define READER_POLLS_H

#include <chrono>
#include <cstdint>
#include <optional>

#include "reader/Chunk.h"

namespace reader {

// A poll is a keep-alive only if its answer follows, so items wait in their chunk until that is known.
class Polls {
  public:
    // Looks at an item that was added to the chunk. If it answers a poll, marks both as keep-alive.
    void take(Chunk& chunk, Seen& seen);

    // The first item of a sealed chunk whose poll may still be answered; the chunk's size if there is none. A
    // poll is waited for no longer than T200, by the clock of the input and by that of this host.
    std::size_t open(Chunk& chunk, bool inputHasEnded);

  private:
    using HostClock = std::chrono::steady_clock;

    std::uint64_t waitingFor_ = 0;  // number of the poll for which items were held back last
    HostClock::time_point since_;
};

}  // namespace reader

#endif
