// Channels, restarts and service (Q.931 4.5.13, 4.5.25; North American maintenance).
#ifndef ISDN_TABLES_CHANNEL_H
#define ISDN_TABLES_CHANNEL_H

#include "isdn/readers.h"
#include "isdn/tables/names.h"

namespace isdn::tables {

// clang-format off

inline constexpr Name identifiersPresent[] = {{0, "implicit"}, {1, "explicit"}};
inline constexpr Name interfaceTypes[] = {{0, "basic"}, {1, "other"}};
inline constexpr Name preferences[] = {{0, "preferred"}, {1, "exclusive"}};
inline constexpr Name dChannels[] = {{0, "no D channel"}, {1, "D channel"}};
inline constexpr Name basicSelections[] = {{0, "no channel"}, {1, "B1"}, {2, "B2"}, {3, "any channel"}};
inline constexpr Name otherSelections[] = {{0, "no channel"}, {1, "as indicated"}, {3, "any channel"}};
inline constexpr Name numberOrMap[] = {{0, "number"}, {1, "slot map"}};
inline constexpr Name channelTypes[] = {{3, "B channels"}, {6, "H0"}, {8, "H11"}, {9, "H12"}};

inline constexpr When ofBasicInterface = ifSeen("3", 6, 6, {0});
inline constexpr When ofOtherInterface = ifSeen("3", 6, 6, {1});
inline constexpr When channelIndicated = ofOtherInterface & ifSeen("3", 2, 1, {1});
// Some equipment names a channel although it says "any" or "none".
inline constexpr When channelNamedAllTheSame = optional & ofOtherInterface & ifSeen("3", 2, 1, {0, 2, 3});

inline constexpr Row channelIdRows[] = {
    {"3", bits(7, 7), "interface identifier", identifiersPresent},
    {"", bits(6, 6), "interface type", interfaceTypes},
    {"", bits(4, 4), "preference", preferences},
    {"", bits(3, 3), "D-channel indicator", dChannels},
    {"", bits(2, 1), "channel selection", basicSelections, ofBasicInterface},
    {"", bits(2, 1), "channel selection", otherSelections, ofOtherInterface},
    {"3.1", repeated(bits(7, 1)), "interface", {}, ifSeen("3", 7, 7, {1})},
    {"3.2", bits(7, 6), "coding standard", codingStandards, channelIndicated},
    {"", bits(5, 5), "number or map", numberOrMap},
    {"", bits(4, 1), "channel type", channelTypes},
    {"3.2", bits(7, 6), "coding standard", codingStandards, channelNamedAllTheSame},
    {"", bits(5, 5), "number or map", numberOrMap},
    {"", bits(4, 1), "channel type", channelTypes},
    {"3.3", repeated(bits(7, 1)), "channel number", {}, ifSeen("3.2", 5, 5, {0})},
    {"3.3", rest(readSlotMap), "slot map", {}, ifSeen("3.2", 5, 5, {1})},
};

// Like channel identification, but the interface is present when bit 7 is clear, and there is no preference.
inline constexpr Name identifiersAbsent[] = {{0, "explicit"}, {1, "implicit"}};
inline constexpr Row blockingChannelRows[] = {
    {"3", bits(7, 7), "interface identifier", identifiersAbsent},
    {"", bits(6, 6), "interface type", interfaceTypes},
    {"", bits(2, 1), "channel selection", otherSelections},
    {"3.1", repeated(bits(7, 1)), "interface", {}, optional & ifSeen("3", 7, 7, {0})},
    {"3.2", bits(7, 6), "coding standard", codingStandards, optional},
    {"", bits(5, 5), "number or map", numberOrMap},
    {"", bits(4, 1), "channel type", channelTypes},
    {"3.3", rest(), "slot map", {}, optional},
};

inline constexpr Name restartClasses[] = {
    {0, "the channels that are named"},
    {6, "one interface"},
    {7, "all interfaces"},
};
inline constexpr Row restartRows[] = {{"3", bits(3, 1), "class", restartClasses}};

inline constexpr Name serviceStates[] = {{0, "in service"}, {1, "maintenance"}, {2, "out of service"}};
inline constexpr Name subjects[] = {{1, "channel"}};
inline constexpr Row changeStatusRows[] = {
    {"3", bits(7, 7), "preference", subjects},
    {"", bits(3, 1), "new status", serviceStates},
};

inline constexpr Variants withChangeStatus = northAmerica | only(Variant::net5);

inline constexpr ElementTable channelTables[] = {
    {0, element::channelIdentification, "CHANNEL IDENTIFICATION", "Q.931 4.5.13", channelIdRows},
    {0, 0x03, "BLOCKING CHANNEL IDENTIFICATION", "national", blockingChannelRows},
    {0, element::restartIndicator, "RESTART INDICATOR", "Q.931 4.5.25", restartRows},
    {0, element::changeStatus, "CHANGE STATUS", "national (SERVICE)", changeStatusRows, withChangeStatus},
};

// Elements of SERVICE and SERVICE ACKNOWLEDGE alone, on every variant. Switches send them in either codeset.
inline constexpr ElementTable serviceMessageTables[] = {
    {0, element::changeStatus, "CHANGE STATUS", "national (SERVICE)", changeStatusRows},
    {6, element::changeStatus, "CHANGE STATUS", "national (SERVICE)", changeStatusRows},
};

// clang-format on

}  // namespace isdn::tables

#endif
