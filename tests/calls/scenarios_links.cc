// Stories about links. ">" is our side, the user; "<" the other one.
#include "calls/Analysis.h"
#include "calls/FindingKinds.h"
#include "tests/calls/CallScript.h"
#include "tests/calls/Script.h"
#include "tests/calls/scenarios.h"

namespace calls::test {

namespace {

class Identifiers : public Listener {
  public:
    void found(const Finding& finding) override { lines.append(finding.kind->id).append("\n"); }
    std::string lines;
};

// `after` seconds pass behind the last frame. `losesAt` is the frame behind which the recorder says that it
// has lost some.
std::string found(std::string_view story, std::int64_t after = 0, std::size_t losesAt = 0) {
    Identifiers identifiers;
    Analysis analysis({}, identifiers);
    std::uint64_t number = 0;
    const std::vector<testing::ScriptFrame> frames = testing::script(story);
    for (const testing::ScriptFrame& scripted : frames) {
        analysis.take(testing::frameOf(scripted), ++number);
        if (number == losesAt)
            analysis.mayMiss(*scripted.frame.interface, "Frames Lost");
    }
    analysis.advance(after * second);
    analysis.finish();
    return identifiers.lines;
}

std::string found(const CallScript& script) {
    Identifiers identifiers;
    Analysis analysis({}, identifiers);
    std::uint64_t number = 0;
    for (const Sent& sent : script.frames())
        analysis.take(sent.frame, ++number);
    analysis.finish();
    return identifiers.lines;
}

const std::string up = "0 > SABME\n0.01 < UA\n";

// Polls of both sides every ten seconds.
std::string idle(int from, int to) {
    std::string story;
    for (int at = from; at <= to; at += 10) {
        const std::string time = std::to_string(at);
        story +=
            time + " > RR 0 P\n" + time + ".01 < RR 0 F\n" + time + ".5 < RR 0 P\n" + time + ".51 > RR 0 F\n";
    }
    return story;
}

// Frames sent again: one of `oneOf`, for an hour.
std::string repeating(int oneOf) {
    std::string story = up;
    for (int i = 0; i < 1500; ++i) {
        const std::string time = std::to_string(10 + i), number = std::to_string(i % 128);
        story += time + " > I " + number + " 0\n";
        if (i % oneOf == 0)
            story += time + ".2 > I " + number + " 0\n";
        story += time + ".3 < RR " + std::to_string((i + 1) % 128) + "\n";
    }
    return story;
}

std::string seven() {
    std::string story = up;
    for (int i = 0; i < 7; ++i)
        story += "1.0" + std::to_string(i) + " > I " + std::to_string(i) + " 0\n";
    return story;
}

const Bytes sabme{0x7F}, ua{0x73};

constexpr Scenario all[] = {
    {&findings::sameRole,
     [](bool faulty) {
         CallScript script;
         for (int i = 0; i < 2; ++i) {
             script.at(i * 1000).raw(Side::us, true, sabme);
             script.at(i * 1000 + 500).raw(Side::peer, !faulty, sabme);
         }
         return found(script);
     }},
    {&findings::lineLooped,
     [](bool faulty) {
         CallScript script;
         for (int i = 0; i < 4; ++i) {
             script.at(i * 1000).raw(Side::us, true, sabme);
             script.at(i * 1000 + 20).raw(Side::peer, !faulty, sabme);
         }
         return found(script);
     }},
    {&findings::linkFlap,
     [](bool faulty) {
         return found(up + (faulty ? "" : "4 < DISC\n4.1 > UA\n") + "5 < SABME\n5.01 > UA\n");
     }},
    {&findings::sabmeUnanswered,
     [](bool faulty) {
         return found(std::string("0 > SABME\n1 > SABME\n2 > SABME\n3 > SABME\n") +
                          (faulty ? "" : "3.5 < UA\n") + "5 < RR 0 P\n",
                      5);
     }},
    {&findings::sabmeUnanswered,  // for ever, each at T200
     [](bool faulty) {
         std::string story;
         for (int i = 0; i < 60; ++i)
             story += std::to_string(i) + " > SABME\n" +
                      (faulty || i % 3 != 2 ? "" : std::to_string(i) + ".5 < UA\n");
         return found(story);
     }},
    {&findings::linkRefused,
     [](bool faulty) { return found(std::string("0 > SABME\n0.01 < ") + (faulty ? "DM F\n" : "UA\n")); }},
    {&findings::frameRejected,
     [](bool faulty) {
         return found(up + "1 > I 0 0\n" + (faulty ? "1.1 < FRMR = 00 00 00 02 08\n" : "1.1 < RR 1\n"));
     }},
    {&findings::nsGapLine,
     [](bool faulty) {
         return found(std::string("1 < I 0 0\n") + (faulty ? "" : "1.05 < I 1 0\n") +
                      "1.1 < I 2 0\n1.2 > REJ 1\n1.3 < I 1 0\n1.4 < I 2 0\n1.5 > RR 3\n");
     }},
    {&findings::nsGapRecorder,
     [](bool faulty) {
         return found(std::string("1 < I 0 0\n1.05 > RR 1\n1.1 < I ") + (faulty ? "3" : "1") +
                      " 0\n1.2 > RR " + (faulty ? "4\n" : "2\n"));
     }},
    {&findings::nsGapUnknown,
     [](bool faulty) {
         return found(std::string("1 > I 0 0\n1.05 < RR 1\n1.1 < I 0 1\n1.2 < I ") + (faulty ? "2" : "1") +
                      " 1\n");
     }},
    {&findings::nrInvalid,
     [](bool faulty) {
         return found(std::string("1 > I 0 0\n1.1 < RR ") + (faulty ? "9" : "1") + "\n2 > I 1 0\n");
     }},
    {&findings::framesLost, [](bool faulty) { return found(up + idle(10, 40), 0, faulty ? 5 : 0); }},
    {&findings::retransmissions, [](bool faulty) { return found(repeating(faulty ? 40 : 120)); }},
    {&findings::keepAliveMissing,
     [](bool faulty) { return found(up + idle(10, 60) + idle(faulty ? 100 : 90, 120)); }},
    {&findings::pollUnanswered,
     [](bool faulty) {
         return found(up + "1 > RR 0 P\n2 > RR 0 P\n2.5 < I 0 0\n3 > RR 1 P\n" +
                      (faulty ? "4 > RR 1 P\n5.1 < I 1 0\n" : ""));
     }},
    {&findings::pollUnanswered,  // for ever, each at T200
     [](bool faulty) {
         std::string story = up;
         for (int i = 1; i < 60; ++i) {
             const std::string second = std::to_string(i);
             story += second + " > RR 0 P\n" + second + ".5 < RR 0" + (faulty ? "\n" : " F\n");
         }
         return found(story);
     }},
    {&findings::oneDirectionSilent,  // for ever, each at T200
     [](bool faulty) {
         std::string story = up;
         for (int i = 1; i < 60; ++i) {
             const std::string second = std::to_string(i);
             story += second + " > RR 0 P\n" + (faulty ? "" : second + ".5 < RR 0 F\n");
         }
         return found(story);
     }},
    {&findings::nrInvalid,  // beyond half of all numbers
     [](bool faulty) {
         std::string story = up;
         for (int i = 0; i < 20; ++i) {
             const std::string second = std::to_string(i + 1), next = std::to_string(i + 1);
             story += second + " > I " + std::to_string(i) + " 0\n" + second + ".1 < RR " + next + "\n";
         }
         return found(story + "30 < RR " + (faulty ? "90" : "20") + "\n31 > I 20 0\n31.1 < RR 21\n");
     }},
    {&findings::windowStalled,
     [](bool faulty) { return found(seven() + (faulty ? "" : "1.5 < RNR 0\n") + "3 < RR 7\n"); }},
    {&findings::receiverNotReady,
     [](bool faulty) {
         return found(up + "1 < RNR 0\n5 < RNR 0\n" + (faulty ? "12" : "10") +
                      " < RR 0\n12.1 > RR 0 P\n12.2 < RR 0 F\n");
     }},
    {&findings::oneDirectionSilent,
     [](bool faulty) {
         return found(up + "10 > RR 0 P\n11 > RR 0 P\n12 > RR 0 P\n13 > RR 0 P\n" +
                      (faulty ? "" : "13.5 < RR 0 F\n") + "20 > RR 0 P\n20.1 < RR 0 F\n");
     }},
    {&findings::directionAbsent,
     [](bool faulty) {
         return found(std::string("0 > RR 0 P\n10 > RR 0 P\n20 > RR 0 P\n30 > RR 0 P\n40 > RR 0 P\n") +
                      (faulty ? "" : "40.1 < RR 0 F\n"));
     }},
    {&findings::teiDenied,
     [](bool faulty) {
         return found(std::string("0 > sapi 63 UI = 0F 12 34 01 FF\n0.1 < sapi 63 UI = 0F 12 34 ") +
                      (faulty ? "03 FF\n" : "02 81\n"));
     }},
    {&findings::teiRemoved,
     [](bool faulty) {
         return found(std::string("0 < sapi 63 UI = 0F 00 00 ") + (faulty ? "06" : "04") + " 81\n");
     }},
    {&findings::teiDoubled,
     [](bool faulty) {
         return found(std::string("0 < sapi 63 UI = 0F 00 00 04 81\n0.1 > sapi 63 UI = 0F 11 11 05 81\n"
                                  "0.2 > sapi 63 UI = 0F 22 22 05 ") +
                      (faulty ? "81\n" : "83\n"));
     }},
    {&findings::teiAssigned,
     [](bool faulty) {
         return found(std::string("0 > sapi 63 UI = 0F 12 34 01 FF\n0.1 < sapi 63 UI = 0F 12 34 02 81\n"
                                  "1 > tei 64 SABME\n1.1 < tei 64 UA\n"
                                  "2 > tei 64 I 0 0 = 08 01 01 05 04 03 80 90 A3 18 ") +
                      (faulty ? "03 A9 83 81" : "01 81") + "\n2.1 < tei 64 RR 1\n");
     }},
    {&findings::roleContradicted,
     [](bool faulty) {
         CallScript script;
         script.at(0).linkUp().at(1000).raw(Side::us, !faulty, {0x00, 0x00, 0x08, 0x01, 0x01, 0x7B});
         return found(script);
     }},
    {&findings::boardRestarted,
     [](bool faulty) {
         CallScript script;
         script.at(100000).linkUp().at(faulty ? 200 : 100200).poll(Side::us);
         return found(script);
     }},
};

}  // namespace

std::span<const Scenario> linkScenarios() { return all; }

}  // namespace calls::test
