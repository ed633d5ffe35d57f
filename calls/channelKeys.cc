#include "calls/channelKeys.h"

namespace calls {

std::vector<ChannelKey> keysOf(const std::optional<std::uint32_t>& interface,
                               const std::bitset<128>& channels) {
    std::vector<ChannelKey> keys;
    for (std::uint32_t i = 0; i < channels.size(); ++i) {
        if (channels.test(i))
            keys.push_back({interface, i});
    }
    return keys;
}

std::vector<std::string> namesOf(const std::vector<ChannelKey>& channels) {
    std::vector<std::string> names;
    names.reserve(channels.size());
    for (const ChannelKey& each : channels)
        names.push_back(toString(each));
    return names;
}

std::vector<ChannelKey> channelsOf(const std::optional<isdn::ChannelId>& channel) {
    return channel ? keysOf(channel->interface, channel->channels) : std::vector<ChannelKey>();
}

std::string toString(const ChannelKey& channel) {
    return (channel.interface ? std::to_string(*channel.interface) + "/" : std::string()) +
           std::to_string(channel.number);
}

}  // namespace calls
