// Stories about calls and channels. Our side is the user.
#include "calls/Analysis.h"
#include "calls/FindingKinds.h"
#include "tests/calls/CallScript.h"
#include "tests/calls/scenarios.h"

namespace calls::test {

namespace {

namespace m = isdn::message;

class Identifiers : public Listener {
  public:
    void found(const Finding& finding) override { lines.append(finding.kind->id).append("\n"); }
    std::string lines;
};

// `after` seconds pass behind the last frame.
std::string found(const CallScript& script, std::int64_t after = 0, const Options& options = {}) {
    Identifiers identifiers;
    Analysis analysis(options, identifiers);
    std::uint64_t number = 0;
    for (const Sent& sent : script.frames())
        analysis.take(sent.frame, ++number);
    analysis.advance(after * second);
    analysis.finish();
    return identifiers.lines;
}

// A link that is up and has carried a call.
CallScript begun() {
    CallScript script;
    script.at(0).linkUp().at(100).us(m::setup, 1, false, {bearerSpeech()});
    script.at(105).peer(m::releaseComplete, 1, true, {cause(17)});
    script.acknowledge(Side::us);
    return script;
}

// A call of our side, answered.
void talk(CallScript& s, std::int64_t at, std::uint16_t ref, std::uint8_t number) {
    s.at(at).us(m::setup, ref, false, {bearerSpeech(), channel(number), called("4021")});
    s.at(at + 20).peer(m::callProceeding, ref, true, {channel(number)});
    s.at(at + 40).peer(m::connect, ref, true);
    s.at(at + 60).us(m::connectAcknowledge, ref, false).acknowledge(Side::peer);
}

void clear(CallScript& s, std::int64_t at, std::uint16_t ref) {
    s.at(at).us(m::disconnect, ref, false, {cause(16)});
    s.at(at + 20).peer(m::release, ref, true);
    s.at(at + 40).us(m::releaseComplete, ref, false).acknowledge(Side::peer);
}

void restart(CallScript& s, std::int64_t at, std::uint8_t number) {
    s.at(at).us(m::restart, 0, false, {channel(number), restartIndicator(0)});
    s.at(at + 20).peer(m::restartAcknowledge, 0, true, {channel(number), restartIndicator(0)});
}

// A SETUP that is refused with a cause.
void refused(CallScript& s, std::int64_t at, std::uint16_t ref, std::uint8_t value,
             const std::string& number = "4021") {
    s.at(at).us(m::setup, ref, false, {bearerSpeech(), called(number)});
    s.at(at + 20).peer(m::releaseComplete, ref, true, {cause(value, 2)});
}

// STATUS with a cause, of a call in conversation.
std::string status(std::uint8_t value) {
    CallScript s = begun();
    talk(s, 1000, 2, 1);
    s.at(5000).us(m::statusEnquiry, 2, false).peer(m::status, 2, true, {cause(value), callState(10)});
    clear(s, 9000, 2);
    return found(s, 10);
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
    {&findings::setupUnanswered,
     [](bool faulty) {
         CallScript s = begun();
         s.at(10000).us(m::setup, 2, false, {bearerSpeech()}).acknowledge(Side::peer);
         s.at(14000).us(m::setup, 2, false, {bearerSpeech()}).acknowledge(Side::peer);
         if (!faulty)
             s.at(17900).peer(m::callProceeding, 2, true);
         return found(s, 5);
     }},
    {&findings::setupRepeated,
     [](bool faulty) {
         CallScript s = begun();
         s.at(10000).us(m::setup, 2, false, {bearerSpeech()}).acknowledge(Side::peer);
         if (faulty)
             s.at(14000).us(m::setup, 2, false, {bearerSpeech()});
         s.at(14100).peer(m::releaseComplete, 2, true, {cause(17)});
         return found(s, 5);
     }},
    {&findings::setupAcknowledgeUnanswered,
     [](bool faulty) {
         CallScript s = begun();
         s.at(10000).us(m::setup, 2, false, {bearerSpeech(), called("1")});
         s.at(10020).peer(m::setupAcknowledge, 2, true, {channel(3)});
         s.at(25000).peer(m::disconnect, 2, true, {cause(faulty ? 28 : 17, 2)});
         s.us(m::release, 2, false).peer(m::releaseComplete, 2, true);
         return found(s, 5);
     }},
    {&findings::waitsForDigits,
     [](bool faulty) {
         CallScript s = begun();
         s.at(10000).us(m::setup, 2, false, {bearerSpeech(), called("1")});
         s.at(10020).peer(m::setupAcknowledge, 2, true, {channel(3)});
         s.at(12000).us(m::information, 2, false, {called("2"), faulty ? Bytes{} : sendingComplete()});
         s.at(24000).peer(m::callProceeding, 2, true);
         s.at(24500).peer(m::releaseComplete, 2, true, {cause(17)});
         return found(s, 5);
     }},
    {&findings::proceedingUnanswered,
     [](bool faulty) {
         CallScript s = begun();
         s.at(10000).us(m::setup, 2, false, {bearerSpeech()}).at(10100).peer(m::callProceeding, 2, true);
         s.acknowledge(Side::us);
         if (!faulty)
             s.at(20000).peer(m::progress, 2, true, {progress(8)});
         return found(s, 130);
     }},
    {&findings::connectNotAcknowledged,
     [](bool faulty) {
         CallScript s = begun();
         s.at(10000).peer(m::setup, 2, false, {bearerSpeech(), channel(1)});
         s.at(11000).us(m::connect, 2, true).acknowledge(Side::peer);
         if (!faulty)
             s.at(14900).peer(m::connectAcknowledge, 2, false);
         return found(s, 10);
     }},
    {&findings::connectNeverAcknowledged,
     [](bool faulty) {
         CallScript s = begun();
         if (faulty) {
             talk(s, 5000, 2, 1);
             clear(s, 8000, 2);
         }
         s.at(20000).us(m::setup, 3, false, {bearerSpeech()});
         s.at(21000).peer(m::connect, 3, true).acknowledge(Side::us);
         return found(s, 10);
     }},
    {&findings::disconnectUnanswered,
     [](bool faulty) {
         CallScript s = begun();
         talk(s, 5000, 2, 1);
         s.at(10000).us(m::disconnect, 2, false, {cause(16)}).acknowledge(Side::peer);
         if (!faulty)
             s.at(39900).peer(m::release, 2, true);
         return found(s, 31);
     }},
    {&findings::releaseUnanswered,
     [](bool faulty) {
         CallScript s = begun();
         talk(s, 5000, 2, 1);
         s.at(10000).us(m::release, 2, false, {cause(16)}).acknowledge(Side::peer);
         s.at(14000).us(m::release, 2, false, {cause(16)}).acknowledge(Side::peer);
         if (!faulty)
             s.at(17000).peer(m::releaseComplete, 2, true);
         return found(s, 5);
     }},
    {&findings::releaseRepeated,
     [](bool faulty) {
         CallScript s = begun();
         talk(s, 5000, 2, 1);
         s.at(10000).us(m::release, 2, false, {cause(16)}).acknowledge(Side::peer);
         if (faulty)
             s.at(14000).us(m::release, 2, false, {cause(16)}).acknowledge(Side::peer);
         s.at(14100).peer(m::releaseComplete, 2, true);
         return found(s, 5);
     }},
    {&findings::statusEnquiryUnanswered,
     [](bool faulty) {
         CallScript s = begun();
         talk(s, 5000, 2, 1);
         s.at(10000).us(m::statusEnquiry, 2, false).acknowledge(Side::peer);
         s.at(14000).us(m::statusEnquiry, 2, false).acknowledge(Side::peer);
         if (!faulty)
             s.at(17000).peer(m::status, 2, true, {cause(30), callState(10)});
         return found(s, 5);
     }},
    {&findings::statusIncompatible,
     [](bool faulty) {
         CallScript s = begun();
         talk(s, 5000, 2, 1);
         s.at(10000).us(m::statusEnquiry, 2, false);
         s.peer(m::status, 2, true, {cause(30), callState(faulty ? 0 : 10)});
         return found(s, 5);
     }},
    {&findings::statusUnasked,
     [](bool faulty) {
         CallScript s = begun();
         talk(s, 5000, 2, 1);
         if (!faulty)
             s.at(10000).us(m::statusEnquiry, 2, false);
         s.at(10020).peer(m::status, 2, true, {cause(30), callState(10)});
         return found(s, 5);
     }},
    {&findings::protocolError, [](bool faulty) { return status(faulty ? 98 : 30); }},
    {&findings::elementIgnored, [](bool faulty) { return status(faulty ? 99 : 30); }},
    {&findings::timer102, [](bool faulty) { return status(faulty ? 102 : 30); }},
    {&findings::referenceInUse,
     [](bool faulty) {
         CallScript s = begun();
         talk(s, 5000, 2, 1);
         if (!faulty)
             clear(s, 8000, 2);
         refused(s, 10000, 2, 17);
         return found(s, 5);
     }},
    {&findings::unknownReference,
     [](bool faulty) {
         CallScript s = begun();
         talk(s, 5000, 2, 1);
         clear(s, 8000, 2);
         s.at(faulty ? 60000 : 9000).peer(m::release, 2, true, {cause(16)});
         return found(s, 5);
     }},
    {&findings::elementAbsent,
     [](bool faulty) {
         CallScript s = begun();
         s.at(5000).us(m::setup, 2, false, {faulty ? Bytes{} : bearerSpeech(), called("1")});
         s.peer(m::releaseComplete, 2, true, {cause(17)});
         return found(s, 5);
     }},
    {&findings::elementDamaged,
     [](bool faulty) {
         CallScript s = begun();
         s.at(5000).us(m::setup, 2, false,
                       {bearerSpeech(), faulty ? Bytes{0x70, 0x05, 0x81, 0x31} : called("1")});
         s.peer(m::releaseComplete, 2, true, {cause(17)});
         return found(s, 5);
     }},
    {&findings::elementRepeated,
     [](bool faulty) {
         CallScript s = begun();
         s.at(5000).us(m::setup, 2, false, {bearerSpeech(), called("1"), faulty ? called("2") : Bytes{}});
         s.peer(m::releaseComplete, 2, true, {cause(17)});
         return found(s, 5);
     }},
    {&findings::segmentsUnfinished,
     [](bool faulty) {
         CallScript s = begun();
         s.at(5000).us(
             m::segment, 2, false,
             {Bytes{0x00, 0x02, 0x81, 0x05}, Bytes{0x04, 0x03, 0x80, 0x90, 0xA3, 0x70, 0x03, 0x81}});
         if (!faulty)
             s.at(5100).us(m::segment, 2, false, {Bytes{0x00, 0x02, 0x00, 0x05}, Bytes{0x31, 0x32}});
         s.at(9900).us(m::setup, 3, false, {bearerSpeech()});
         return found(s, 5);
     }},
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
    {&findings::broadcastUnanswered,
     [](bool faulty) {
         CallScript s(capture::Role::network);
         s.at(0).broadcast(Side::us, m::setup, 4, {bearerSpeech()});
         if (!faulty)
             s.at(100).tei(64).peer(m::releaseComplete, 4, true, {cause(17)});
         return found(s, 7);
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
    {&findings::cannotBeTold,
     [](bool faulty) {
         CallScript s = begun();
         s.at(10000).us(m::setup, 2, false, {bearerSpeech()});
         if (!faulty)
             s.acknowledge(Side::peer);
         return found(s, 10);
     }},
};

}  // namespace

std::span<const Scenario> callScenarios() { return all; }

}  // namespace calls::test
