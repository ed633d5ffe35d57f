// The files that a shipper reads and writes: its configuration and its places; and its command line.
#include <gtest/gtest.h>

#include <fstream>
#include <iterator>

#include "Recordings.h"
#include "fleet/ship/DiskWatch.h"
#include "fleet/ship/Place.h"
#include "fleet/ship/ShipConfig.h"
#include "fleet/ship/command_line.h"

namespace {

using fleet::BadConfig;
using fleet::Place;
using fleet::ShipCommand;
using fleet::ShipConfig;

class ShipFiles : public testing::Test {
  protected:
    std::string write(const std::string& text) const {
        std::ofstream(folder_.file("f")) << text;
        return folder_.file("f");
    }
    ShipConfig read(const std::string& text) const { return fleet::readShipConfig(write(text)); }

    fleet_tests::Folder folder_;
};

TEST_F(ShipFiles, APlaceIsReadAsItWasWritten) {
    Place place{1795260333000001, 17, true, recording::RecordedLog{"x.log", 1, 2, -3, 4, "00017f"}};
    ASSERT_FALSE(fleet::writePlace(place, "london/h1/0/1", folder_.file("p"), recording::Durability::onDisk));
    const auto read = fleet::readPlace(folder_.file("p"));
    ASSERT_TRUE(read);
    EXPECT_EQ(read->run, place.run);
    EXPECT_EQ(read->next, 17U);
    EXPECT_TRUE(read->isEnded);
    ASSERT_TRUE(read->log);
    EXPECT_TRUE(read->log->holdsTheSameAs(*place.log));
    place.log.reset();
    ASSERT_FALSE(
        fleet::writePlace(place, "london/h1/0/1", folder_.file("p"), recording::Durability::whenever));
    EXPECT_FALSE(fleet::readPlace(folder_.file("p"))->log);
}

TEST_F(ShipFiles, APlaceThatIsNotThereIsNothingAndADamagedOneIsSaid) {
    EXPECT_FALSE(fleet::readPlace(folder_.file("none")));
    for (const char* text : {"", "{", "[]", "{\"v\":2}", "{\"v\":1,\"run\":\"x\",\"next\":1}",
                             "{\"v\":1,\"run\":1,\"next\":1,\"ended\":0,\"log\":null}",
                             "{\"v\":1,\"run\":1,\"next\":1,\"ended\":false,\"log\":{}}"})
        EXPECT_THROW(fleet::readPlace(write(text)), std::runtime_error) << text;
    EXPECT_TRUE(fleet::writePlace({}, "d", folder_.file("no/such/folder"), recording::Durability::whenever));
}

constexpr char config[] =
    "site = \"london\"\nhost = \"h1\"\nservers = [\"tls://a:4222\", \"tls://b:4222\"]\nstate = \"state\"\n"
    "redact = \"/etc/key\"\nleast_free = 5\nstream = \"OTHER\"\nresend_window = 7\n"
    "[tls]\nauthority = \"ca.pem\"\ncertificate = \"/c.pem\"\nkey = \"/c.key\"\n"
    "[[dchannel]]\nboard = \"0\"\ndchannel = \"1\"\ntrunk = \"pri1\"\nfolder = \"rec\"\ngroup = \"nfas-a\"\n"
    "[[dchannel]]\nboard = \"0\"\ndchannel = \"2\"\ntrunk = \"pri2\"\nlog = \"/run/x.fifo\"\n";

TEST_F(ShipFiles, AConfigurationSaysItAll) {
    const ShipConfig read = this->read(config);
    EXPECT_EQ(read.nats.servers, (std::vector<std::string>{"tls://a:4222", "tls://b:4222"}));
    EXPECT_EQ(read.nats.name, "lapdship london/h1");
    EXPECT_EQ(read.nats.authority, folder_.file("ca.pem")) << "relative to the file";
    EXPECT_EQ(read.nats.certificate, "/c.pem");
    EXPECT_EQ(read.nats.key, "/c.key");
    EXPECT_EQ(read.state, folder_.file("state"));
    EXPECT_EQ(read.redact, "/etc/key");
    EXPECT_EQ(read.leastFree, 5U);
    EXPECT_EQ(read.resendWindow.count(), 7);
    EXPECT_EQ(read.stream, "OTHER");
    ASSERT_EQ(read.dChannels.size(), 2U);
    EXPECT_EQ(toText(read.dChannels[0].head.address), "london/h1/0/1");
    EXPECT_EQ(read.dChannels[0].head.group, "nfas-a");
    EXPECT_EQ(read.dChannels[0].folder, folder_.file("rec"));
    EXPECT_TRUE(read.dChannels[0].head.isRedacted);
    EXPECT_EQ(read.dChannels[1].head.trunk, "pri2");
    EXPECT_EQ(read.dChannels[1].log, "/run/x.fifo");
}

TEST_F(ShipFiles, AConfigurationThatCannotBeObeyedIsSaidWithItsLine) {
    const std::string good = config;
    const auto with = [&](const std::string& from, const std::string& to) {
        std::string text = good;
        return text.replace(text.find(from), from.size(), to);
    };
    struct Case {
        std::string text, says;
    };
    for (const Case& each : {
             Case{"site = ", ":1: "},
             Case{with("site = \"london\"\n", ""), "site must be"},
             Case{with("\"london\"", "\"\""), "site must be"},
             Case{with("\"london\"", "7"), ":1: site must be a text"},
             Case{with("state = \"state\"\n", ""), "state must be given"},
             Case{with("servers = [\"tls://a:4222\", \"tls://b:4222\"]", "servers = []"), "must be given"},
             Case{with("servers = [\"tls://a:4222\", \"tls://b:4222\"]", "servers = [1]"), "list of texts"},
             Case{with("servers = [\"tls://a:4222\", \"tls://b:4222\"]\n", ""), "list of texts"},
             Case{with("host", "hots"), ":2: hots is not known"},
             Case{with("least_free = 5", "least_free = 101"), "from 0 to 100"},
             Case{with("resend_window = 7", "resend_window = 3601"), "from 0 to 3600"},
             Case{with("key = \"/c.key\"\n", ""), "certificate and key together"},
             Case{with("folder = \"rec\"\n", ""), "either folder or log"},
             Case{with("folder = \"rec\"\n", "folder = \"rec\"\nlog = \"x\"\n"), "either folder or log"},
             Case{with("folder = \"rec\"\n", "foldr = \"rec\"\n"), "foldr is not known"},
             Case{with("dchannel = \"2\"", "dchannel = \"1\""), "london/h1/0/1 stands there twice"},
             Case{with("nfas-a", "caf\xc3\xa9"), "group must be"},
             Case{with("trunk = \"pri1\"\n", ""), "trunk is missing"},
             Case{good.substr(0, good.find("[[")), "[[dchannel]]"},
         }) {
        try {
            read(each.text);
            ADD_FAILURE() << each.text;
        } catch (const BadConfig& error) {
            EXPECT_NE(std::string(error.what()).find(each.says), std::string::npos) << error.what();
            EXPECT_TRUE(std::string(error.what()).starts_with(folder_.file("f"))) << error.what();
        }
    }
    EXPECT_THROW(fleet::readShipConfig(folder_.file("none")), BadConfig);
}

ShipCommand parsed(std::vector<const char*> words) {
    words.insert(words.begin(), "lapdship");
    return fleet::parseShipCommand(static_cast<int>(words.size()), words.data());
}

TEST(ShipCommandLine, SaysWhatIsToBeDone) {
    EXPECT_EQ(parsed({}).what, ShipCommand::What::ship);
    EXPECT_EQ(parsed({}).config, "/etc/lapdship.toml");
    EXPECT_EQ(parsed({"-c", "x", "--once"}).what, ShipCommand::What::once);
    EXPECT_EQ(parsed({"--redact", "k"}).redact, "k");
    EXPECT_NE(parsed({"--help"}).told.find("lapdship"), std::string::npos);
    EXPECT_NE(parsed({"--version"}).told.find("lapdship"), std::string::npos);
}

TEST(ShipCommandLine, DescribesStreams) {
    const ShipCommand site = parsed({"streams", "site", "--size", "20", "--days", "2", "-c", "x"});
    ASSERT_EQ(site.streams.size(), 1U);
    EXPECT_EQ(site.config, "x");
    EXPECT_EQ(site.streams[0].name, "LAPD_SITE");
    EXPECT_EQ(site.streams[0].subjects, std::vector<std::string>{"lapd.>"});
    EXPECT_EQ(site.streams[0].mostOctets, 20'000'000U);
    EXPECT_EQ(site.streams[0].age, std::chrono::hours(48));
    const ShipCommand centre = parsed({"streams", "centre", "--replicas", "3", "--from", "a", "--from", "b"});
    ASSERT_EQ(centre.streams.size(), 2U);
    EXPECT_EQ(centre.streams[0].name, "LAPD");
    EXPECT_EQ(centre.streams[0].replicas, 3U);
    for (const fleet::StreamRules& rules : centre.streams)
        EXPECT_EQ(rules.duplicates, std::chrono::milliseconds(100)) << "copies would differ";
    EXPECT_TRUE(centre.streams[0].subjects.empty());
    EXPECT_EQ(centre.streams[0].sites, (std::vector<std::string>{"a", "b"}));
    EXPECT_EQ(centre.streams[1].name, "LAPD_DEAD");
    EXPECT_EQ(parsed({"streams", "centre"}).streams[0].subjects, std::vector<std::string>{"lapd.>"});
}

TEST(ShipCommandLine, RefusesWhatItDoesNotKnow) {
    for (const std::vector<const char*>& words : {std::vector<const char*>{"x"},
                                                  {"--x"},
                                                  {"streams"},
                                                  {"streams", "x"},
                                                  {"streams", "site", "--from", "a"},
                                                  {"streams", "site", "--replicas", "0"},
                                                  {"streams", "site", "--days", "x"},
                                                  {"--config"}})
        EXPECT_THROW(parsed(words), fleet::BadShipCommand);
}

TEST(DiskWatch, SaysOnceThatRoomIsScarceAndOnceThatItIsNot) {
    std::string said;
    fleet::DiskWatch watch(10, [&](const std::string& text) { said += text + ";"; });
    watch.look("the stream", 85, 100);
    EXPECT_EQ(said, "");
    watch.look("the stream", 95, 100);
    watch.look("the stream", 99, 100);
    EXPECT_EQ(said, "the stream has only 5% free;");
    watch.look("the stream", 120, 100);
    watch.look("the stream", 20, 100);
    EXPECT_EQ(said, "the stream has only 5% free;the stream has room again: 80% free;");
    watch.look("without a limit", 5, 0);
    watch.look("/no/such/folder");
    EXPECT_EQ(said.find("limit"), std::string::npos);
}

TEST(DiskWatch, LooksAtTheDiskOfAFolder) {
    std::string said;
    fleet::DiskWatch watch(101, [&](const std::string& text) { said += text; });
    watch.look("/tmp");
    EXPECT_TRUE(said.starts_with("the disk of /tmp has only ")) << said;
}

}  // namespace
