// Finds SERVICE messages that only repeat what their side has said before. The two ends of North American
// trunks poll each other with them.
#ifndef CALLS_SERVICEPOLLS_H
#define CALLS_SERVICEPOLLS_H

#include <array>
#include <cstdint>
#include <map>
#include <optional>
#include <vector>

#include "calls/Link.h"
#include "calls/Stream.h"

namespace calls {

// One object serves one D channel. Memory is bounded.
class ServicePolls {
  public:
    // Takes an I frame with a message of maintenance that the receiver's layer 2 hands up, and sets
    // `keepAlive` and `answers` of its marks. A SERVICE is a poll if its side has said the same of the same
    // channel last; the SERVICE ACKNOWLEDGE answers it if it comes within `longest` nanoseconds.
    void take(const Sample& sample, std::int64_t longest, Marks& marks);

  private:
    struct Poll {
        std::uint64_t frame;
        std::int64_t at;
    };
    using Octets = std::vector<std::uint8_t>;

    static constexpr std::size_t mostChannels = 256;

    // By side: what it said last, by the octets of CHANNEL IDENTIFICATION.
    std::array<std::map<Octets, Octets>, 2> said_;
    std::array<std::optional<Poll>, 2> polls_;  // by side: the one that waits for its answer
};

}  // namespace calls

#endif
