#include "calls/causes.h"

#include <algorithm>
#include <array>

namespace calls {

namespace {

constexpr std::uint8_t ituT = 0;

// Causes that are about this interface, whichever side sends them and whatever location they name.
bool isOfThisInterface(std::uint8_t value) {
    constexpr std::array<std::uint8_t, 6> single{6, 30, 44, 81, 82, 95};
    return std::find(single.begin(), single.end(), value) != single.end() || (value >= 96 && value <= 102);
}

Made ofNetwork(std::uint8_t location) {
    switch (location) {
        case 0:
        case 5:
            return Made::farUser;
        case 2:
            return Made::thisExchange;
        case 3:
        case 4:
        case 7:
            return Made::beyond;
        case 10:
            return Made::interworking;
        default:
            return Made::unclear;
    }
}

struct Row {
    std::uint8_t value;
    Outcome outcome;
};
constexpr std::array rows{
    Row{1, Outcome::number},        Row{2, Outcome::number},        Row{3, Outcome::number},
    Row{17, Outcome::busy},         Row{18, Outcome::noAnswer},     Row{19, Outcome::noAnswer},
    Row{20, Outcome::noAnswer},     Row{21, Outcome::rejected},     Row{22, Outcome::number},
    Row{28, Outcome::number},       Row{34, Outcome::congestion},   Row{38, Outcome::congestion},
    Row{41, Outcome::congestion},   Row{42, Outcome::congestion},   Row{44, Outcome::congestion},
    Row{47, Outcome::congestion},   Row{57, Outcome::incompatible}, Row{58, Outcome::incompatible},
    Row{65, Outcome::incompatible}, Row{70, Outcome::incompatible}, Row{79, Outcome::incompatible},
    Row{88, Outcome::incompatible},
};

}  // namespace

Made madeBy(const CauseGiven& cause) {
    if (cause.codingStandard == ituT && isOfThisInterface(cause.value))
        return Made::here;
    switch (cause.role) {
        case capture::Role::network:
            return ofNetwork(cause.location);
        case capture::Role::user:
            return cause.location <= 1 ? Made::here : Made::behindUser;
        case capture::Role::unknown:
            break;
    }
    return Made::unknown;
}

std::string_view nameOf(Made made) {
    constexpr std::array<std::string_view, 8> names{
        "",         "here",         "this exchange",   "a network beyond",
        "far user", "interworking", "behind the user", "unclear"};
    return names[static_cast<std::size_t>(made)];
}

Outcome outcomeOf(const CauseGiven& cause) {
    if (cause.codingStandard != ituT)
        return Outcome::other;
    const auto* const row =
        std::find_if(rows.begin(), rows.end(), [&](const Row& each) { return each.value == cause.value; });
    if (row != rows.end())
        return row->outcome;
    return cause.value >= 81 && cause.value <= 111 ? Outcome::protocol : Outcome::other;
}

}  // namespace calls
