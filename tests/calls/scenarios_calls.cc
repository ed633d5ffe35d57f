// Stories about calls. Our side is the user.
#include "calls/FindingKinds.h"
#include "tests/calls/CallStories.h"
#include "tests/calls/scenarios.h"

namespace calls::test {

namespace {

// STATUS with a cause, of a call in conversation.
std::string status(std::uint8_t value) {
    CallScript s = begun();
    talk(s, 1000, 2, 1);
    s.at(5000).us(m::statusEnquiry, 2, false).peer(m::status, 2, true, {cause(value), callState(10)});
    clear(s, 9000, 2);
    return found(s, 10);
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
    {&findings::overlapTimeout,
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
    {&findings::overlapTimeout,
     [](bool faulty) {
         CallScript s = begun();
         s.at(10000).us(m::setup, 2, false, {bearerSpeech(), called("1")});
         s.at(10020).peer(m::setupAcknowledge, 2, true, {channel(3)});
         s.at(20000).us(m::information, 2, false, {called("2")}).acknowledge(Side::peer);
         if (!faulty)
             s.at(49000).us(m::information, 2, false, {called("3")}).acknowledge(Side::peer);
         return found(s, faulty ? 31 : 29);
     }},
    {&findings::alertingUnanswered,
     [](bool faulty) {
         CallScript s = begun();
         s.at(10000).us(m::setup, 2, false, {bearerSpeech()}).at(10100).peer(m::alerting, 2, true);
         s.acknowledge(Side::us);
         if (!faulty)
             s.at(190000).us(m::disconnect, 2, false, {cause(16)});
         return found(s, 191);
     }},
    {&findings::suspendUnanswered,
     [](bool faulty) {
         CallScript s = begun();
         talk(s, 5000, 2, 1);
         s.at(10000).us(m::suspend, 2, false, {callIdentity(1)}).acknowledge(Side::peer);
         if (!faulty)
             s.at(13900).peer(m::suspendAcknowledge, 2, true);
         return found(s, 15);
     }},
    {&findings::resumeUnanswered,
     [](bool faulty) {
         CallScript s = begun();
         s.at(10000).us(m::resume, 2, false, {callIdentity(1)}).acknowledge(Side::peer);
         if (!faulty)
             s.at(13900).peer(m::resumeReject, 2, true, {cause(85)});
         return found(s, 15);
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
    {&findings::broadcastUnanswered,
     [](bool faulty) {
         CallScript s(capture::Role::network);
         s.at(0).broadcast(Side::us, m::setup, 4, {bearerSpeech()});
         if (!faulty)
             s.at(100).tei(64).peer(m::releaseComplete, 4, true, {cause(17)});
         return found(s, 7);
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
