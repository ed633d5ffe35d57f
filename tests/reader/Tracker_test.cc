#include "reader/Tracker.h"

#include <gtest/gtest.h>

namespace reader {
namespace {

constexpr std::int64_t second = 1'000'000'000;

capture::Item frameOf(const capture::Interface& interface, std::span<const std::uint8_t> octets,
                      std::int64_t time) {
    capture::Item item;
    item.frame.octets = octets;
    item.frame.transmitted = true;
    item.frame.clock = capture::Clock::absolute;
    item.frame.time = time;
    item.frame.interface = &interface;
    return item;
}

TEST(Tracker, TellsDChannelsApartByNameThoughTheyStandAtOneAddress) {
    const std::uint8_t sabme[] = {0x00, 0x01, 0x7f};
    Tracker tracker{InputOptions()};
    capture::Interface interface { "first" };
    EXPECT_FALSE(tracker.see(frameOf(interface, sabme, 9 * second)).timeGoesBack);
    // What another reader offers may stand where that of the reader before it stood.
    interface.name = "second";
    EXPECT_FALSE(tracker.see(frameOf(interface, sabme, 5 * second)).timeGoesBack);
    interface.name = "first";
    EXPECT_TRUE(tracker.see(frameOf(interface, sabme, 8 * second)).timeGoesBack);
}

}  // namespace
}  // namespace reader
