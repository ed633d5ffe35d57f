// Compares what tshark reads in the captures that are written.
#include <gtest/gtest.h>

#include <array>
#include <cstdio>
#include <cstdlib>
#include <memory>

#include "capture/time_text.h"
#include "capture/writers.h"
#include "tests/capture/reading.h"
#include "tests/capture/writing.h"

namespace capture {
namespace {

using testing::Folder;

bool isThere() { return std::system("tshark -v >/dev/null 2>&1") == 0; }

struct ClosePipe {
    void operator()(std::FILE* pipe) const { pclose(pipe); }
};

// The output of a command.
std::string outputOf(const std::string& command) {
    const std::unique_ptr<std::FILE, ClosePipe> pipe(popen((command + " 2>/dev/null").c_str(), "r"));
    std::string output;
    std::array<char, 4096> piece{};
    for (std::size_t size = 0; (size = std::fread(piece.data(), 1, piece.size(), pipe.get())) > 0;)
        output.append(piece.data(), size);
    return output;
}

std::string fieldsIn(const std::string& path, const std::string& fields) {
    std::string command = "TZ=UTC tshark -n -r '" + path + "' -T fields -E separator=' ' -E aggregator=/";
    for (std::size_t at = 0; at < fields.size();
         at = fields.find(' ', at) == std::string::npos ? fields.size() : fields.find(' ', at) + 1)
        command += " -e " + fields.substr(at, fields.find(' ', at) - at);
    return outputOf(command);
}

// Items of an example, as if our side had the role.
template <typename Make>
std::string rewrite(const Folder& folder, const std::string& example, Role role, Make make,
                    std::string& expected) {
    const std::string path = folder.write("written", "");
    std::FILE* const file = std::fopen(path.c_str(), "w");
    const auto writer = make(fileno(file), path);
    const auto reader = openReader(example, {}, forms());
    Item item;
    while (reader->next(item) == Reader::Next::item) {
        item.frame.role = role;
        writer->write(item);
        // 0: from user to network.
        const bool fromUser = item.frame.transmitted == (role == Role::user);
        expected += std::to_string(item.frame.place.number) + " " +
                    toText({Clock::relative, item.frame.time}) + (fromUser ? " 0 " : " 1 ") +
                    std::to_string(item.frame.octets.size()) + " \n";
    }
    writer->finish();
    (void)std::fclose(file);
    return path;
}

class SecondOpinion : public ::testing::TestWithParam<std::tuple<const char*, Role>> {};

TEST_P(SecondOpinion, OnPcapngAgreesInOrderTimeDirectionAndLength) {
    if (!isThere())
        GTEST_SKIP() << "tshark is not installed";
    const auto [name, role] = GetParam();
    const Folder folder;
    std::string expected;
    const std::string path = rewrite(folder, LAPDMON_SOURCE_DIR "/examples/" + std::string(name) + ".pcap",
                                     role, makePcapngWriter, expected);
    EXPECT_EQ(fieldsIn(path, "frame.number frame.time_epoch lapd.direction frame.len _ws.malformed"),
              expected);
}

INSTANTIATE_TEST_SUITE_P(All, SecondOpinion,
                         ::testing::Combine(::testing::Values("4ess", "5ess", "dms100", "ntt", "net5", "ni2"),
                                            ::testing::Values(Role::user, Role::network)),
                         [](const auto& of) {
                             return "Of" + std::string(std::get<0>(of.param)) +
                                    (std::get<1>(of.param) == Role::user ? "AsUser" : "AsNetwork");
                         });

TEST(SecondOpinionOnPcap, AgreesInOrderTimeDirectionAndLength) {
    if (!isThere())
        GTEST_SKIP() << "tshark is not installed";
    const Folder folder;
    std::string expected;
    const std::string path =
        rewrite(folder, LAPDMON_SOURCE_DIR "/examples/net5.pcap", Role::network, makePcapWriter, expected);
    EXPECT_EQ(fieldsIn(path, "frame.number frame.time_epoch lapd.direction frame.len _ws.malformed"),
              expected);
}

TEST(SecondOpinionOnNotes, ShowsNamesFlagsDropsAndComments) {
    if (!isThere())
        GTEST_SKIP() << "tshark is not installed";
    const Interface trunk{"trunk1", Variant::net5};
    const Folder folder;
    const std::string path = folder.write("written", "");
    std::FILE* const file = std::fopen(path.c_str(), "w");
    const auto writer = makePcapngWriter(fileno(file), path);
    const testing::Octets sabme{0x00, 0x01, 0x7f};
    Item frame = testing::frameOf(trunk, true, 1'795'260'333'300'000'004, sabme);
    frame.frame.ticks = 75;
    writer->write(testing::itemOf(trunk, Item::Kind::lost, 17));
    writer->write(frame);
    writer->write(testing::itemOf(trunk, Item::Kind::lost, 3));
    writer->finish();
    (void)std::fclose(file);
    EXPECT_EQ(fieldsIn(path,
                       "frame.time_epoch frame.interface_name frame.interface_description "
                       "frame.packet_flags_direction frame.comment"),
              "1795260333.300000004 trunk1 KV9 D channel, variant net5 0x00000002 "
              "lapdmon: Frames Lost: 17\\lapdmon: ticks 75\n");
    EXPECT_EQ(outputOf("tshark -r '" + path + "' -Y 'frame.drop_count == 17' -T fields -e frame.number"),
              "1\n");
    EXPECT_NE(outputOf("capinfos '" + path + "'").find("Number of stat entries = 1"), std::string::npos);
}

}  // namespace
}  // namespace capture
