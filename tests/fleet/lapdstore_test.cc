// lapdstore itself, between a NATS server and PostgreSQL.
#include <fcntl.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <csignal>
#include <mutex>
#include <thread>

#include "NatsServer.h"
#include "StoreFixture.h"
#include "fleet/NatsConsumer.h"
#include "fleet/NatsPublisher.h"
#include "fleet/store/NatsInbox.h"
#include "fleet/store/Worker.h"
#include "fleet/streams.h"
#include "fleet/subjects.h"

namespace fleet {

namespace {

using namespace std::chrono_literals;
using fleet_tests::NatsServer;

const std::string source = LAPDMON_SOURCE_DIR;
constexpr auto longEnough = 100s;  // ends a test that would wait for ever

// A lapdstore that is killed at the latest with this object.
class Process {
  public:
    explicit Process(std::vector<std::string> words) {
        process_ = fork();
        if (process_ != 0)
            return;
        prctl(PR_SET_PDEATHSIG, SIGKILL);
        words.insert(words.begin(), std::getenv("LAPDSTORE"));
        std::vector<char*> arguments;
        for (std::string& word : words)
            arguments.push_back(word.data());
        arguments.push_back(nullptr);
        execv(arguments[0], arguments.data());
        _exit(127);
    }
    ~Process() {
        if (process_ > 0)
            end(SIGKILL);
    }
    Process(const Process&) = delete;
    Process& operator=(const Process&) = delete;

    // Returns its exit status; -1 if a signal ended it.
    int end(int signal) {
        kill(process_, signal);
        int status = 0;
        waitpid(process_, &status, 0);
        process_ = -1;
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }

  private:
    pid_t process_ = -1;
};

class Lapdstore : public StoreTest {
  protected:
    Lapdstore() : connection(server.options()), publisher(connection) {
        StreamRules rules;
        rules.name = centreStream;
        rules.subjects = {everySubject};
        makeStream(connection, rules);
        rules.name = deadStream;
        rules.subjects = {everyDeadSubject};
        makeStream(connection, rules);
    }

    void publish(const std::vector<Parcel>& parcels) {
        for (const Parcel& parcel : parcels)
            connection.publish(toText(parcel.subject()), toText(parcel), "");
    }
    std::vector<std::string> words() const {
        return {"--database", url(), "--nats", server.options().servers.front(), "--again-after", "2"};
    }
    void await(const std::string& select, const std::string& expected) const {
        const auto end = std::chrono::steady_clock::now() + longEnough;
        while (rows(select) != expected) {
            ASSERT_LT(std::chrono::steady_clock::now(), end) << select << ": " << rows(select);
            std::this_thread::sleep_for(10ms);
        }
    }

    // Stores all parcels but the last one. Then the tables are again as they were after the first `kept`.
    void storeAndKeepFirst(const std::vector<Parcel>& parcels, std::ptrdiff_t kept) {
        const unsigned number = parcels.front().subject().partition;
        pqxx::connection database(url());
        Partition partition(database, number);
        NatsInbox inbox(connection, number, 30s);
        const auto store = [&](auto from, auto to) {
            publish({from, to});
            for (auto left = static_cast<std::size_t>(to - from); left > 0;)
                left -= moveOnce(inbox, partition, longEnough, [](std::string_view) {});
        };
        store(parcels.begin(), parcels.begin() + kept);
        const auto eachTable = [this](const std::string& before, const std::string& between,
                                      const std::string& after) {
            for (const std::string table :
                 {"trunks", "runs", "frames", "calls", "findings", "gaps", "positions"})
                execute(before + table + between + table + after);
        };
        execute("CREATE SCHEMA backup");
        eachTable("CREATE TABLE backup.", " AS TABLE lapd.", "");
        store(parcels.begin() + kept, parcels.end() - 1);
        empty();
        eachTable("INSERT INTO lapd.", " OVERRIDING SYSTEM VALUE TABLE backup.", "");
    }
    // What lapdstore rewind prints, and its exit status.
    std::string rewound(const std::string& words) const {
        return outputOf(std::string(std::getenv("LAPDSTORE")) + " rewind " + words + " 2>&1; echo $?");
    }

    NatsServer server;
    NatsConnection connection;
    NatsPublisher publisher;
};

const std::string leases =
    "SELECT count(*) FROM pg_locks WHERE locktype = 'advisory' AND granted "
    "AND database = (SELECT oid FROM pg_database WHERE datname = current_database())";

// Works on eight partitions, in a thread.
class Worker {
  public:
    Worker(const std::string& database, const NatsOptions& nats, unsigned first)
        : options_{database, nats, {}, 2s} {
        options_.betweenQuestions = 50ms;
        for (unsigned i = 0; i < 8; ++i)
            options_.partitions.push_back((first + i) % partitions);
        thread_ = std::thread([this] {
            work(options_, stopped_, [this](const std::string& line) {
                const std::lock_guard guard(saying_);
                said_.push_back(line);
            });
        });
    }
    ~Worker() { end(); }
    Worker(const Worker&) = delete;
    Worker& operator=(const Worker&) = delete;

    void end() {
        stopped_ = true;
        if (thread_.joinable())
            thread_.join();
    }
    std::ptrdiff_t linesWith(const std::string& part) {
        const std::lock_guard guard(saying_);
        return std::ranges::count_if(
            said_, [&](const std::string& line) { return line.find(part) != std::string::npos; });
    }
    void awaitLines(const std::string& part, std::ptrdiff_t count) {
        const auto end = std::chrono::steady_clock::now() + longEnough;
        while (linesWith(part) < count) {
            ASSERT_LT(std::chrono::steady_clock::now(), end) << linesWith(part) << " lines with " << part;
            std::this_thread::sleep_for(10ms);
        }
    }

  private:
    WorkerOptions options_;
    std::atomic<bool> stopped_{false};
    std::mutex saying_;
    std::vector<std::string> said_;
    std::thread thread_;
};

std::vector<std::string> examples() { return {"4ess", "5ess", "dms100", "ntt", "net5", "ni2"}; }

}  // namespace

TEST_F(Lapdstore, StoresEachFrameOnceThoughItIsKilledAgainAndAgain) {
    std::vector<std::vector<Parcel>> trunks;
    for (const std::string& name : examples())
        trunks.push_back(parcelsOf(source + "/examples/" + name + ".pcap", 3, true, "site-" + name));
    for (const std::vector<Parcel>& parcels : trunks) {
        pqxx::connection database(url());
        Partition partition(database, parcels.front().subject().partition);
        for (const Parcel& parcel : parcels) {
            const Letter letter{toText(parcel.subject()), toText(parcel), 1};
            partition.take({&letter, 1});
        }
    }
    const std::string undisturbed = everything();
    const std::string frames = rows("SELECT count(*) FROM lapd.frames");
    empty();

    auto first = std::make_unique<Process>(words());
    auto second = std::make_unique<Process>(words());
    std::size_t parcels = 0;
    for (std::size_t i = 0; i < 60; ++i) {
        for (const std::vector<Parcel>& trunk : trunks) {
            if (i < trunk.size())
                publish({trunk[i], trunk[i / 2]});
        }
        parcels += 2;
        // Each time something is being written; whoever is killed is killed in the middle of it.
        if (i % 15 == 7)
            first = std::make_unique<Process>(words());
        if (i % 15 == 14)
            second = std::make_unique<Process>(words());
    }
    ASSERT_GT(parcels, 0U);
    await("SELECT count(*) FROM lapd.runs WHERE finished", std::to_string(trunks.size()) + "\n");
    EXPECT_EQ(rows("SELECT count(*) FROM lapd.frames"), frames);
    EXPECT_EQ(everything(), undisturbed);
    EXPECT_EQ(first->end(SIGTERM), 0);
    EXPECT_EQ(second->end(SIGTERM), 0);
}

TEST_F(Lapdstore, GoesOnWhenThePartitionsOfAnotherBecomeFree) {
    const std::vector<Parcel> parcels = parcelsOf(source + "/examples/net5.pcap", 10, true);
    Process first(words());
    await(leases, "64\n");
    Process second(words());
    publish({parcels.front()});
    await("SELECT assembled FROM lapd.runs", "11\n");
    first.end(SIGKILL);
    publish(parcels);
    await("SELECT finished FROM lapd.runs", "t\n");
}

// Somebody else's consumer of the same name, which cannot be made into ours.
TEST_F(Lapdstore, GoesOnWithTheOthersWhenThePartitionOfOneCannotBeHad) {
    const std::vector<Parcel> parcels = parcelsOf(source + "/examples/net5.pcap", 10, true);
    const unsigned good = parcels.front().subject().partition;
    const unsigned bad = (good + 1) % partitions;
    const std::string consumer = "lapdstore-" + std::to_string(bad);
    publisher.send(
        "$JS.API.CONSUMER.DURABLE.CREATE.LAPD." + consumer,
        R"({"stream_name":"LAPD","config":{"ack_policy":"none","durable_name":")" + consumer + "\"}}", "", 1);
    ASSERT_TRUE(publisher.answer(longEnough));
    std::atomic<bool> stopped{false};
    std::vector<std::string> said;
    {
        const std::jthread worker([&] {
            work({url(), server.options(), {bad, good}, 30s}, stopped,
                 [&](const std::string& line) { said.push_back(line); });
        });
        publish(parcels);
        await("SELECT finished FROM lapd.runs", "t\n");
        stopped = true;
    }
    EXPECT_TRUE(std::ranges::any_of(said, [&](const std::string& line) {
        return line.starts_with("partition " + std::to_string(bad) + ": cannot ");
    })) << testing::PrintToString(said);
}

TEST_F(Lapdstore, GoesOnWhenTheDatabaseHasEndedItsConnections) {
    const std::vector<Parcel> parcels = parcelsOf(source + "/examples/net5.pcap", 10, true);
    Process store(words());
    publish({parcels.front()});
    await("SELECT assembled FROM lapd.runs", "11\n");
    execute(
        "SELECT pg_terminate_backend(pid) FROM pg_stat_activity WHERE pid <> pg_backend_pid() "
        "AND datname = current_database()");
    publish(parcels);
    await("SELECT finished FROM lapd.runs", "t\n");
}

TEST_F(Lapdstore, PutsWhatItCannotReadIntoTheStreamOfDeadLetters) {
    const std::vector<Parcel> parcels = parcelsOf(source + "/examples/net5.pcap", 10, true);
    const std::string subject = toText(parcels.front().subject());
    connection.publish(subject, "no JSON \xff", "");
    connection.publish("lapd.1.not.a.d.channel.at.all", "{}", "");
    Process store(words());
    publish(parcels);
    await("SELECT finished FROM lapd.runs", "t\n");
    await("SELECT reason FROM lapd.dead_letters WHERE sequence = 1", "it is no JSON\n");
    await("SELECT count(*) FROM lapd.dead_letters", "2\n");
    ConsumerRules rules;
    rules.stream = deadStream;
    rules.durable = "test";
    rules.filter = everyDeadSubject;
    NatsConsumer dead(connection, rules);
    std::vector<std::string> texts;
    while (texts.size() < 2) {
        for (NatsMessage& message : dead.fetch(10, 1s)) {
            texts.push_back(std::string(message.subject()) + " " + std::string(message.text()));
            message.acknowledge();
        }
    }
    std::sort(texts.begin(), texts.end());
    EXPECT_EQ(texts[0], "lapd-dead.1.not.a.d.channel.at.all {}");
    EXPECT_EQ(texts[1], deadSubjectOf(subject) + " no JSON \xff");
}

TEST_F(Lapdstore, TellsItsFigures) {
    const std::vector<Parcel> parcels = parcelsOf(source + "/examples/net5.pcap", 10, true);
    publish(parcels);
    StoreFigures figures;
    std::atomic<bool> stopped{false};
    WorkerOptions options{url(), server.options(), {}, 30s, &figures};
    for (unsigned partition = 0; partition < 64; ++partition)
        options.partitions.push_back(partition);
    std::thread worker([&] { work(options, stopped, [](const std::string&) {}); });
    const std::string partition = "{partition=\"" + std::to_string(parcels[0].subject().partition) + "\"} ";
    const auto end = std::chrono::steady_clock::now() + longEnough;
    const auto isThere = [&](const std::string& line) {
        return figures.text().find("\n" + line) != std::string::npos;
    };
    for (const std::string& line :
         {"lapdstore_waiting_parcels" + partition + "0\n", "lapdstore_lag_seconds" + partition + "0\n",
          std::string("lapdstore_connected{thread=\"0\"} 1\n"), std::string("lapdstore_database_bytes "),
          std::string("lapdstore_stream_used_bytes ")}) {
        while (!isThere(line) && std::chrono::steady_clock::now() < end)
            std::this_thread::sleep_for(10ms);
        EXPECT_TRUE(isThere(line)) << line << figures.text();
    }
    stopped = true;
    worker.join();
    EXPECT_FALSE(isThere("lapdstore_partition_leased")) << "whoever has ended leases nothing";
}

// A server that only reads, a right that is missing, a full disk: each attempt fails, and all are one
// trouble.
TEST_F(Lapdstore, SaysOnceThatTheDatabaseRefusesRows) {
    const std::vector<Parcel> parcels = parcelsOf(source + "/examples/net5.pcap", 1000, true);
    // The text of the error is another one each time, as those of a server that names files are.
    execute(
        "CREATE SEQUENCE lapd.refused; CREATE FUNCTION lapd.refuse() RETURNS trigger LANGUAGE plpgsql AS $$ "
        "DECLARE time bigint = nextval('lapd.refused'); "
        "BEGIN "
        "IF time % 2 = 0 THEN RAISE 'it is read only, %', time USING ERRCODE = 'read_only_sql_transaction'; "
        "END IF; "
        "RAISE 'could not extend file \"base/%\"', time USING ERRCODE = 'disk_full'; END "
        "$$; "
        "CREATE TRIGGER full_disk BEFORE INSERT ON lapd.runs EXECUTE FUNCTION lapd.refuse()");
    std::vector<std::string> said;
    std::mutex saying;
    std::atomic<bool> stopped{false};
    WorkerOptions options{url(), server.options(), {parcels[0].subject().partition}, 1s};
    std::thread worker([&] {
        work(options, stopped, [&](const std::string& line) {
            const std::lock_guard guard(saying);
            said.push_back(line);
        });
    });
    publish(parcels);
    await("SELECT last_value >= 4 FROM lapd.refused", "t\n");
    execute("DROP TRIGGER full_disk ON lapd.runs");
    await("SELECT finished FROM lapd.runs", "t\n");
    stopped = true;
    worker.join();
    const std::string leased = "partitions leased: " + std::to_string(options.partitions[0]);
    const auto count = [&](const std::string& part) {
        return std::count_if(said.begin(), said.end(),
                             [&](const std::string& line) { return line.find(part) != std::string::npos; });
    };
    EXPECT_EQ(count("could not extend file"), 1) << testing::PrintToString(said);
    EXPECT_EQ(count("it is read only"), 1) << testing::PrintToString(said);
    EXPECT_TRUE(std::ranges::none_of(said, [](const std::string& line) { return line.ends_with(' '); }));
    // Once at the beginning, unless the first attempt came first, and once when rows are taken again.
    EXPECT_LE(count(leased), 2) << testing::PrintToString(said);
    EXPECT_LE(said.size(), 4U) << testing::PrintToString(said);
}

TEST_F(Lapdstore, SaysWhyAnEngineRefusesIt) {
    const auto saysOf = [](const std::string& database, const NatsOptions& nats) {
        std::atomic<bool> stopped{false};
        std::string said;
        work({database, nats, {0}, 30s}, stopped, [&](const std::string& line) {
            said = line;
            stopped = true;
        });
        return said;
    };
    EXPECT_NE(saysOf(urlOf("postgres", "nobody"), server.options()).find("nobody"), std::string::npos);
    NatsServer guarded(NatsServer::Security::certificates);
    NatsOptions stranger = guarded.options();
    stranger.certificate = fleet_tests::Certificates::get().strangersFile("store.pem");
    stranger.key = fleet_tests::Certificates::get().strangersFile("store.key");
    const std::string refused = saysOf(url(), stranger);
    EXPECT_TRUE(!refused.empty() && !refused.starts_with("partitions")) << refused;
    NatsConnection ours(guarded.options());
    StreamRules rules;
    rules.name = centreStream;
    rules.subjects = {everySubject};
    makeStream(ours, rules);
    EXPECT_EQ(saysOf(url(), guarded.options("store")), "partitions leased: 0");
}

// An older backup is restored, and a lapdstore goes on with it: what was stored since is missing until it
// comes again.
TEST_F(Lapdstore, FillsAnOlderBackupUpWhenItIsRewound) {
    const std::vector<Parcel> parcels = parcelsOf(source + "/examples/net5.pcap", 5, true);
    const unsigned number = parcels.front().subject().partition;
    ASSERT_GE(parcels.size(), 3U);
    storeAndKeepFirst(parcels, 1);

    Worker worker(url(), server.options(), number);
    await(leases, "8\n");
    publish({parcels.back()});
    await("SELECT sequence FROM lapd.positions", std::to_string(parcels.size()) + "\n");
    EXPECT_EQ(rows("SELECT finished FROM lapd.runs"), "f\n") << "frames are missing";
    EXPECT_EQ(rewound("--nats " + server.options().servers.front()),
              "partitions that the stream delivers again: 8\n0\n");
    await("SELECT finished FROM lapd.runs", "t\n");
    worker.awaitLines("partition ", 8);
    worker.end();
    const std::string filled = everything();

    empty();
    pqxx::connection database(url());
    Partition undisturbed(database, number);
    for (const Parcel& parcel : parcels) {
        const Letter letter{toText(parcel.subject()), toText(parcel), 1};
        undisturbed.take({&letter, 1});
    }
    EXPECT_EQ(filled, everything());
}

TEST_F(Lapdstore, RewindsOnlyThePartitionsThatItIsTold) {
    NatsConsumer seventh(connection, {centreStream, "lapdstore-7", subjectsOf(7)});
    NatsConsumer eighth(connection, {centreStream, "lapdstore-8", subjectsOf(8)});
    const std::string nats = "--nats " + server.options().servers.front();
    EXPECT_EQ(rewound(nats + " --last 7"), "partitions that the stream delivers again: 1\n0\n");
    EXPECT_EQ(seventh.waiting(), std::nullopt);
    EXPECT_EQ(eighth.waiting(), 0U);
    EXPECT_EQ(rewound(nats + " --first 8 --last 8"), "partitions that the stream delivers again: 1\n0\n");
    EXPECT_EQ(rewound(nats), "partitions that the stream delivers again: 0\n0\n");
}

TEST_F(Lapdstore, SaysWhyItDoesNotRewind) {
    EXPECT_EQ(rewound(""), "lapdstore: --nats names no server (--help tells more)\n1\n");
    EXPECT_EQ(rewound("--nats nats://127.0.0.1:1 --first 3 --last 2"),
              "lapdstore: --first is behind --last\n1\n");
    EXPECT_EQ(rewound("--nats nats://127.0.0.1:1"),
              "lapdstore: cannot connect to NATS: No server available for connection\n2\n");
    const NatsServer empty;
    EXPECT_EQ(rewound("--nats " + empty.options().servers.front()),
              "lapdstore: cannot delete the consumer lapdstore-0 of the stream LAPD: Not Found (there is no "
              "such stream; lapdship streams makes it)\n2\n");
    const NatsServer guarded(NatsServer::Security::certificates);
    const fleet_tests::Certificates& files = fleet_tests::Certificates::get();
    const std::string unnamed = files.file("127.0.0.1");
    EXPECT_EQ(
        rewound("--nats " + guarded.options().servers.front() + " --authority " +
                files.file("authority.pem") + " --certificate " + unnamed + ".pem --key " + unnamed + ".key"),
        "lapdstore: cannot connect to NATS: Authentication Violation (Authorization Violation)\n2\n");
}

}  // namespace fleet
