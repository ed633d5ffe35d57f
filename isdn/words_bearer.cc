// Bearers, compatibility and channels in words.
#include <algorithm>
#include <bitset>
#include <optional>

#include "isdn/tables/compatibility.h"
#include "isdn/values.h"
#include "isdn/wording.h"

namespace isdn::wording {

namespace {

// The octets after a group, whose last octet has bit 8 set.
Octets behindGroup(Octets octets) {
    const auto last = std::ranges::find_if(octets, [](std::uint8_t octet) { return (octet & 0x80U) != 0; });
    return last == octets.end() ? Octets()
                                : octets.subspan(static_cast<std::size_t>(last - octets.begin()) + 1);
}

// The contents of octet 4 and the following octets of a bearer.
struct Transfer {
    explicit Transfer(Octets contents) : octet4(behindGroup(contents)) {
        if (octet4.empty())
            return;
        packet = bitsOf(octet4[0], 7, 6) == 2;
        rate = bitsOf(octet4[0], 5, 1);
        Octets rest = behindGroup(octet4);
        if (rate == multirate && !rest.empty()) {
            multiplier = bitsOf(rest[0], 7, 1);
            rest = rest.subspan(1);
        }
        if (!rest.empty() && bitsOf(rest[0], 7, 6) == 1)
            layer1 = bitsOf(rest[0], 5, 1);
    }

    static constexpr std::uint8_t multirate = 0x18;
    Octets octet4;
    bool packet = false;
    std::uint8_t rate = 0;
    std::uint8_t multiplier = 0;
    std::optional<std::uint8_t> layer1;  // its protocol
};

// "64k unrestricted", "6x64k unrestricted", "packet, unrestricted".
void addDigital(std::string& line, const Transfer& transfer, std::string_view what) {
    constexpr Name rates[] = {
        {0x10, "64k "}, {0x11, "2x64k "}, {0x13, "384k "}, {0x15, "1536k "}, {0x17, "1920k "}};
    if (transfer.packet) {
        line.append("packet, ");
    } else if (transfer.multiplier != 0) {
        add(line, transfer.multiplier);
        line.append("x64k ");
    } else {
        line.append(Names(rates)(transfer.rate));
    }
    line.append(what);
}

void addTransfer(std::string& line, const Element& element) {
    constexpr std::uint8_t speech = 0x00, unrestricted = 0x08, restricted = 0x09;
    if (element.contents.empty())
        return;
    const std::uint8_t octet3 = element.contents[0];
    if (bitsOf(octet3, 7, 6) != 0) {
        line.append("of coding standard ");
        addName(line, tables::codingStandards, bitsOf(octet3, 7, 6));
        return;
    }
    const std::uint8_t capability = octet3 & 0x1FU;
    const Transfer transfer(element.contents);
    if (capability == unrestricted)
        addDigital(line, transfer, "unrestricted");
    else if (capability == restricted)
        addDigital(line, transfer, "restricted");
    else
        addName(line, tables::transferCapabilities, capability);
    if (transfer.layer1 && capability != speech) {
        line.append(", ");
        addName(line, tables::layer1Protocols, *transfer.layer1);
    }
}

void bearerWords(std::string& line, const Element& element, const Context&) { addTransfer(line, element); }

void compatibilityWords(std::string& line, const Element& element, const Context&) {
    line.append("LLC ");
    addTransfer(line, element);
}

void highLayerWords(std::string& line, const Element& element, const Context&) {
    line.append("HLC");
    if (element.contents.size() < 2 || bitsOf(element.contents[0], 7, 6) != 0)
        return;
    line.push_back(' ');
    addName(line, tables::highLayers, element.contents[1] & 0x7FU);
}

// "1-5,7": channels in ranges.
void addChannels(std::string& line, const std::bitset<128>& channels) {
    const char* separator = "";
    std::size_t left = channels.count();
    for (unsigned first = 0; left > 0; ++first) {
        if (!channels[first])
            continue;
        unsigned last = first;
        while (last + 1 < channels.size() && channels[last + 1])
            ++last;
        left -= last + 1 - first;
        line.append(separator);
        separator = ",";
        add(line, first);
        if (last != first) {
            line.append(last == first + 1 ? "," : "-");
            add(line, last);
        }
        first = last;
    }
}

void channelWords(std::string& line, const Element& element, const Context&) {
    line.append("channel ");
    const auto channel = channelId(element);
    if (!channel) {
        line.append("missing");
        return;
    }
    if (channel->interface) {
        add(line, *channel->interface);
        line.push_back('/');
    }
    if (channel->dChannel)
        line.push_back('D');
    else if (channel->selection == ChannelId::Selection::none)
        line.append("none");
    else if (channel->selection == ChannelId::Selection::any)
        line.append("any");
    else if (!channel->primaryRate)
        line.append(channel->channels[1] ? "B1" : "B2");
    else if (channel->channels.none())
        line.append("missing");
    else
        addChannels(line, channel->channels);
    if (channel->selection == ChannelId::Selection::indicated || channel->dChannel)
        line.push_back(channel->exclusive ? '!' : '?');
}

// clang-format off
constexpr WordingRow rows[] = {
    {0, element::bearerCapability, bearerWords},
    {0, element::channelIdentification, channelWords},
    {0, element::lowLayerCompatibility, compatibilityWords},
    {0, element::highLayerCompatibility, highLayerWords},
};
// clang-format on

}  // namespace

std::span<const WordingRow> bearerWordings() { return rows; }

}  // namespace isdn::wording
