// Stories about channels, and about many calls. Our side is the user.
#include "calls/FindingKinds.h"
#include "tests/calls/CallStories.h"
#include "tests/calls/scenarios.h"

namespace calls::test {

namespace {

void restart(CallScript& s, std::int64_t at, std::uint8_t number) {
    s.at(at).us(m::restart, 0, false, {channel(number), restartIndicator(0)});
    s.at(at + 20).peer(m::restartAcknowledge, 0, true, {channel(number), restartIndicator(0)});
}

const Bytes outOfService{0x01, 0x01, 0xC2};

// SETUPs for one channel cross; the other side's one goes on. Ours is refused, or goes on as well.
std::string glare(bool bothGoOn) {
    CallScript s = begun();
    s.at(1000).crossing();
    s.us(m::setup, 2, false, {bearerSpeech(), channel(5)});
    s.peer(m::setup, 2, false, {bearerSpeech(), channel(5)});
    s.at(1020).us(m::callProceeding, 2, true, {channel(5)});
    if (bothGoOn)
        s.at(1030).peer(m::callProceeding, 2, true, {channel(5)});
    else
        s.at(1030).peer(m::releaseComplete, 2, true, {cause(44)});
    return found(s, 1);
}

constexpr Scenario all[] = {
    {&findings::restartUnacknowledged,
     [](bool faulty) {
         CallScript s = begun();
         for (int i = 0; i < 2; ++i) {
             s.at(1000 + i * 120000).us(m::restart, 0, false, {channel(5), restartIndicator(0)});
             s.acknowledge(Side::peer);
         }
         if (!faulty)
             s.at(200000).peer(m::restartAcknowledge, 0, true, {channel(5), restartIndicator(0)});
         return found(s, 121);
     }},
    {&findings::restartStorm,
     [](bool faulty) {
         CallScript s = begun();
         for (int i = 0; i < 4; ++i)
             restart(s, 1000 + i * 60000, static_cast<std::uint8_t>(faulty ? 5 : i + 1));
         return found(s);
     }},
    {&findings::restartPartly,
     [](bool faulty) {
         CallScript s = begun();
         const Bytes two{0x18, 0x04, 0xA9, 0x83, 0x05, 0x86};  // channels 5 and 6
         s.at(1000).us(m::restart, 0, false, {two, restartIndicator(0)});
         s.peer(m::restartAcknowledge, 0, true, {faulty ? channel(5) : two, restartIndicator(0)});
         return found(s);
     }},
    {&findings::serviceUnacknowledged,
     [](bool faulty) {
         CallScript s = begun();
         if (faulty) {  // a side that never acknowledges has no such habit
             s.at(500).maintenance(Side::us, m::service, false, {outOfService, channel(3)});
             s.maintenance(Side::peer, m::serviceAcknowledge, true, {outOfService, channel(3)});
         }
         for (int i = 0; i < 2; ++i)
             s.at(1000 + i * 60000).maintenance(Side::us, m::service, false, {outOfService, channel(4)});
         s.acknowledge(Side::peer);
         return found(s, 70);
     }},
    {&findings::serviceChannelSeized,
     [](bool faulty) {
         CallScript s = begun();
         s.at(500).maintenance(Side::peer, m::service, false, {outOfService, channel(7)});
         s.maintenance(Side::us, m::serviceAcknowledge, true, {outOfService, channel(7)});
         talk(s, 1000, 2, faulty ? 7 : 8);
         return found(s);
     }},
    {&findings::channelChanged,
     [](bool faulty) {
         CallScript s = begun();
         s.at(1000).us(m::setup, 2, false, {bearerSpeech(), channel(30, faulty)});
         s.peer(m::callProceeding, 2, true, {channel(29)});
         return found(s);
     }},
    {&findings::doubleSeizure,
     [](bool faulty) {
         CallScript s = begun();
         talk(s, 1000, 2, 30);
         if (!faulty)
             clear(s, 3000, 2);
         talk(s, 5000, 3, 30);
         return found(s, 1);
     }},
    {&findings::glare,
     [](bool faulty) {
         if (faulty)
             return glare(false);
         CallScript s = begun();  // the other side has seen our SETUP
         s.at(1000).us(m::setup, 2, false, {bearerSpeech(), channel(5)});
         s.at(1010).peer(m::setup, 2, false, {bearerSpeech(), channel(5)});
         s.at(1020).us(m::releaseComplete, 2, true, {cause(44)});
         return found(s, 1);
     }},
    {&findings::glarePersists, [](bool faulty) { return glare(faulty); }},
    {&findings::glareProne,
     [](bool faulty) {
         CallScript s = begun();
         for (std::uint16_t i = 0; i < 25; ++i) {
             const auto upwards = static_cast<std::uint8_t>(1 + i),
                        downwards = static_cast<std::uint8_t>(31 - i);
             s.at(1000 + i * 1000).us(m::setup, i + 2, false, {bearerSpeech(), channel(upwards)});
             s.peer(m::releaseComplete, i + 2, true, {cause(17)});
             s.peer(m::setup, i + 2, false, {bearerSpeech(), channel(faulty ? upwards : downwards)});
             s.us(m::releaseComplete, i + 2, true, {cause(17)});
         }
         return found(s);
     }},
    {&findings::stuckChannel,
     [](bool faulty) {
         CallScript s = begun();
         talk(s, 1000, 2, 30);
         refused(s, 5000, 2, 17);  // its reference is taken
         if (!faulty)
             restart(s, 9000, 30);
         return found(s);
     }},
    {&findings::channelRefused,
     [](bool faulty) {
         CallScript s = begun();
         talk(s, 1000, 2, 30);
         clear(s, 2000, 2);
         s.at(5000).us(m::setup, 3, false, {bearerSpeech(), channel(faulty ? 30 : 29)});
         s.peer(m::releaseComplete, 3, true, {cause(44)});
         return found(s);
     }},
    {&findings::massClear,
     [](bool faulty) {
         CallScript s = begun();
         for (std::uint16_t i = 2; i <= (faulty ? 4 : 3); ++i)
             talk(s, i * 1000, i, static_cast<std::uint8_t>(i));
         s.at(9000).raw(Side::peer, true, {0x53}).raw(Side::us, false, {0x73});  // DISC, UA
         s.at(200000).linkUp();
         return found(s, 200);
     }},
    {&findings::interfaceMismatch,
     [](bool faulty) {
         const auto onInterface = [](std::uint8_t interface) {
             return Bytes{0x18, 0x04, 0xE9, static_cast<std::uint8_t>(0x80 | interface), 0x83, 0x85};
         };
         CallScript s = begun();
         s.at(1000).us(m::setup, 2, false, {bearerSpeech(), onInterface(0)});
         s.peer(m::callProceeding, 2, true, {onInterface(faulty ? 1 : 0)});
         return found(s);
     }},
    {&findings::sameDuration,
     [](bool faulty) {
         CallScript s = begun();
         for (std::uint16_t i = 0; i < 5; ++i) {
             const std::int64_t at = 1000 + std::int64_t{i} * 4000000;
             talk(s, at, i + 2, 1);
             clear(s, at + 1800000 + (faulty ? 0 : i * 2000), i + 2);
         }
         return found(s);
     }},
    {&findings::causeBurst,
     [](bool faulty) {
         CallScript s = begun();
         for (std::uint16_t i = 0; i < 5; ++i)
             refused(s, 1000 + i * 5000, i + 2, faulty ? 34 : 17, "003312");
         return found(s);
     }},
    {&findings::changeover,
     [](bool faulty) {
         CallScript s;
         talk(s.on("A"), 0, 1, 1);
         clear(s.on(faulty ? "B" : "A"), 5000, 1);
         Options options;
         options.groups = {{"A", "B"}};
         return found(s, 0, options);
     }},
};

}  // namespace

std::span<const Scenario> channelScenarios() { return all; }

}  // namespace calls::test
