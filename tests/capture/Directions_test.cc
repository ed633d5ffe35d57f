#include "capture/Directions.h"

#include <gtest/gtest.h>

#include <vector>

namespace capture {
namespace {

using Octets = std::vector<std::uint8_t>;

TEST(DirectionsTest, TheCommandResponseBitTellsWhoSent) {
    struct {
        const char* says;
        Octets frame;
        bool transmitted;
    } const cases[] = {
        {"SABME of the user", {0x00, 0x01, 0x7f}, true},
        {"UA of the network", {0x00, 0x01, 0x73}, false},
        {"SABME of the network", {0x02, 0x01, 0x7f}, false},
        {"UA of the user", {0x02, 0x01, 0x73}, true},
        {"DM of the network", {0x00, 0x01, 0x1f}, false},
        {"FRMR of the user", {0x02, 0x01, 0x97}, true},
        {"DISC of the user", {0x00, 0x01, 0x53}, true},
        {"I of the network", {0x02, 0x01, 0x00, 0x00, 0x08}, false},
        {"I of the user", {0x00, 0x01, 0x02, 0x00, 0x08}, true},
        {"the user acknowledges", {0x02, 0x01, 0x01, 0x02}, true},
        {"the network acknowledges", {0x00, 0x01, 0x01, 0x02}, false},
        {"the network polls", {0x02, 0x01, 0x01, 0x03}, false},
        {"the user answers", {0x02, 0x01, 0x01, 0x03}, true},
        {"the user polls", {0x00, 0x01, 0x01, 0x03}, true},
        {"the network answers", {0x00, 0x01, 0x01, 0x03}, false},
        {"the network polls TEI 67", {0x02, 0x87, 0x01, 0x01}, false},
        {"the network polls TEI 68", {0x02, 0x89, 0x01, 0x01}, false},
        {"TEI 67 answers", {0x02, 0x87, 0x01, 0x01}, true},
        {"one octet", {0x02}, false},
    };
    Directions directions;
    for (const auto& c : cases) {
        EXPECT_EQ(directions.isTransmitted(c.frame), c.transmitted) << c.says;
    }
}

}  // namespace
}  // namespace capture
