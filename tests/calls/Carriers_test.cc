#include "calls/Carriers.h"

#include <gtest/gtest.h>

#include <map>
#include <random>
#include <string>

#include "calls/Analysis.h"
#include "tests/calls/CallScript.h"

namespace calls::test {
namespace {

namespace type = isdn::message;

// Writes the call of each frame: "5 of 1", "6 of none". A star marks frames that carried what was heard of
// others.
class Owners : public Listener {
  public:
    void heard(const Message& message, const Call* call) override { put(message, call, ""); }
    void carried(const Message& message, const Call* call) override { put(message, call, "*"); }
    std::string of(const CallScript& script) {
        Analysis analysis({}, *this);
        std::uint64_t number = 0;
        for (const Sent& sent : script.frames())
            analysis.take(sent.frame, ++number);
        analysis.finish();
        std::string lines;
        for (const auto& [frame, owner] : owners_)
            lines += std::to_string(frame) + " of " + owner + "\n";
        return lines;
    }
    std::map<std::uint64_t, std::string> owners_;
    bool twice = false;

  private:
    void put(const Message& message, const Call* call, const char* mark) {
        const std::string owner = (call == nullptr ? "none" : std::to_string(call->number)) + mark;
        twice = !owners_.emplace(message.number, owner).second || twice;
    }
};

// A frame of the script once more, octet by octet.
void again(CallScript& script, std::size_t number) {
    const Sent& sent = script.frames()[number - 1];
    const bool isCommand = true;
    std::vector<std::uint8_t> rest(sent.octets.begin() + 2, sent.octets.end());
    const Side from = sent.frame.transmitted ? Side::us : Side::peer;
    script.raw(from, isCommand, {});
    Sent& copy = const_cast<Sent&>(script.frames().back());
    copy.octets.insert(copy.octets.end(), rest.begin(), rest.end());
    copy.frame.octets = copy.octets;
}

TEST(Carriers, ACopyThatLayerTwoDropsBelongsToTheCallOfTheFirst) {
    CallScript script;
    script.peer(type::setup, 5, false, {bearerSpeech(), channel(1)});
    again(script, 1);
    EXPECT_EQ(Owners().of(script), "1 of 1\n2 of 1*\n");
}

TEST(Carriers, ASetupBehindAHoleBelongsToTheCallThatItsRepetitionBegins) {
    // The frame in front of the SETUP was lost on the line: REJ asks for both.
    CallScript lossy;
    lossy.raw(Side::us, true, {0x7F}).raw(Side::peer, false, {0x73});
    lossy.raw(Side::peer, true, {0x02, 0x00, 0x08, 0x02, 0x00, 0x05, 0x05, 0x04, 0x03, 0x80, 0x90, 0xA3});
    lossy.raw(Side::us, false, {0x09, 0x00});
    lossy.raw(Side::peer, true, {0x00, 0x00, 0x08, 0x02, 0x00, 0x00, 0x6E});
    lossy.raw(Side::peer, true, {0x02, 0x00, 0x08, 0x02, 0x00, 0x05, 0x05, 0x04, 0x03, 0x80, 0x90, 0xA3});
    EXPECT_EQ(Owners().of(lossy), "3 of 1*\n5 of none\n6 of 1\n");
}

TEST(Carriers, ASetupThatLayerTwoDropsBelongsToNoCallThatHasEnded) {
    const std::initializer_list<std::uint8_t> setup{0x06, 0x02, 0x08, 0x02, 0x00, 0x05,
                                                    0x05, 0x04, 0x03, 0x80, 0x90, 0xA3};
    const std::initializer_list<std::uint8_t> notify{0x04, 0x02, 0x08, 0x02, 0x00, 0x00, 0x6E};
    CallScript script;
    script.raw(Side::us, true, {0x7F}).raw(Side::peer, false, {0x73});
    script.raw(Side::peer, true, {0x00, 0x00, 0x08, 0x02, 0x00, 0x05, 0x05, 0x04, 0x03, 0x80, 0x90, 0xA3});
    script.raw(Side::us, true, {0x00, 0x02, 0x08, 0x02, 0x80, 0x05, 0x5A});
    // The frame with N(S) 1 was lost on the line. What comes between REJ and its repetition is dropped.
    script.raw(Side::peer, true, notify);
    script.raw(Side::us, false, {0x09, 0x02});
    script.raw(Side::peer, true, setup);
    script.raw(Side::peer, true, {0x02, 0x02, 0x08, 0x02, 0x00, 0x00, 0x6E});
    script.raw(Side::peer, true, notify);
    script.raw(Side::peer, true, setup);
    EXPECT_EQ(Owners().of(script), "3 of 1\n4 of 1\n5 of none*\n7 of 2*\n8 of none\n9 of none\n10 of 2\n");
}

TEST(Carriers, SegmentsBelongToTheCallOfTheWholeMessage) {
    // A SETUP in two segments (Q.931 annex H): the header of each names the whole message's type.
    CallScript script;
    script.peer(type::segment, 5, false, {{0x00, 0x02, 0x81, 0x05}, {0x04, 0x03, 0x80, 0x90, 0xA3}});
    script.peer(type::segment, 5, false, {{0x00, 0x02, 0x00, 0x05}, {0x18, 0x03, 0xA9, 0x83, 0x81}});
    EXPECT_EQ(Owners().of(script), "1 of 1*\n2 of 1\n");
}

TEST(Carriers, SegmentsThatAreNeverCompletedBelongToNoCall) {
    CallScript script;
    script.peer(type::segment, 5, false, {{0x00, 0x02, 0x81, 0x05}, {0x04, 0x03, 0x80, 0x90, 0xA3}});
    EXPECT_EQ(Owners().of(script), "1 of none*\n");
}

TEST(Carriers, ReportsEachFrameThatCarriesAMessageOnceWhateverTheFramesAre) {
    for (unsigned seed = 1; seed <= 300; ++seed) {
        std::mt19937 random(seed);
        CallScript script;
        std::size_t carrying = 0;
        // Fewer than may wait, and in less time than they wait.
        for (int i = 0; i < 60; ++i) {
            script.at(i * 20);
            const Side from = random() % 2 == 0 ? Side::us : Side::peer;
            const auto ns = static_cast<std::uint8_t>((random() % 8) << 1);
            const auto nr = static_cast<std::uint8_t>((random() % 8) << 1);
            const std::uint8_t types[] = {type::setup,      type::callProceeding,    type::connect,
                                          type::disconnect, type::release,           type::releaseComplete,
                                          type::segment,    type::restartAcknowledge};
            const auto reference = static_cast<std::uint8_t>((random() % 3) | (random() % 2 << 7));
            switch (random() % 6) {
                case 0:
                    script.raw(from, true, {0x7F});
                    break;
                case 1:
                    script.raw(from, false, {0x73});
                    break;
                case 2:
                    script.raw(from, random() % 2 == 0,
                               {static_cast<std::uint8_t>(random() % 2 == 0 ? 9 : 1), nr});
                    break;
                default:
                    ++carrying;
                    script.raw(from, true,
                               {ns, nr, 0x08, 0x01, reference, types[random() % 8], 0x00, 0x02,
                                static_cast<std::uint8_t>(random() % 2 == 0 ? 0x81 : 0x00), 0x05});
            }
        }
        Owners owners;
        owners.of(script);
        EXPECT_FALSE(owners.twice) << "seed " << seed;
        EXPECT_EQ(owners.owners_.size(), carrying) << "seed " << seed;
    }
}

}  // namespace
}  // namespace calls::test
