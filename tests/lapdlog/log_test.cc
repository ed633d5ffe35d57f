#include "lapdlog/log.h"

#include <gtest/gtest.h>

#include "tests/lapdlog/logs.h"

namespace lapdlog {
namespace {

using namespace testing;

class LogTest : public ::testing::Test {
  protected:
    LogTest() {
        setenv("TZ", "UTC", 1);
        tzset();
    }
};

// The second that textOf's date is.
const std::string then = "1795260333000ms";

TEST_F(LogTest, FramesAreReadWithTheirTicksAndTimes) {
    EXPECT_EQ(itemsIn(net5Head + textOf(true, 250, sabme) + textOf(false, 251, ua)),
              "run 1 net5\n"
              "frame 7 TX 1795260333000ms t250 w1795260333 00017f\n"
              "frame 15 RX 1795260333004ms t251 w1795260333 000173\n");
}

TEST_F(LogTest, AHeadMayLackTheVariant) {
    EXPECT_EQ(itemsIn(headText), "run 1 \n");
    EXPECT_EQ(itemsIn(headText + "Enqueue Failed \n"), "run 1 \nnotQueued 5\n");
}

TEST_F(LogTest, EachVariantHasItsLine) {
    for (const auto& [line, name] : {std::pair("4ESS", "4ess"),
                                     {"5ESS", "5ess"},
                                     {"DMS100", "dms100"},
                                     {"NTT", "ntt"},
                                     {"NET5", "net5"},
                                     {"NI2", "ni2"}})
        EXPECT_EQ(itemsIn(headText + line + " Switch \n"), "run 1 " + std::string(name) + "\n");
}

TEST_F(LogTest, TheRecordersOwnLinesAreItems) {
    EXPECT_EQ(
        itemsIn(net5Head + "Enqueue Failed \nFrames Lost: 17 \nGet iemsg failed \n" + textOf(false, 1, ua)),
        "run 1 net5\nnotQueued 6\nlost 7 x17\nnotTaken 8\nframe 10 RX " + then + " t1 w1795260333 000173\n");
}

TEST_F(LogTest, AnOversizedFrameHasNoOctets) {
    for (const bool transmitted : {false, true}) {
        EXPECT_EQ(itemsIn(net5Head + textOf(transmitted, 1, Octets(258, 0x55)) + textOf(false, 1, ua)),
                  "run 1 net5\noversized 7 " + std::string(transmitted ? "TX " : "RX ") + then +
                      " t1 w1795260333 \n" + "frame 12 RX " + then + " t1 w1795260333 000173\n");
    }
}

TEST_F(LogTest, FramesOfAnyLengthAreRead) {
    std::string text = net5Head;
    for (const std::size_t size : {0U, 1U, 2U, 9U, 10U, 11U, 20U, 30U, 256U, 257U}) {
        for (const bool transmitted : {false, true})
            text += textOf(transmitted, 7, Octets(size, 0x05));
    }
    const std::string items = itemsIn(text);
    EXPECT_EQ(std::count(items.begin(), items.end(), '\n'), 21) << items;
    EXPECT_EQ(items.find("unproved"), std::string::npos);
    EXPECT_EQ(items.find("cut"), std::string::npos);
}

// What a transfer between systems makes of a log: each line feed gets a carriage return in front of it.
std::string withDosLineEnds(const std::string& text) {
    std::string changed;
    for (const char c : text)
        changed += c == '\n' ? std::string("\r\n") : std::string(1, c);
    return changed;
}

TEST_F(LogTest, DosLineEndsAreReadAsLineFeeds) {
    const std::string log =
        net5Head + textOf(true, 250, sabme) + "Frames Lost: 3 \n" + textOf(false, 251, ua);
    EXPECT_EQ(itemsIn(withDosLineEnds(log)), itemsIn(log));
    EXPECT_EQ(itemsIn("\xef\xbb\xbf" + withDosLineEnds(log)), itemsIn(log));
    const std::string piece = textOf(false, 1, setup) + textOf(false, 2, ua);
    EXPECT_EQ(itemsIn(withDosLineEnds(piece)), itemsIn(piece));
}

TEST_F(LogTest, ALogWithDosLineEndsIsReadWhereverAReadEnds) {
    std::string log = net5Head;
    while (log.size() < 1'200'000)
        log += textOf(false, 251, ua) + textOf(true, 252, setup);
    const std::string dos = withDosLineEnds(log);
    for (std::size_t cut = 0; cut < 4; ++cut) {
        const std::string same = "x" + std::string(cut, 'x') + "\n";
        EXPECT_EQ(itemsIn(withDosLineEnds(same) + dos), itemsIn(same + log)) << cut;
    }
}

TEST_F(LogTest, ALogWithDosLineEndsMayEndAnywhere) {
    const std::string dos = withDosLineEnds(net5Head + textOf(false, 1, ua));
    for (std::size_t size = net5Head.size() + 10; size < dos.size(); ++size)
        EXPECT_TRUE(itemsIn(dos.substr(0, size)).starts_with("run 1 net5\n")) << size;
}

// A SETUP with a DISPLAY of this text.
Octets displaying(std::string_view text) {
    Octets octets{
        0x02, 0x01, 0x00, 0x00, 0x08, 0x02, 0x00, 0x01, 0x05, 0x28, static_cast<std::uint8_t>(text.size())};
    octets.insert(octets.end(), text.begin(), text.end());
    return octets;
}

TEST_F(LogTest, DosLineEndsInADisplayTextAreTheTexts) {
    const std::string log = net5Head + textOf(false, 1, displaying("a\r\nb")) + textOf(false, 2, ua);
    EXPECT_EQ(itemsIn(log).find("unproved"), std::string::npos);
    EXPECT_EQ(itemsIn(withDosLineEnds(log)), itemsIn(log));
}

TEST_F(LogTest, ADisplayThatImitatesAFrameIsText) {
    const std::string imitation = "x\nHex Dump: \n00 01 7f \n" + textOf(false, 9, {0x02});
    for (const bool transmitted : {false, true}) {
        const std::string items =
            itemsIn(net5Head + textOf(transmitted, 1, displaying(imitation)) + textOf(false, 2, ua));
        EXPECT_EQ(std::count(items.begin(), items.end(), '\n'), 3) << items;
        EXPECT_NE(items.find("RX 1795260333004ms t2 w1795260333 000173"), std::string::npos) << items;
    }
    EXPECT_EQ(itemsIn(net5Head + textOf(false, 1, displaying("\n\nFrames Lost: 9 \nEnqueue Failed \n")) +
                      "Frames Lost: 3 \n")
                  .find("lost 6"),
              std::string::npos);
}

TEST_F(LogTest, ADumpInADisplayTextDoesNotHideTheFramesDump) {
    std::string dumps;
    while (dumps.size() + 12 < 240)
        dumps += "Hex Dump: \n";
    const std::string items = itemsIn(net5Head + textOf(false, 1, displaying(dumps)) + textOf(false, 2, ua));
    EXPECT_EQ(std::count(items.begin(), items.end(), '\n'), 3) << items;
    EXPECT_EQ(items.find("unproved"), std::string::npos) << items;
}

TEST_F(LogTest, TextThatItsDumpDoesNotSayIsUnproved) {
    std::string bad = textOf(false, 1, setup);
    bad.replace(bad.find("SETUP"), 5, "SETUQ");
    EXPECT_EQ(itemsIn(net5Head + bad + textOf(false, 2, ua)),
              "run 1 net5\n"
              "unproved 7 x" +
                  std::to_string(std::count(bad.begin(), bad.end(), '\n')) +
                  " \"the text of this frame is not what its dump says\"\n"
                  "frame " +
                  std::to_string(7 + std::count(bad.begin(), bad.end(), '\n')) +
                  " RX 1795260333000ms t2 w1795260333 000173\n");
}

TEST_F(LogTest, TwoBadFramesAreTwoItems) {
    std::string bad = textOf(false, 1, ua);
    bad.replace(bad.find("TEI=0x00"), 8, "TEI=0x01");
    const std::string items = itemsIn(net5Head + bad + bad);
    EXPECT_EQ(items,
              "run 1 net5\n"
              "unproved 7 x8 \"the text of this frame is not what its dump says\"\n"
              "cut 15 RX t1 w1795260333  \"the log ends within this frame\"\n");
}

TEST_F(LogTest, LinesThatLapdmonCannotHaveWrittenAreCounted) {
    EXPECT_EQ(itemsIn(net5Head + "one\ntwo\n\nthree\n" + textOf(false, 2, ua) + "four"),
              "run 1 net5\n"
              "unproved 6 x4 \"these lines are none that the recorder writes\"\n"
              "frame 11 RX 1795260333000ms t2 w1795260333 000173\n"
              "unproved 18 x1 \"these lines are none that the recorder writes\"\n");
}

TEST_F(LogTest, AHeaderMustBeOneThatTheDecoderWrites) {
    const std::string good = textOf(false, 75, ua);
    for (const auto& [from, to] : {std::pair("0.300", "00.300"),
                                   {"0.300", "0.301"},
                                   {"0.300", "0.1000"},
                                   {"0.300", "17179869.184"},
                                   {"Sat", "Sun"},
                                   {"Nov 21", "Nov 31"},
                                   {"11:25:33", "24:25:33"},
                                   {"11:25:33", "11:25:61"},
                                   {"Nov 21", "Nov 1 "},
                                   {"RX", "TX"},
                                   {"Nov", "nov"}}) {
        std::string bad = good;
        bad.replace(bad.find(from), std::string_view(from).size(), to);
        const std::string items = itemsIn(net5Head + bad);
        EXPECT_NE(items.find("unproved"), std::string::npos) << to << items;
    }
}

TEST_F(LogTest, TheLastFrameMayBeCut) {
    const std::string text = textOf(false, 1, setup);
    const std::string cut = text.substr(0, text.size() - 9);
    EXPECT_EQ(itemsIn(net5Head + textOf(true, 1, sabme) + cut),
              "run 1 net5\n"
              "frame 7 TX 1795260333000ms t1 w1795260333 00017f\n"
              "cut 15 RX t1 w1795260333 020100000802000105040380"
              "90a31803a9839e7003"
              " \"the log ends within this frame\"\n");
}

TEST_F(LogTest, ALogCutAnywhereGivesTheFramesThatAreWhole) {
    const std::string whole = net5Head + textOf(true, 1, sabme) + textOf(false, 2, tenOctets) +
                              "Frames Lost: 3 \n" + textOf(false, 3, setup) +
                              textOf(true, 4, Octets(258, 1)) + textOf(false, 5, ua);
    const std::string all = itemsIn(whole);
    for (std::size_t size = net5Head.size(); size < whole.size(); ++size) {
        const std::string items = itemsIn(whole.substr(0, size));
        // Frames that are whole are read as in the whole log; the rest gives one item, or none.
        const std::size_t last = items.rfind('\n', items.size() - 2);
        const std::string before = items.substr(0, last == std::string::npos ? 0 : last + 1);
        EXPECT_TRUE(all.starts_with(before)) << size << "\n" << items;
    }
}

TEST_F(LogTest, ALogThatBeginsAnywhereIsReadFromItsFirstWholeFrame) {
    const std::string frames = textOf(true, 1, sabme) + textOf(false, 2, setup) + textOf(false, 3, ua);
    for (std::size_t begin = 1; begin < frames.size() - textOf(false, 3, ua).size(); ++begin) {
        const std::string items = itemsIn(frames.substr(begin));
        EXPECT_TRUE(items.ends_with(" RX 1795260333004ms t3 w1795260333 000173\n") ||
                    items.ends_with(" RX 1795260333000ms t3 w1795260333 000173\n"))
            << begin << "\n"
            << items;
    }
}

TEST_F(LogTest, WithoutAHeadTheVariantIsTheOneThatFits) {
    const std::string ni2 = textOf(false, 1, ua, 10) + textOf(false, 2, setup, 10);
    const std::string net5 = textOf(false, 1, ua, 7) + textOf(false, 2, setup, 7);
    EXPECT_TRUE(itemsIn(ni2).starts_with(
        "comment 1 \"the log has no head, and its text fits several variants (5ess, ni2); 5ess is taken\"\n"))
        << itemsIn(ni2);
    EXPECT_TRUE(
        itemsIn(net5).starts_with("comment 1 \"the log has no head, and its text fits several variants "
                                  "(4ess, dms100, ntt, net5); net5 is taken\"\n"))
        << itemsIn(net5);
    EXPECT_EQ(itemsIn(ni2, {.variant = capture::Variant::ni2}).substr(0, 7), "frame 2");
}

TEST_F(LogTest, ATextOfAnotherVariantIsSaid) {
    const std::string items = itemsIn(net5Head + textOf(false, 1, ua) + textOf(false, 2, setup, 2));
    EXPECT_NE(items.find("comment 14 \"from here on the text is that of a trunk of variant 5ess\"\nframe 15"),
              std::string::npos)
        << items;
}

TEST_F(LogTest, TimeLinesWithoutEndAreReadInTheirTime) {
    std::string text = net5Head;
    for (int i = 0; i < 50'000; ++i)
        text += "\nSat Nov 21 11:25:33 2026\nRX Frame: Time = 0.300\n";
    const std::string items = itemsIn(text);
    EXPECT_EQ(std::count(items.begin(), items.end(), '\n'), 50'001);
}

TEST_F(LogTest, TicksThatFallAreARestart) {
    EXPECT_EQ(itemsIn(net5Head + textOf(false, 500, ua) + textOf(false, 498, ua) + textOf(false, 100, ua)),
              "run 1 net5\n"
              "frame 7 RX 1795260333000ms t500 w1795260333 000173\n"
              "frame 15 RX 1795260332992ms t498 w1795260333 000173\n"
              "restart 22 \"the board's time stamps begin anew\"\n"
              "frame 23 RX 1795260333000ms t100 w1795260333 000173\n");
}

TEST_F(LogTest, TicksThatWrapGoOn) {
    EXPECT_EQ(itemsIn(net5Head + textOf(false, 4294967295U, ua) + textOf(false, 1, ua)),
              "run 1 net5\n"
              "frame 7 RX 1795260333000ms t4294967295 w1795260333 000173\n"
              "frame 15 RX 1795260333008ms t1 w1795260333 000173\n");
}

TEST_F(LogTest, TwoTracesInOneFileAreSaidOnce) {
    std::string text = net5Head;
    for (unsigned i = 0; i < 3; ++i)
        text += textOf(false, 1000 + i, ua) + textOf(false, 900000 + i, ua);
    const std::string items = itemsIn(text);
    EXPECT_EQ(items.find("restart"), std::string::npos) << items;
    const std::size_t first =
        items.find("mixed 22 \"time stamps of two traces alternate; frames of both are read\"\n");
    EXPECT_NE(first, std::string::npos) << items;
    EXPECT_EQ(items.find("mixed", first + 1), std::string::npos) << items;
}

TEST_F(LogTest, ASecondHeadIsANewRun) {
    EXPECT_EQ(
        itemsIn(net5Head + textOf(false, 500, ua) + headText + "NI2 Switch \n" + textOf(false, 1, setup, 10))
            .substr(0, 90),
        std::string(
            "run 1 net5\nframe 7 RX 1795260333000ms t500 w1795260333 000173\nrun 14 ni2\nframe 20 RX 1795260")
            .substr(0, 90));
}

}  // namespace
}  // namespace lapdlog
