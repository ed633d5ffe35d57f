// Finds out which polls and answers say nothing but that nothing has happened, so that they can be hidden.
#ifndef READER_POLLS_H
#define READER_POLLS_H

#include <chrono>
#include <cstdint>
#include <optional>

#include "reader/Chunk.h"

namespace reader {

// A poll is a keep-alive only once its answer is there. Items wait for that in the chunk they are in.
class Polls {
  public:
    // Looks at an item that is about to be added to the chunk, and marks it and the poll that it answers.
    void take(Chunk& chunk, Seen& seen);

    // The first item of a sealed chunk whose poll may still be answered; the chunk's size if there is none. A
    // poll is waited for no longer than T200, by the clock of the input and by that of this host.
    std::size_t open(Chunk& chunk, bool inputHasEnded);

  private:
    using HostClock = std::chrono::steady_clock;

    std::uint64_t waitingFor_ = 0;  // number of the poll that items were held back for last
    HostClock::time_point since_;
};

}  // namespace reader

#endif
