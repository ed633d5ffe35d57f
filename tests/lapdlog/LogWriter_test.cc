#include "lapdlog/LogWriter.h"

#include <gtest/gtest.h>

#include <random>

#include "capture/writers.h"
#include "tests/capture/writing.h"
#include "tests/lapdlog/logs.h"

namespace lapdlog {
namespace {

using namespace testing;
using capture::testing::MemoryFile;
using capture::testing::WrittenFile;

class LogWriterTest : public ::testing::Test {
  protected:
    LogWriterTest() {
        setenv("TZ", "UTC", 1);
        tzset();
    }
};

// What a writer makes of the items of an input.
template <typename Make>
std::string written(const std::string& path, Make make) {
    std::vector<capture::Form> known(capture::forms().begin(), capture::forms().end());
    known.push_back(logForm);
    const auto reader = capture::openReader(path, {}, known);
    const WrittenFile file;
    const auto writer = make(file.descriptor(), "written");
    capture::Item item;
    while (reader->next(item) == capture::Reader::Next::item)
        writer->write(item);
    writer->finish();
    return file.content();
}

auto toLog = [](int file, const std::string& name) { return makeLogWriter(file, name); };

std::string logAgain(const std::string& log) { return written(MemoryFile(log).path(), toLog); }
std::string throughPcapng(const std::string& log) {
    return written(MemoryFile(written(MemoryFile(log).path(), capture::makePcapngWriter)).path(), toLog);
}

// Frames as they come: any octets, mostly with the header of an I frame.
std::string randomLog(unsigned seed, int swit) {
    std::mt19937 random(seed);
    const auto below = [&](unsigned limit) { return static_cast<unsigned>(random() % limit); };
    std::string log;
    unsigned ticks = below(2) == 0 ? below(1000) : 4'294'960'000U + below(1000);
    for (int i = 0; i < 200; ++i) {
        Octets octets(below(8) == 0 ? below(300) : below(40));
        for (std::uint8_t& octet : octets)
            octet = static_cast<std::uint8_t>(below(4) == 0 ? "\n HexDump:0123456789"[below(20)]
                                                            : static_cast<char>(below(256)));
        constexpr std::array<std::uint8_t, 9> beginning{0x02, 0x01, 0x00, 0x00, 0x08, 0x02, 0x00, 0x01, 0x05};
        if (below(4) != 0)
            std::copy_n(beginning.begin(), std::min(beginning.size(), octets.size()), octets.begin());
        ticks += below(100);
        log += textOf(below(2) == 0, ticks, octets, swit);
        if (below(20) == 0)
            log += std::array{"Enqueue Failed \n", "Get iemsg failed \n",
                              "Frames Lost: 4294967296 \n"}[below(3)];
    }
    return log;
}

TEST_F(LogWriterTest, ALogOfRandomFramesComesBackOctetByOctet) {
    constexpr std::pair<const char*, int> variants[] = {{"4ESS", 1}, {"5ESS", 2}, {"DMS100", 3},
                                                        {"NTT", 4},  {"NET5", 7}, {"NI2", 10}};
    for (unsigned seed = 0; seed < 60; ++seed) {
        const auto& [line, swit] = variants[seed % std::size(variants)];
        const std::string log = headText + line + " Switch \n" + randomLog(seed, swit);
        ASSERT_EQ(logAgain(log), log) << seed;
        ASSERT_EQ(throughPcapng(log), log) << seed;
    }
}

TEST_F(LogWriterTest, ItemsBetweenFramesComeBack) {
    const std::string log = net5Head + "Frames Lost: 3 \n" + textOf(true, 1, sabme) +
                            textOf(false, 2, Octets(258, 0)) + "Enqueue Failed \nFrames Lost: 9 \n" +
                            headText + "NI2 Switch \n" + textOf(false, 1, setup, 10) + "Get iemsg failed \n";
    EXPECT_EQ(logAgain(log), log);
    EXPECT_EQ(throughPcapng(log), log);
}

TEST_F(LogWriterTest, APieceOfALogWithoutAHeadGetsNone) {
    const std::string log = textOf(true, 1, sabme) + textOf(false, 2, setup);
    EXPECT_EQ(logAgain(log), log);
    EXPECT_EQ(throughPcapng(log), log);
}

TEST_F(LogWriterTest, AHeadWithoutVariantGetsNone) {
    EXPECT_EQ(throughPcapng(headText + textOf(true, 1, sabme)), headText + textOf(true, 1, sabme));
}

TEST_F(LogWriterTest, LinesThatProveNothingAreLeftOut) {
    EXPECT_EQ(
        logAgain(net5Head + "rubbish\n" + textOf(true, 1, sabme) + textOf(false, 2, setup).substr(0, 100)),
        net5Head + textOf(true, 1, sabme));
}

TEST_F(LogWriterTest, FramesOfACaptureGetAHeadAndTicksFromTheFirst) {
    const std::string lines =
        "TX 2026-11-21T11:25:33Z 00017f\nRX 2026-11-21T11:25:34.0065Z 000173\nRX 2026-11-21T11:25:32Z "
        "000173\n";
    EXPECT_EQ(written(MemoryFile(lines).path(), toLog),
              net5Head + textOf(true, 0, sabme) + textOf(false, 252, ua, 7, "Sat Nov 21 11:25:34 2026") +
                  textOf(false, 252, ua, 7, "Sat Nov 21 11:25:32 2026"));
}

}  // namespace
}  // namespace lapdlog
