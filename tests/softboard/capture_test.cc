#include "softboard/capture.h"

#include <gtest/gtest.h>

#include <algorithm>

#include "capture/Directions.h"
#include "softboard/settings.h"
#include "tests/softboard/temp_file.h"

namespace softboard {
namespace {

using Octets = std::vector<uint8_t>;

// A pcap file, octet by octet; numbers are little-endian.
class PcapFile {
  public:
    explicit PcapFile(uint32_t linkType) {
        u32(0xa1b2c3d4).u32(0x00040002).u32(0).u32(0).u32(262144).u32(linkType);
    }

    PcapFile& frame(uint32_t seconds, uint32_t microseconds, const Octets& octets, uint32_t longer = 0) {
        const auto size = static_cast<uint32_t>(octets.size());
        u32(seconds).u32(microseconds).u32(size).u32(size + longer);
        data_.insert(data_.end(), octets.begin(), octets.end());
        return *this;
    }

    PcapFile& u32(uint32_t value) {
        for (int i = 0; i < 4; ++i) {
            data_ += static_cast<char>(value >> (8 * i));
        }
        return *this;
    }

    PcapFile& cut(size_t octets) {
        data_.resize(data_.size() - octets);
        return *this;
    }

    // Valid until the test program ends or the next file is written.
    std::string write() const {
        static const TempFile file(".pcap");
        return file.write(data_);
    }

  private:
    std::string data_;
};

// The pseudo-header of link type 177: packet type, hardware type, length and 8 octets of address, protocol.
Octets lapd(uint8_t packetType, const Octets& frame) {
    Octets octets;
    octets.reserve(16 + frame.size());
    for (const int octet : {0, int{packetType}, 0x20, 0, 0, 1, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0x30}) {
        octets.push_back(static_cast<uint8_t>(octet));
    }
    for (const uint8_t octet : frame) {
        octets.push_back(octet);
    }
    return octets;
}

std::string complaint(const std::string& path) {
    try {
        readCapture(path);
    } catch (const BadInput& error) {
        return error.what();
    }
    return "";
}

TEST(CaptureTest, ThePseudoHeaderTellsTheDirectionAndTimesCountFromTheFirstFrame) {
    const auto path = PcapFile(177)
                          .frame(1000, 500000, lapd(4, {0x00, 0x01, 0x7f}))
                          .frame(1000, 520000, lapd(0, {0x00, 0x01, 0x73}))
                          .frame(1002, 0, lapd(3, {0x02, 0x01, 0x01, 0x01}))
                          .write();
    EXPECT_EQ(readCapture(path), (Frames{{true, 0, {0x00, 0x01, 0x7f}},
                                         {false, 5, {0x00, 0x01, 0x73}},
                                         {false, 375, {0x02, 0x01, 0x01, 0x01}}}));
}

TEST(CaptureTest, AClockThatWasSetBackStandsStill) {
    const auto path =
        PcapFile(177).frame(1000, 0, lapd(4, {1})).frame(1001, 0, lapd(4, {2})).frame(5, 0, lapd(4, {3}));
    const Frames frames = readCapture(path.write());
    EXPECT_EQ(frames[1].ticks, 250U);
    EXPECT_EQ(frames[2].ticks, 250U);
}

TEST(CaptureTest, AFrameTooLongForTheDecoderIsPlayedAllTheSame) {
    EXPECT_EQ(readCapture(PcapFile(177).frame(0, 0, lapd(0, Octets(300, 0x55))).write())[0].octets.size(),
              300U);
}

TEST(CaptureTest, ABadFileIsRefusedWithItsPlaceAndTheReason) {
    struct {
        const char* says;
        PcapFile file;
        const char* reason;
    } const cases[] = {
        {"another link type", PcapFile(1).frame(0, 0, {1, 2, 3}),
         "link type 1 (EN10MB); a D-channel capture has 177 (LINUX_LAPD) or 203 (LAPD)"},
        {"no frame", PcapFile(177), "the capture holds no frame"},
        {"the header cut", PcapFile(177).cut(1), "truncated dump file"},
        {"the second frame cut", PcapFile(177).frame(0, 0, lapd(4, {1})).frame(0, 0, lapd(4, {1})).cut(3),
         "frame 2: truncated dump file"},
        {"a frame not captured whole", PcapFile(177).frame(0, 0, lapd(4, {1, 2}), 6),
         "frame 1: only 18 of its 24 octets were captured"},
        {"the pseudo-header cut", PcapFile(177).frame(0, 0, {0, 4, 0}), "frame 1: it has no octets"},
        {"nothing after the pseudo-header", PcapFile(177).frame(0, 0, lapd(4, {})),
         "frame 1: it has no octets"},
        {"an empty frame", PcapFile(203).frame(0, 0, {}), "frame 1: it has no octets"},
        {"a frame beyond all measure", PcapFile(203).frame(0, 0, {0, 1, 3}).frame(0, 0, Octets(65536, 0)),
         "frame 2: it has more than 65535 octets"},
    };
    for (const auto& c : cases) {
        const std::string path = c.file.write();
        const std::string expected = path + ": " + c.reason;  // the library's own words may go on
        EXPECT_EQ(complaint(path).substr(0, expected.size()), expected) << c.says;
    }
}

TEST(CaptureTest, AFileThatIsNoCaptureIsRefused) {
    EXPECT_EQ(complaint("/nowhere/day.pcap"), "/nowhere/day.pcap: No such file or directory");
    EXPECT_EQ(complaint("/dev/null"), "/dev/null: it is empty");
    EXPECT_EQ(complaint(LAPDMON_SOURCE_DIR "/CMakeLists.txt"),
              LAPDMON_SOURCE_DIR "/CMakeLists.txt: unknown file format");
    EXPECT_EQ(complaint("/"), "/: Is a directory");
}

TEST(CaptureTest, PcapngIsReadAsWell) {
    // Section header, interface of link type 203 with times in microseconds, one enhanced packet.
    PcapFile file(0);
    file.cut(24);
    file.u32(0x0a0d0d0a).u32(28).u32(0x1a2b3c4d).u32(1).u32(0xffffffff).u32(0xffffffff).u32(28);
    file.u32(1).u32(20).u32(203).u32(0).u32(20);
    file.u32(6).u32(36).u32(0).u32(0).u32(0).u32(3).u32(3).u32(0x007f0100).u32(36);
    EXPECT_EQ(readCapture(file.write()), (Frames{{true, 0, {0x00, 0x01, 0x7f}}}));
}

class ExampleTest : public testing::TestWithParam<const char*> {
  protected:
    Frames frames_ = readCapture(std::string(LAPDMON_SOURCE_DIR "/examples/") + GetParam() + ".pcap");

    // Whether some frame's layer-3 message has the type, its call reference the length 2, in the direction.
    bool hasMessage(uint8_t type, bool transmitted) const {
        return std::any_of(frames_.begin(), frames_.end(), [&](const Frame& frame) {
            const Octets& o = frame.octets;
            return frame.transmitted == transmitted && o.size() > 8 && (o[2] & 1) == 0 && o[5] == 2 &&
                   o[8] == type;
        });
    }
    bool hasFrame(size_t octet, uint8_t value) const {
        return std::any_of(frames_.begin(), frames_.end(), [&](const Frame& frame) {
            return frame.octets.size() > octet && frame.octets[octet] == value;
        });
    }
};

TEST_P(ExampleTest, HasTheEventsOfATrunksDay) {
    EXPECT_TRUE(hasFrame(2, 0x7f)) << "the link is established";
    EXPECT_TRUE(hasFrame(2, 0x73)) << "and that is acknowledged";
    EXPECT_TRUE(hasFrame(1, 0xff)) << "TEI management";
    for (const bool transmitted : {false, true}) {
        EXPECT_TRUE(hasMessage(0x05, transmitted)) << "a call begins";
        EXPECT_TRUE(hasMessage(0x07, transmitted)) << "a call is answered";
        EXPECT_TRUE(hasMessage(0x5a, transmitted)) << "a call is over";
    }
    EXPECT_TRUE(hasMessage(0x46, false) || hasMessage(0x46, true)) << "restart";
    EXPECT_TRUE(hasMessage(0x62, false)) << "facility";
}

TEST_P(ExampleTest, TheDirectionsAreThoseThatTheFramesThemselvesTell) {
    capture::Directions directions;
    for (size_t i = 0; i < frames_.size(); ++i) {
        EXPECT_EQ(directions.isTransmitted(frames_[i].octets), frames_[i].transmitted) << "frame " << i + 1;
    }
}

INSTANTIATE_TEST_SUITE_P(All, ExampleTest, testing::Values("4ess", "5ess", "dms100", "ntt", "net5", "ni2"),
                         [](const auto& example) { return "Of" + std::string(example.param); });

TEST(BuiltinTest, TheBuiltinCaptureIsTheNet5Example) {
    EXPECT_EQ(builtinFrames(), readCapture(LAPDMON_SOURCE_DIR "/examples/net5.pcap"));
}

TEST(BuiltinTest, ACallBeginsWithinASecond) {
    const auto& frames = builtinFrames();
    const auto setup = std::find_if(frames.begin(), frames.end(), [](const Frame& frame) {
        return frame.octets.size() > 8 && (frame.octets[2] & 1) == 0 && frame.octets[8] == 0x05;
    });
    ASSERT_NE(setup, frames.end());
    EXPECT_LT(setup->ticks, 250U);
}

}  // namespace
}  // namespace softboard
