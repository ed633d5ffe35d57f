// Channels by number and by name. Internal to calls/.
#ifndef CALLS_CHANNELKEYS_H
#define CALLS_CHANNELKEYS_H

#include <bitset>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "calls/Maintenance.h"

namespace calls {

// The channels of an interface that are set, in order.
std::vector<ChannelKey> keysOf(const std::optional<std::uint32_t>& interface,
                               const std::bitset<128>& channels);
// "7", "2/8", one for each.
std::vector<std::string> namesOf(const std::vector<ChannelKey>& channels);

}  // namespace calls

#endif
