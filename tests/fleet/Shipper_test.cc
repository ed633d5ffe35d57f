// lapdship against a NATS server: what arrives is what was recorded, whoever is killed.
#include <gtest/gtest.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <atomic>
#include <chrono>
#include <csignal>
#include <fstream>
#include <map>
#include <string>
#include <thread>

#include "NatsServer.h"
#include "Recordings.h"
#include "fleet/NatsConsumer.h"
#include "fleet/Parcel.h"
#include "fleet/ship/Place.h"
#include "fleet/ship/ShipConfig.h"
#include "fleet/ship/ShipMetrics.h"
#include "fleet/ship/Shipper.h"
#include "fleet/streams.h"
#include "redaction/Key.h"

namespace {

using namespace std::chrono_literals;
using fleet::NatsConnection;
using fleet::Parcel;
using fleet_tests::NatsServer;

constexpr std::uint64_t run = 1'795'260'333'000'001;

// The program itself, which a test can kill.
class Process {
  public:
    Process(const std::string& config, const std::string& said) : process_(fork()) {
        if (process_ != 0)
            return;
        prctl(PR_SET_PDEATHSIG, SIGKILL);
        static_cast<void>(!freopen(said.c_str(), "a", stderr));
        execl(LAPDSHIP, LAPDSHIP, "--config", config.c_str(), nullptr);
        _exit(127);
    }
    ~Process() { end(SIGKILL); }
    Process(const Process&) = delete;
    Process& operator=(const Process&) = delete;

    // Its exit status, or minus the signal that ended it.
    int end(int signal) {
        if (process_ <= 0)
            return 0;
        ::kill(process_, signal);
        int status = 0;
        waitpid(process_, &status, 0);
        process_ = -1;
        return WIFEXITED(status) ? WEXITSTATUS(status) : -WTERMSIG(status);
    }

  private:
    pid_t process_;
};

class ShipperTest : public testing::Test {
  protected:
    explicit ShipperTest(NatsServer::Security security = NatsServer::Security::none)
        : server_(security), connection_(server_.options()) {
        makeSiteStream();
        std::filesystem::create_directory(folder_.file("state"));
        writeConfig("folder = \"" + folder_.path() + "\"\n");
    }

    void makeSiteStream() {
        fleet::StreamRules rules;
        rules.name = fleet::siteStream;
        rules.subjects = {fleet::everySubject};
        makeStream(connection_, rules);
    }

    void writeConfig(const std::string& more, const std::string& head = {}) const {
        std::ofstream(folder_.file("ship.toml"))
            << "site = \"s\"\nhost = \"h\"\nstate = \"state\"\nservers = [\"" << server_.options().servers[0]
            << "\"]\n"
            << head << "[[dchannel]]\nboard = \"0\"\ndchannel = \"1\"\ntrunk = \"pri1\"\n"
            << more;
    }

    // Ships all that is there now.
    void ship() {
        fleet::Shipper shipper(fleet::readShipConfig(folder_.file("ship.toml")), {},
                               [this](const std::string& text) { said_ += text + ";"; });
        shipper.drain(stop_);
    }

    // Takes what has come since the last time. Frames that came twice must be the same.
    void receive() {
        fleet::ConsumerRules rules;
        rules.stream = fleet::siteStream;
        rules.durable = "test";
        rules.filter = fleet::everySubject;
        fleet::NatsConsumer consumer(connection_, rules);
        for (auto messages = consumer.fetch(100, 200ms); !messages.empty();
             messages = consumer.fetch(100, 200ms)) {
            for (fleet::NatsMessage& message : messages) {
                const Parcel parcel = fleet::parcelIn(message.text());
                EXPECT_EQ(message.subject(), toText(parcel.subject()));
                EXPECT_EQ(message.id().substr(0, message.id().find('~')), parcel.id());
                std::uint64_t number = parcel.first;
                for (const fleet::ParcelFrame& frame : parcel.frames) {
                    const auto [known, isNew] = frames_.try_emplace({parcel.run, number++}, frame);
                    EXPECT_TRUE(isNew || known->second == frame) << parcel.id();
                }
                gaps_ += parcel.gaps.size();
                ends_ += parcel.end ? 1 : 0;
                message.acknowledge();
            }
        }
    }

    // All frames of the run are there: 1 to `count`, with the octets that belong to their numbers.
    void expectFrames(std::uint64_t count) const {
        EXPECT_EQ(frames_.size(), count);
        for (std::uint64_t number = 1; number <= count; ++number) {
            const auto found = frames_.find({run, number});
            ASSERT_NE(found, frames_.end()) << number;
            EXPECT_EQ(found->second.item.octets,
                      (std::vector<std::uint8_t>{0, 1, static_cast<std::uint8_t>(number >> 8U),
                                                 static_cast<std::uint8_t>(number)}));
        }
    }

    NatsServer server_;
    NatsConnection connection_;
    fleet_tests::Folder folder_;
    fleet_tests::Recordings recorder_{folder_.path()};
    std::atomic<bool> stop_{false};
    std::string said_;
    std::map<std::pair<std::uint64_t, std::uint64_t>, fleet::ParcelFrame> frames_;
    std::size_t gaps_ = 0;
    std::size_t ends_ = 0;
};

TEST_F(ShipperTest, EveryFrameArrivesAndTheNextShipperGoesOn) {
    recorder_.begin(run, 1);
    recorder_.frames(1200);
    ship();
    receive();
    expectFrames(1200);
    const auto place = fleet::readPlace(folder_.file("state/0.1.place.json"));
    ASSERT_TRUE(place);
    EXPECT_EQ(place->next, 1201U);
    const std::uint64_t before = fleet::fillingOf(connection_, fleet::siteStream).messages;
    ship();
    EXPECT_EQ(fleet::fillingOf(connection_, fleet::siteStream).messages, before) << "nothing is sent again";
    recorder_.frames(1);
    recorder_.finish();
    recorder_.begin(run + 1, 1);
    recorder_.frames(1);
    ship();
    receive();
    EXPECT_EQ(frames_.size(), 1202U);
    EXPECT_EQ(ends_, 1U);
    EXPECT_EQ(gaps_, 0U);
}

TEST_F(ShipperTest, SaysOnceThatThereAreNoRecordingsYet) {
    {
        fleet::Shipper shipper(fleet::readShipConfig(folder_.file("ship.toml")), {},
                               [this](const std::string& text) { said_ += text + ";"; });
        shipper.drain(stop_);
        shipper.drain(stop_);
    }
    const std::string lacks = "s/h/0/1: " + folder_.path() + ": no recordings of pri1 yet;";
    EXPECT_EQ(said_.find(lacks), said_.rfind(lacks));
    EXPECT_NE(said_.find(lacks), std::string::npos) << said_;
    said_.clear();
    recorder_.begin(run, 1);
    recorder_.frames(1);
    ship();
    EXPECT_EQ(said_.find("no recordings"), std::string::npos) << said_;
    receive();
    expectFrames(1);
}

TEST_F(ShipperTest, APlaceThatIsLostMeansThatAllIsSentAgainAndIsTheSame) {
    recorder_.begin(run, 1);
    recorder_.frames(700);
    ship();
    receive();
    std::ofstream(folder_.file("state/0.1.place.json")) << "{";
    ship();
    receive();
    expectFrames(700);
    EXPECT_NE(said_.find("everything is shipped again"), std::string::npos) << said_;
}

TEST_F(ShipperTest, AStreamThatIsFullIsSaidAndFramesWait) {
    fleet::StreamRules rules;
    rules.name = fleet::siteStream;
    rules.subjects = {fleet::everySubject};
    rules.mostOctets = 2000;
    makeStream(connection_, rules);
    recorder_.begin(run, 1);
    recorder_.frames(100);
    fleet::ShipperRules shipping;
    shipping.outbox.pause = 0ms;
    const auto stopWhenSaid = [this](const std::string& text) {
        said_ += text;
        stop_ = stop_ || text.find("takes no frames") != std::string::npos;
    };
    fleet::Shipper(fleet::readShipConfig(folder_.file("ship.toml")), shipping, stopWhenSaid).drain(stop_);
    EXPECT_NE(said_.find("the stream takes no frames: maximum bytes exceeded"), std::string::npos) << said_;
    rules.mostOctets = 0;
    makeStream(connection_, rules);
    stop_ = false;
    ship();
    receive();
    expectFrames(100);
}

TEST_F(ShipperTest, TellsItsFigures) {
    writeConfig("folder = \"" + folder_.path() + "\"\ngroup = \"nfas\"\n", "metrics = \"0\"\n");
    recorder_.begin(run, 1);
    recorder_.frames(1200);
    fleet::Shipper shipper(fleet::readShipConfig(folder_.file("ship.toml")), {},
                           [this](const std::string& text) { said_ += text + ";"; });
    EXPECT_NE(said_.find("figures are at http://127.0.0.1:"), std::string::npos) << said_;
    const std::string labels = "{site=\"s\",trunk=\"s/h/0/1\",name=\"pri1\",group=\"nfas\"";
    EXPECT_NE(metricsOf(shipper).find("lapdship_connected 0\n"), std::string::npos);
    shipper.drain(stop_);
    const std::string text = metricsOf(shipper);
    const auto& figures = shipper.figures();
    for (const std::string& line : std::vector<std::string>{
             "lapdship_connected 1\n", "lapdship_stream_full 0\n",
             "lapdship_parcels_kept_total " + std::to_string(figures.kept) + "\n",
             "lapdship_frames_total" + labels + "} 1200\n", "lapdship_gaps_total" + labels + "} 0\n",
             "lapdship_waiting_parcels" + labels + "} 0\n", "lapdship_lag_seconds" + labels + "} 0\n",
             "lapdship_stream_bytes{stream=\"LAPD_SITE\"} 0\n",
             "lapdship_disk_bytes{folder=\"" + folder_.path() + "\"} "})
        EXPECT_NE(text.find("\n" + line), std::string::npos) << line << text;
    EXPECT_GE(figures.kept, 2U);
    // The recordings are of one direction.
    const std::string newest = "\nlapdship_newest_frame_timestamp_seconds" + labels + ",direction=\"";
    EXPECT_NE(text.find(newest + "tx\"} 0\n") == std::string::npos,
              text.find(newest + "rx\"} 0\n") == std::string::npos);
}

TEST_F(ShipperTest, WhatIsNotSafeYetIsLag) {
    recorder_.begin(run, 1);
    recorder_.frames(5);
    server_.kill();
    fleet::ShipConfig config = fleet::readShipConfig(folder_.file("ship.toml"));
    config.nats.timeout = 100ms;
    std::atomic<bool> stop{false};
    // The first attempt to connect fails, and with it all is over.
    fleet::Shipper shipper(config, {}, [&](const std::string&) { stop = true; });
    shipper.run(stop);
    const std::string text = metricsOf(shipper);
    EXPECT_EQ(text.find("\nlapdship_lag_seconds{site=\"s\",trunk=\"s/h/0/1\",name=\"pri1\",group=\"\"} 0\n"),
              std::string::npos);
    EXPECT_NE(
        text.find("\nlapdship_waiting_parcels{site=\"s\",trunk=\"s/h/0/1\",name=\"pri1\",group=\"\"} 1\n"),
        std::string::npos)
        << text;
}

TEST_F(ShipperTest, AnAddressForFiguresThatIsTakenIsSaid) {
    writeConfig("folder = \"x\"\n", "metrics = \"192.0.2.1:0\"\n");
    EXPECT_THROW(ship(), fleet::BadListenAddress);
    writeConfig("folder = \"x\"\n", "metrics = \"here\"\n");
    EXPECT_THROW(ship(), fleet::BadConfig);
}

TEST_F(ShipperTest, OneFolderOfPlacesHasOneShipper) {
    const fleet::ShipConfig config = fleet::readShipConfig(folder_.file("ship.toml"));
    const auto silent = [](const std::string&) {};
    const fleet::Shipper first(config, {}, silent);
    EXPECT_THROW(fleet::Shipper(config, {}, silent), std::runtime_error);
}

TEST_F(ShipperTest, ALogIsOneRunHoweverOftenItsShipperIsStarted) {
    writeConfig("log = \"" + folder_.file("x.log") + "\"\n");
    for (int i = 1; i <= 3; ++i) {
        std::ofstream(folder_.file("x.log"), std::ios::app) << "TX 2026-11-21T11:25:33Z 0001ff0" << i << "\n";
        ship();
    }
    receive();
    ASSERT_EQ(frames_.size(), 3U);
    EXPECT_EQ(frames_.begin()->first.first, frames_.rbegin()->first.first);
    std::ofstream(folder_.file("x.log"), std::ios::trunc) << "TX 2026-11-21T11:25:33Z 0001ff09\n";
    ship();
    receive();
    EXPECT_EQ(frames_.size(), 4U);
    EXPECT_EQ(ends_, 1U);
    EXPECT_EQ(gaps_, 1U) << "what was written to the log last may not have been read";
}

TEST_F(ShipperTest, WithAKeyNoNumberLeavesTheHost) {
    const std::string key = folder_.file("key");
    redaction::writeKey(key, redaction::randomKey({}));
    writeConfig("log = \"" + folder_.file("x.log") + "\"\n", "redact = \"" + key + "\"\n");
    // SETUP with CALLED PARTY NUMBER 5551234.
    std::ofstream(folder_.file("x.log"))
        << "# lapdmon: head net5\nTX 2026-11-21T11:25:33Z 000100000802000105040380909070088135353531323334\n"
        << "TX 2026-11-21T11:25:34Z 00010101\n";
    ship();
    receive();
    ASSERT_EQ(frames_.size(), 2U);
    const auto& octets = frames_.begin()->second.item.octets;
    const std::string text(octets.begin(), octets.end());
    EXPECT_EQ(text.size(), 24U);
    EXPECT_EQ(text.find("5551234"), std::string::npos);
    EXPECT_EQ(frames_.rbegin()->second.item.octets, (std::vector<std::uint8_t>{0, 1, 1, 1}));
    writeConfig("folder = \"x\"\n", "redact = \"/no/such/key\"\n");
    EXPECT_THROW(ship(), redaction::KeyError);
}

// The shipper is killed at points that nobody chooses, the server now and then; each time there is more to
// ship.
TEST_F(ShipperTest, WhateverIsKilledEachFrameArrivesOnceInAll) {
    constexpr unsigned rounds = 12;
    constexpr unsigned framesARound = 400;
    recorder_.begin(run, 1);
    for (unsigned round = 0; round < rounds; ++round) {
        {
            Process shipper(folder_.file("ship.toml"), folder_.file("said"));
            for (unsigned i = 0; i < framesARound; i += 20) {
                recorder_.frames(20);
                if (round % 4 == 3 && i == framesARound / 2) {
                    server_.kill();
                    server_.start();
                }
            }
            // Some come to nothing at all, some ship for a while.
            usleep(round * 20'000);
            EXPECT_EQ(shipper.end(SIGKILL), -SIGKILL);
        }
        if (round % 3 == 2) {
            recorder_.finish();
            recorder_.begin(run, std::uint64_t{framesARound} * (round + 1) + 1);
        }
    }
    ship();
    receive();
    expectFrames(std::uint64_t{rounds} * framesARound);
    EXPECT_EQ(gaps_, 0U);
    EXPECT_EQ(ends_, 0U);
}

// A server that has lost everything stands for one that has lost what it confirmed last.
TEST_F(ShipperTest, WhatAServerHasLostIsShippedAgain) {
    writeConfig("folder = \"" + folder_.path() + "\"\n", "metrics = \"0\"\n");
    recorder_.begin(run, 1);
    recorder_.frames(600);
    fleet::ShipperRules rules;
    rules.calm = 0ms;
    rules.outbox.pause = 10ms;
    auto shipper = std::make_unique<fleet::Shipper>(fleet::readShipConfig(folder_.file("ship.toml")), rules,
                                                    [](const std::string&) {});
    std::thread thread([&] { shipper->run(stop_); });
    while (frames_.size() < 600)
        receive();
    frames_.clear();
    server_.kill();
    server_.lose();
    server_.start();
    while (!connection_.isConnected())
        usleep(10'000);
    makeSiteStream();
    recorder_.frames(10);
    while (frames_.size() < 610)
        receive();
    stop_ = true;
    thread.join();
    expectFrames(610);
    EXPECT_EQ(fleet::readPlace(folder_.file("state/0.1.place.json")), std::nullopt);
    EXPECT_GE(shipper->returns(), 1U);
    const std::string returns = "\nlapdship_returns_total " + std::to_string(shipper->returns()) + "\n";
    EXPECT_NE(metricsOf(*shipper).find(returns), std::string::npos);
    shipper.reset();
    std::ifstream trusted(folder_.file("state/server"));
    std::string process;
    std::getline(trusted, process);
    EXPECT_EQ(process, connection_.serverProcess());
    // The next shipper begins where it is sure, and stays to the end of what is there.
    stop_ = false;
    ship();
    receive();
    expectFrames(610);
    EXPECT_EQ(fleet::readPlace(folder_.file("state/0.1.place.json"))->next, 611U);
}

TEST_F(ShipperTest, ThePlaceFollowsOnceTheStreamHasTakenMoreAfterTheWindow) {
    writeConfig("folder = \"" + folder_.path() + "\"\n", "resend_window = 1\n");
    recorder_.begin(run, 1);
    recorder_.frames(100);
    std::uint64_t count = 100;
    {
        fleet::Shipper shipper(fleet::readShipConfig(folder_.file("ship.toml")), {},
                               [](const std::string&) {});
        std::thread thread([&] { shipper.run(stop_); });
        for (; !std::filesystem::exists(folder_.file("state/0.1.place.json")); ++count) {
            recorder_.frames(1);
            usleep(10'000);
        }
        stop_ = true;
        thread.join();
    }
    EXPECT_GT(fleet::readPlace(folder_.file("state/0.1.place.json"))->next, 1U);
    stop_ = false;
    ship();
    receive();
    expectFrames(count);
}

TEST_F(ShipperTest, ASignalEndsItWithItsPlaceWrittenDown) {
    writeConfig("folder = \"" + folder_.path() + "\"\n", "resend_window = 0\n");
    recorder_.begin(run, 1);
    recorder_.frames(50);
    Process shipper(folder_.file("ship.toml"), folder_.file("said"));
    while (fleet::fillingOf(connection_, fleet::siteStream).messages == 0)
        usleep(10'000);
    EXPECT_EQ(shipper.end(SIGTERM), 0);
    const auto place = fleet::readPlace(folder_.file("state/0.1.place.json"));
    ASSERT_TRUE(place);
    EXPECT_EQ(place->next, 51U);
}

class SecureShipperTest : public ShipperTest {
  protected:
    SecureShipperTest() : ShipperTest(NatsServer::Security::certificates) {}

    void useCertificate(const std::string& certificate, const std::string& key) const {
        writeConfig("folder = \"" + folder_.path() + "\"\n",
                    "[tls]\nauthority = \"" + server_.options().authority + "\"\ncertificate = \"" +
                        certificate + "\"\nkey = \"" + key + "\"\n");
    }
};

TEST_F(SecureShipperTest, AShippersCertificateIsEnough) {
    const fleet_tests::Certificates& files = fleet_tests::Certificates::get();
    useCertificate(files.file("shipper.pem"), files.file("shipper.key"));
    recorder_.begin(run, 1);
    recorder_.frames(5);
    ship();
    receive();
    expectFrames(5);
}

TEST_F(SecureShipperTest, SaysThatItMayNotShipFramesOfAnotherSite) {
    const fleet_tests::Certificates& files = fleet_tests::Certificates::get();
    useCertificate(files.file("leeds.pem"), files.file("leeds.key"));
    recorder_.begin(run, 1);
    recorder_.frames(5);
    fleet::Shipper shipper(fleet::readShipConfig(folder_.file("ship.toml")), {},
                           [this](const std::string& text) {
                               said_ += text + ";";
                               stop_ = stop_ || text.find("the stream takes no frames") != text.npos;
                           });
    shipper.drain(stop_);
    EXPECT_NE(said_.find("the stream takes no frames: Permissions Violation for Publish to \"lapd."),
              std::string::npos)
        << said_;
    EXPECT_EQ(fleet::fillingOf(connection_, fleet::siteStream).messages, 0U);
}

TEST_F(SecureShipperTest, WrongCredentialsAreRefusedAtTheStart) {
    const fleet_tests::Certificates& files = fleet_tests::Certificates::get();
    useCertificate(files.file("127.0.0.1.pem"), files.file("127.0.0.1.key"));
    EXPECT_THROW(ship(), fleet::NatsError);
    Process shipper(folder_.file("ship.toml"), folder_.file("said"));
    EXPECT_EQ(shipper.end(0), 2);
}

}  // namespace
