#include "tests/calls/traps.h"

#include <iterator>

#include "calls/FindingKinds.h"

namespace calls::test {

namespace {

namespace m = isdn::message;
using enum capture::Role;

// A call of our side up to the conversation.
CallScript& talk(CallScript& script, std::uint16_t ref, std::uint8_t number) {
    script.us(m::setup, ref, false, {bearerSpeech(), channel(number), called("4021")});
    script.peer(m::callProceeding, ref, true, {channel(number)});
    script.peer(m::connect, ref, true);
    return script.us(m::connectAcknowledge, ref, false);
}

CallScript& clear(CallScript& script, std::uint16_t ref) {
    script.us(m::disconnect, ref, false, {cause(16)});
    script.peer(m::release, ref, true);
    return script.us(m::releaseComplete, ref, false);
}

void end(CallScript& script, std::int64_t at) { script.at(at).poll(Side::us).at(at + 1000).poll(Side::peer); }

void noConnectAcknowledge(CallScript& s, bool spoilt) {
    s.at(0).linkUp();
    if (spoilt) {  // it is the called user who waits for it
        s.at(100).peer(m::setup, 1, false, {bearerSpeech(), channel(1)});
        s.at(150).us(m::callProceeding, 1, true, {channel(1)});
        s.at(900).us(m::connect, 1, true).acknowledge(Side::peer);
        return end(s, 20000);
    }
    s.at(100).us(m::setup, 1, false, {bearerSpeech(), channel(1), called("4021")});
    s.at(150).peer(m::callProceeding, 1, true, {channel(1)});
    s.at(900).peer(m::connect, 1, true).acknowledge(Side::us);
    clear(s.at(20000), 1);
    end(s, 30000);
}

void crossingDisconnects(CallScript& s, bool spoilt) {
    talk(s.at(0).linkUp().at(100), 1, 1);
    if (spoilt) {  // nobody goes on
        s.at(5000).us(m::disconnect, 1, false, {cause(16)}).acknowledge(Side::peer);
        return end(s, 60000);
    }
    s.at(5000).crossing();
    s.us(m::disconnect, 1, false, {cause(16)}).peer(m::disconnect, 1, true, {cause(16)});
    s.at(5020).us(m::release, 1, false).peer(m::release, 1, true);
    end(s, 60000);
}

void disconnectsCrossBeforeRelease(CallScript& s, bool spoilt) {
    talk(s.at(0).linkUp().at(100), 1, 1);
    s.at(5000).crossing();
    s.us(m::disconnect, 1, false, {cause(16)}).peer(m::disconnect, 1, true, {cause(16)});
    s.at(5010).acknowledge(Side::us).acknowledge(Side::peer);
    s.at(5050).peer(m::release, 1, true).acknowledge(Side::us);
    if (!spoilt)
        s.at(5100).us(m::releaseComplete, 1, false).acknowledge(Side::peer);
    end(s, 60000);
}

void senderOfDisconnectGoesOn(CallScript& s, bool spoilt) {
    s.at(0).linkUp().at(100).us(m::setup, 1, false, {bearerSpeech(), channel(1), called("4021")});
    s.at(150).peer(m::callProceeding, 1, true, {channel(1)});
    s.at(1000).peer(m::disconnect, 1, true, {cause(1, 2), progress(8)}).acknowledge(Side::us);
    s.at(spoilt ? 31000 : 21000).peer(m::release, 1, true, {cause(1, 2)}).us(m::releaseComplete, 1, false);
    end(s, 60000);
}

void crossingReleases(CallScript& s, bool spoilt) {
    talk(s.at(0).linkUp().at(100), 1, 1);
    if (spoilt) {
        s.at(5000).us(m::release, 1, false, {cause(16)}).acknowledge(Side::peer);
        s.at(9000).us(m::release, 1, false, {cause(16)}).acknowledge(Side::peer);
        return end(s, 60000);
    }
    s.at(5000).crossing();
    s.us(m::release, 1, false, {cause(16)}).peer(m::release, 1, true, {cause(16)});
    talk(s.at(6000), 2, 1);
    clear(s.at(7000), 2);
    end(s, 60000);
}

void rejectAndRepetition(CallScript& s, bool spoilt) {
    s.at(0).linkUp();
    s.at(100).us(m::setup, 1, false, {bearerSpeech(), channel(1), called("4")});
    s.at(120).us(m::information, 1, false, {called("0")});
    s.at(140).us(m::information, 1, false, {called("21")});
    if (spoilt) {  // N(R) acknowledges what was never sent
        s.at(200).raw(Side::peer, false, {0x01, 0x14});
        s.at(300).us(m::information, 1, false, {called("5")});
        return end(s, 2000);
    }
    s.at(200).raw(Side::peer, false, {0x09, 0x02});  // REJ, N(R) = 1
    s.at(210).again(3).at(220).again(4);
    s.at(300).peer(m::callProceeding, 1, true, {channel(1)});
    s.at(900).peer(m::connect, 1, true).us(m::connectAcknowledge, 1, false);
    clear(s.at(5000), 1);
    end(s, 6000);
}

void standby(CallScript& s, bool spoilt) {
    s.on("standby").at(0).linkUp();
    for (int i = 1; i < 20; ++i)
        s.at(i * 10000).poll(i % 2 == 0 ? Side::us : Side::peer);
    if (!spoilt)
        return;
    for (int i = 1; i <= 5; ++i)
        s.at(200000 + i * 1000).raw(Side::us, true, {0x01, 0x01});
    s.at(210000).linkUp();
}

void restarts(CallScript& s, bool spoilt) {
    s.at(0).linkUp();
    for (std::uint8_t i = 0; i < 31; ++i) {
        const auto number = static_cast<std::uint8_t>(spoilt ? 5 : i + 1);
        if (number == 16)
            continue;
        s.at(1000 + i * 40).us(m::restart, 0, false, {channel(number), restartIndicator(0)});
        s.at(1020 + i * 40).peer(m::restartAcknowledge, 0, true, {channel(number), restartIndicator(0)});
    }
    end(s, 300000);
}

void announcement(CallScript& s, bool spoilt) {
    s.at(0).linkUp().at(100).us(m::setup, 1, false, {bearerSpeech(), channel(1), called("4021")});
    s.at(150).peer(m::callProceeding, 1, true, {channel(1)});
    s.at(1000).peer(m::disconnect, 1, true, {cause(1, 2), progress(8)}).acknowledge(Side::us);
    s.at(spoilt ? 40000 : 26000).us(m::release, 1, false).peer(m::releaseComplete, 1, true);
    end(s, 60000);
}

void holdAndSecondCall(CallScript& s, bool spoilt) {
    talk(s.at(0).linkUp().at(100), 1, 1);
    s.at(3000).us(m::hold, 1, false);
    if (spoilt)
        s.at(3010).peer(m::holdReject, 1, true, {cause(69)});
    else
        s.at(3010).peer(m::holdAcknowledge, 1, true);
    talk(s.at(4000), 2, 1);
    clear(s.at(9000), 2);
    if (!spoilt) {
        s.at(9500).us(m::retrieve, 1, false, {channel(1)});
        s.at(9510).peer(m::retrieveAcknowledge, 1, true, {channel(1)});
    }
    clear(s.at(20000), 1);
    end(s, 30000);
}

void retrieveOnAnotherChannel(CallScript& s, bool spoilt) {
    talk(s.at(0).linkUp().at(100), 1, 1);
    s.at(3000).us(m::hold, 1, false).peer(m::holdAcknowledge, 1, true);
    s.at(9500).us(m::retrieve, 1, false);
    s.at(9510).peer(m::retrieveAcknowledge, 1, true, {channel(2)});
    talk(s.at(10000), 2, spoilt ? 2 : 1);
    clear(s.at(19000), 2);
    clear(s.at(20000), 1);
    end(s, 30000);
}

void suspendAndResume(CallScript& s, bool spoilt) {
    talk(s.at(0).linkUp().at(100), 1, 1);
    s.at(3000).us(m::suspend, 1, false, {callIdentity(7)});
    if (!spoilt)
        s.at(3010).peer(m::suspendAcknowledge, 1, true);
    s.at(3020).poll(Side::us);
    s.at(60000).us(m::resume, 1, false, {callIdentity(7)});
    s.at(60010).peer(m::resumeAcknowledge, 1, true, {channel(2)});
    clear(s.at(90000), 1);
    end(s, 100000);
}

void segments(CallScript& s, bool spoilt) {
    s.at(0).linkUp().at(100);
    s.us(m::segment, 1, false,
         {Bytes{0x00, 0x02, 0x81, 0x05}, Bytes{0x04, 0x03, 0x80, 0x90, 0xA3, 0x70, 0x03, 0x81}});
    if (!spoilt)
        s.at(120).us(m::segment, 1, false, {Bytes{0x00, 0x02, 0x00, 0x05}, Bytes{0x31, 0x32}});
    s.at(140).acknowledge(Side::peer);
    s.at(6000).us(m::setup, 2, false, {bearerSpeech()});
    s.at(6100).peer(m::releaseComplete, 2, true, {cause(17)});
    s.at(6200).peer(m::releaseComplete, 1, true, {cause(17)});
    end(s, 20000);
}

void registration(CallScript& s, bool spoilt) {
    const Bytes service{0x1C, 0x01, 0x91};
    s.at(0).linkUp().at(100).us(m::registration, 5, false, {service});
    s.at(150).peer(m::facility, 5, true, {service});
    s.at(200).us(m::releaseComplete, 5, false);
    if (spoilt)
        s.at(90000).peer(m::releaseComplete, 5, true);
    end(s, 100000);
}

void overlap(CallScript& s, bool spoilt) {
    s.at(0).linkUp();
    const auto dial = [&](Side from, std::int64_t at, std::uint16_t ref, std::uint8_t number) {
        const Side to = other(from);
        s.at(at).message(from, m::setup, ref, false, {bearerSpeech(), channel(number)});
        s.at(at + 50).message(to, m::setupAcknowledge, ref, true, {channel(number)});
        for (int i = 1; i <= 4; ++i)
            s.at(at + i * 2000).message(from, m::information, ref, false, {called(std::to_string(i))});
        if (spoilt) {
            s.at(at + 23500).message(to, m::disconnect, ref, true, {cause(28, 2)});
            s.message(from, m::release, ref, false).message(to, m::releaseComplete, ref, true);
            return;
        }
        s.at(at + 8200).message(to, m::callProceeding, ref, true);
        s.at(at + 9000).message(to, m::connect, ref, true);
        s.at(at + 9010).message(from, m::connectAcknowledge, ref, false);
        s.at(at + 20000).message(from, m::disconnect, ref, false, {cause(16)});
        s.message(to, m::release, ref, true).message(from, m::releaseComplete, ref, false);
    };
    dial(Side::us, 1000, 1, 1);
    dial(Side::peer, 30000, 1, 2);
    end(s, 100000);
}

void pollsOfOneSide(CallScript& s, bool spoilt) {
    s.at(0).linkUp();
    for (int i = 1; i < 30; ++i)
        s.at(i * 30000).poll(Side::peer);
    end(s, spoilt ? 2000000 : 900000);
}

void basicAccessGoesIdle(CallScript& s, bool spoilt) {
    const Bytes b1 = {0x18, 0x01, 0x89};
    for (int i = 0; i < 3; ++i) {
        const std::int64_t at = std::int64_t{i} * 600000;
        const auto ref = static_cast<std::uint16_t>(i + 1);
        s.tei(64).at(at).linkUp();
        s.at(at + 100).us(m::setup, ref, false, {bearerSpeech(), Bytes{0x18, 0x01, 0x83}, called("1")});
        s.at(at + 200).peer(m::callProceeding, ref, true, {b1}).acknowledge(Side::us);
        s.at(at + 1000)
            .peer(m::connect, ref, true)
            .us(m::connectAcknowledge, ref, false)
            .acknowledge(Side::peer);
        s.at(at + 9000).us(m::disconnect, ref, false, {cause(16)});
        s.at(at + 9050)
            .peer(m::release, ref, true)
            .us(m::releaseComplete, ref, false)
            .acknowledge(Side::peer);
        s.at(at + 20000).raw(Side::peer, true, {0x53}).raw(Side::us, false, {0x73});  // DISC, UA
    }
    if (!spoilt)
        return;
    for (int i = 0; i < 4; ++i)
        s.at(1900000 + i * 1000).raw(Side::us, true, {0x7F});
    s.at(1910000).linkUp();
}

void threeDays(CallScript& s, bool spoilt) {
    constexpr std::int64_t hour = 3600000;
    talk(s.at(0).linkUp().at(100), 1, 1);
    for (int i = 1; i < 72; ++i)
        s.at(i * hour).poll(i % 2 == 0 ? Side::us : Side::peer);
    if (spoilt)  // its reference is used again, and nobody clears the old call
        s.at(72 * hour)
            .us(m::setup, 1, false, {bearerSpeech(), channel(2)})
            .peer(m::releaseComplete, 1, true, {cause(17)});
    else
        clear(s.at(72 * hour), 1);
    end(s, 73 * hour);
}

// A message with a reference of one octet.
void shortReference(CallScript& s, bool spoilt) {
    s.at(0).linkUp().shortReferences();
    talk(s.at(100), 9, 1);
    clear(s.at(5000), 9);
    if (spoilt)
        s.at(60000).peer(m::disconnect, 9, true, {cause(16)});
    end(s, 70000);
}

void anotherChannel(CallScript& s, bool spoilt) {
    s.at(0).linkUp().at(100).us(m::setup, 1, false, {bearerSpeech(), channel(1, spoilt), called("4021")});
    s.at(150).peer(m::callProceeding, 1, true, {channel(15)});
    s.at(900).peer(m::connect, 1, true).us(m::connectAcknowledge, 1, false);
    clear(s.at(5000), 1);
    end(s, 6000);
}

void statusAfterEnquiry(CallScript& s, bool spoilt) {
    talk(s.at(0).linkUp().at(100), 1, 1);
    s.at(5000).peer(m::statusEnquiry, 1, true);
    s.at(5050).us(m::status, 1, false, {cause(30), callState(spoilt ? 0 : 10)});
    if (!spoilt)
        clear(s.at(9000), 1);
    end(s, 10000);
}

void enquiriesCross(CallScript& s, bool spoilt) {
    talk(s.at(0).linkUp().at(100), 1, 1);
    s.at(5000).crossing();
    s.us(m::statusEnquiry, 1, false).peer(m::statusEnquiry, 1, true);
    s.at(5050).us(m::status, 1, false, {cause(30), callState(10)});
    s.at(5060).peer(m::status, 1, true, {cause(30), callState(spoilt ? 0 : 10)});
    if (!spoilt)
        clear(s.at(9000), 1);
    end(s, 10000);
}

void statusOfAnOlderCall(CallScript& s, bool spoilt) {
    s.at(0).linkUp();
    s.at(1000).us(m::status, 7, false, {cause(30), callState(0)}).acknowledge(Side::peer);
    if (spoilt)  // and once more, when it is forgotten
        s.at(20000).us(m::status, 7, false, {cause(30), callState(0)}).acknowledge(Side::peer);
    end(s, 30000);
}

constexpr Trap all[] = {
    {"no-connect-acknowledge", "the caller does not acknowledge CONNECT, which is its choice", user,
     noConnectAcknowledge, &findings::connectNotAcknowledged},
    {"crossing-disconnects", "both sides send DISCONNECT at once", user, crossingDisconnects,
     &findings::disconnectUnanswered},
    {"disconnects-cross-before-release", "both sides send DISCONNECT at once, and one goes on with RELEASE",
     user, disconnectsCrossBeforeRelease, &findings::releaseUnanswered},
    {"sender-of-disconnect-goes-on", "the network ends its announcement with RELEASE after 20 s", user,
     senderOfDisconnectGoesOn, &findings::disconnectUnanswered},
    {"crossing-releases", "both sides send RELEASE at once; no RELEASE COMPLETE follows", user,
     crossingReleases, &findings::releaseUnanswered},
    {"reject-and-repetition", "REJ, and the frames that it asks for", user, rejectAndRepetition,
     &findings::nrInvalid},
    {"standby", "a standby D channel that only polls", network, standby, &findings::oneDirectionSilent},
    {"restarts", "a RESTART of each of 30 channels after the link has come up", network, restarts,
     &findings::restartStorm},
    {"announcement", "DISCONNECT with progress indicator 8, held for 25 s", user, announcement,
     &findings::disconnectUnanswered},
    {"hold-and-second-call", "HOLD, and a second call on the channel of the first", user, holdAndSecondCall,
     &findings::doubleSeizure},
    {"retrieve-on-another-channel", "RETRIEVE on another channel, and a call on the one before", user,
     retrieveOnAnotherChannel, &findings::doubleSeizure},
    {"suspend-and-resume", "SUSPEND, and RESUME a minute later on another channel", user, suspendAndResume,
     &findings::referenceInUse},
    {"segments", "a SETUP in two segments", user, segments, &findings::segmentsUnfinished},
    {"register", "REGISTER, a transaction without a call", user, registration, &findings::unknownReference},
    {"overlap", "overlap sending in both directions", user, overlap, &findings::overlapTimeout},
    {"polls-of-one-side", "one side alone polls, every 30 s", user, pollsOfOneSide,
     &findings::keepAliveMissing},
    {"basic-access-goes-idle", "a basic access that takes its link down between calls", user,
     basicAccessGoesIdle, &findings::sabmeUnanswered},
    {"three-days", "a call of three days", user, threeDays, &findings::stuckChannel},
    {"short-reference", "references of one octet on a primary rate", user, shortReference,
     &findings::unknownReference},
    {"another-channel", "an answer on another channel than the one preferred", user, anotherChannel,
     &findings::channelChanged},
    {"enquiries-cross", "both sides send STATUS ENQUIRY at once", user, enquiriesCross,
     &findings::statusIncompatible},
    {"status-of-an-older-call", "STATUS with state 0 for a call from before the trace", user,
     statusOfAnOlderCall, &findings::unknownReference},
    {"status-after-enquiry", "STATUS with cause 30 behind STATUS ENQUIRY", user, statusAfterEnquiry,
     &findings::statusIncompatible},
};

}  // namespace

std::span<const Trap> traps() { return all; }

}  // namespace calls::test
