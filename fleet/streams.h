// Makes the streams of a fleet.
#ifndef FLEET_STREAMS_H
#define FLEET_STREAMS_H

#include <chrono>
#include <cstdint>
#include <string>
#include <vector>

#include "fleet/Nats.h"

namespace fleet {

// Frames at the centre, frames at a site, and messages that cannot be stored.
inline constexpr char centreStream[] = "LAPD";
inline constexpr char siteStream[] = "LAPD_SITE";
inline constexpr char deadStream[] = "LAPD_DEAD";

// A stream refuses a message for which it has no room; the sender must keep it. A stream removes messages
// that are older than `age`.
struct StreamRules {
    std::string name;
    std::vector<std::string> subjects;
    std::uint32_t replicas = 1;
    std::uint64_t mostOctets = 0;  // on each server's disk; 0: as much as the server allows
    std::chrono::hours age{7 * 24};
    std::chrono::milliseconds duplicates{120'000};  // how long the server remembers the ids of messages
    // The JetStream domains of sites. The stream LAPD_SITE of each is copied into this stream.
    std::vector<std::string> sites;
};

// Makes the stream, or sets the rules of the existing one. Throws NatsError.
void makeStream(NatsConnection& connection, const StreamRules& rules);

struct StreamFilling {
    std::uint64_t messages = 0;
    std::uint64_t octets = 0;
    std::uint64_t mostOctets = 0;  // 0: no limit of its own
};
// Asks the server how full the stream is. Throws NatsError.
StreamFilling fillingOf(NatsConnection& connection, const std::string& stream);

}  // namespace fleet

#endif
