// Parcels into tables: what a transaction writes, whatever happens around it.
#include <array>
#include <filesystem>
#include <utility>

#include "StoreFixture.h"
#include "fleet/store/Lease.h"
#include "fleet/store/sql_text.h"

// libpqxx loses a result of libpq, two kilobytes, when the server ends a connection while it asks.
extern "C" {
const char* __lsan_default_suppressions();
const char* __lsan_default_suppressions() { return "leak:libpqxx-6.4.so"; }
}

namespace fleet {

namespace {

using namespace std::chrono_literals;
using testing::Test;

const std::string source = LAPDMON_SOURCE_DIR;
const std::string net5 = source + "/examples/net5.pcap";
const std::string overlap = source + "/tests/reader/data/traps/overlap.hex";

// Thrown at a step, as if the process ended there.
struct Killed {};

void moveAll(FakeInbox& inbox, Partition& partition) {
    while (moveOnce(inbox, partition, 0ms, [](std::string_view) {}) != 0) {
    }
}

unsigned partitionOf(const Parcel& parcel) { return parcel.subject().partition; }

class Store_ : public StoreTest {
  protected:
    // Stores the parcels through a connection of their own, so many letters a transaction.
    void store(const std::vector<Parcel>& parcels, std::size_t letters = 1000) {
        FakeInbox inbox;
        inbox.hold(letters);
        for (const Parcel& parcel : parcels)
            inbox.add(parcel);
        pqxx::connection connection(url());
        Partition partition(connection, partitionOf(parcels.front()));
        moveAll(inbox, partition);
        EXPECT_TRUE(inbox.buried().empty());
    }
    std::string count(const std::string& table) const { return rows("SELECT count(*) FROM lapd." + table); }
};

}  // namespace

TEST_F(Store_, MigratesAnEmptyDatabaseAndThenHasNothingToDo) {
    execute("DROP SCHEMA lapd CASCADE");
    pqxx::connection connection(url());
    EXPECT_EQ(migrate(connection).size(), migrations().size());
    EXPECT_TRUE(migrate(connection).empty());
    EXPECT_EQ(
        rows("SELECT version, name FROM lapd.migrations ORDER BY version"),
        "1|001_tables\n2|002_days\n3|003_roles\n4|004_groups\n5|005_keeper\n6|006_bounded\n7|007_clearing\n");
    pqxx::work work(connection);
    EXPECT_EQ(schemaVersion(work), 7);
}

TEST(SqlText, WritesTimesInUtc) {
    EXPECT_EQ(timestampText(1'795'260'333'300'000'999), "2026-11-21 11:25:33.300000+00");
    EXPECT_EQ(timestampText(-1), "1969-12-31 23:59:59.999999+00");
    EXPECT_EQ(dayText(1'795'305'599'999'999'999), "2026-11-21");
    EXPECT_EQ(dayText(1'795'305'600'000'000'000), "2026-11-22");
    EXPECT_EQ(octetsText({0x02, 0xff}), "\\x02ff");
    EXPECT_EQ(printable("a\nb\x80", 3), "a?b");
}

TEST_F(Store_, KeepsAFrameAsItWasSent) {
    Parcel parcel;
    parcel.address = {"london", "h1", "0", "1"};
    parcel.trunk = "pri1";
    parcel.run = 7;
    parcel.variant = capture::Variant::ni2;
    ParcelItem lost;
    lost.kind = capture::Item::Kind::lost;
    lost.count = 17;
    ParcelItem frame;
    frame.time = 1'795'260'333'300'000'001;
    frame.ticks = 4'294'967'295U;
    frame.written = 1'795'260'334;
    frame.transmitted = true;
    frame.role = capture::Role::network;
    frame.octets = {0x00, 0x01, 0x7f};
    ParcelItem oversized;
    oversized.kind = capture::Item::Kind::oversized;
    oversized.time = 1'795'305'600'000'000'000;
    parcel.frames = {{frame, {lost}}, {oversized, {}}};
    store({parcel});
    EXPECT_EQ(rows("SELECT trunk, run, number, day, time, sent, role, ticks, written, variant, octets, "
                   "before->0->>'count' "
                   "FROM lapd.frames ORDER BY number"),
              "1|7|1|2026-11-21|1795260333300000001|t|2|4294967295|1795260334|ni2|\\x00017f|17\n"
              "1|7|2|2026-11-22|1795305600000000000|f|0|-|-|ni2|-|-\n");
    EXPECT_EQ(rows("SELECT site, host, board, dchannel, name, nfas, redacted FROM lapd.trunks"),
              "london|h1|0|1|pri1||f\n");
}

TEST_F(Store_, NotesThatATrunkBeginsToSendPseudonyms) {
    std::vector<Parcel> parcels = parcelsOf(net5, 5, true);
    parcels.back().isRedacted = true;
    store(parcels);
    EXPECT_EQ(rows("SELECT redacted FROM lapd.trunks"), "t\n");
}

TEST_F(Store_, MakesCallsOfFrames) {
    store(parcelsOf(overlap, 3, true));
    EXPECT_EQ(
        rows("SELECT first_frame, callref, origin, calling, called, outcome, ended_by, cause FROM lapd.calls "
             "ORDER BY first_frame"),
        rows("SELECT first_frame, callref, origin, calling, called, outcome, ended_by, cause FROM lapd.calls "
             "ORDER BY began, first_frame"));
    EXPECT_EQ(count("calls"), "2\n");
    EXPECT_EQ(rows("SELECT assembled = (SELECT max(number) + 1 FROM lapd.frames), finished FROM lapd.runs"),
              "t|t\n");
}

TEST_F(Store_, CountsEachFrameOnceInWhateverOrderParcelsCome) {
    const std::vector<Parcel> parcels = parcelsOf(net5, 5, true);
    store(parcels);
    const std::string inOrder = everything();
    empty();
    std::vector<Parcel> mixed(parcels.rbegin(), parcels.rend());
    mixed.insert(mixed.end(), parcels.begin(), parcels.end());
    const std::vector<Parcel> others = parcelsOf(net5, 7, true);
    mixed.insert(mixed.end(), others.begin(), others.end());
    store(mixed, 3);
    EXPECT_EQ(everything(), inOrder);
}

TEST_F(Store_, GoesOnAfterAnyRestart) {
    const std::vector<Parcel> parcels = parcelsOf(net5, 4, true);
    store(parcels);
    const std::string atOnce = everything();
    ASSERT_NE(count("calls"), "0\n");
    empty();
    for (const Parcel& parcel : parcels)
        store({parcel});
    EXPECT_EQ(everything(), atOnce);
}

TEST_F(Store_, LosesAndRepeatsNothingWhenItEndsAtAnyStep) {
    const std::vector<Parcel> parcels = parcelsOf(net5, 4, true);
    store(parcels);
    const std::string undisturbed = everything();
    for (const std::string_view step :
         {"copied", "assembled", "written", "committed", "buried", "acknowledged"}) {
        SCOPED_TRACE(step);
        empty();
        FakeInbox inbox;
        inbox.hold(2);
        for (const Parcel& parcel : parcels)
            inbox.add(parcel);
        std::size_t kills = 0;
        // Each transaction is ended once at the step, and done by the next process.
        for (bool willEnd = true; !inbox.isEmpty(); willEnd = !willEnd) {
            pqxx::connection connection(url());
            const Steps steps = [&](std::string_view reached) {
                if (willEnd && reached == step)
                    throw Killed();
            };
            Partition partition(connection, partitionOf(parcels.front()), steps);
            try {
                moveOnce(inbox, partition, 0ms, steps);
            } catch (const Killed&) {
                ++kills;
            }
        }
        EXPECT_GT(kills, 3U);
        EXPECT_EQ(everything(), undisturbed);
    }
}

TEST_F(Store_, GoesOnWithOneConnectionAfterAStepThatFailed) {
    const std::vector<Parcel> parcels = parcelsOf(net5, 4, true);
    store(parcels);
    const std::string undisturbed = everything();
    empty();
    bool fails = false;
    pqxx::connection connection(url());
    Partition partition(connection, partitionOf(parcels.front()), [&](std::string_view reached) {
        if (reached == "written" && (fails = !fails))
            throw Killed();
    });
    for (const Parcel& parcel : parcels) {
        const Letter letter{toText(parcel.subject()), toText(parcel), 1};
        EXPECT_THROW(partition.take({&letter, 1}), Killed);
        EXPECT_TRUE(partition.take({&letter, 1}).empty());
    }
    EXPECT_EQ(everything(), undisturbed);
}

TEST_F(Store_, WaitsForAFrameThatIsMissing) {
    std::vector<Parcel> parcels = parcelsOf(net5, 4, true);
    const Parcel second = parcels[1];
    parcels.erase(parcels.begin() + 1);
    store(parcels);
    EXPECT_EQ(rows("SELECT assembled, finished FROM lapd.runs"), "5|f\n");
    EXPECT_EQ(rows("SELECT count(*) FROM lapd.frames WHERE number BETWEEN 5 AND 8"), "0\n");
    store({second});
    EXPECT_EQ(rows("SELECT finished FROM lapd.runs"), "t\n");
}

TEST_F(Store_, DoesNotWaitForFramesThatAreMissingForGood) {
    std::vector<Parcel> parcels = parcelsOf(net5, 4, true);
    parcels.erase(parcels.begin() + 1);
    parcels[1].gaps = {{5, 8, "the log was emptied"}};
    store(parcels);
    EXPECT_EQ(rows("SELECT finished FROM lapd.runs"), "t\n");
    EXPECT_EQ(rows("SELECT first, last, reason FROM lapd.gaps"), "5|8|the log was emptied\n");
}

TEST_F(Store_, FinishesARunWhoseEndIsUnknown) {
    std::vector<Parcel> parcels = parcelsOf(net5, 10);
    parcels.resize(2);
    Parcel end = parcels[1];
    end.first += end.frames.size();
    end.frames.clear();
    end.gaps = {{end.first, std::nullopt, "the log was emptied"}};
    end.end.emplace();
    parcels.push_back(end);
    store(parcels);
    EXPECT_EQ(rows("SELECT ended, assembled, finished FROM lapd.runs"), "21|21|t\n");
}

TEST_F(Store_, ShowsCallsThatAreOpen) {
    std::vector<Parcel> parcels = parcelsOf(overlap, 5);
    parcels.resize(1);
    store(parcels);
    EXPECT_EQ(rows("SELECT outcome, ended FROM lapd.calls"), "open|-\n");
}

TEST_F(Store_, BuriesWhatIsNoParcelAndStoresTheRest) {
    const std::vector<Parcel> parcels = parcelsOf(net5, 10, true);
    const std::string subject = toText(parcels[0].subject());
    Parcel foreign = parcels[0];
    foreign.address.host = "other";
    FakeInbox inbox;
    inbox.add("lapd.99.x", "{}");
    inbox.add(subject, "no JSON \xff");
    inbox.add(subject, toText(foreign));
    inbox.add(foreign);
    for (const Parcel& parcel : parcels)
        inbox.add(parcel);
    pqxx::connection connection(url());
    Partition partition(connection, partitionOf(parcels[0]));
    moveAll(inbox, partition);
    ASSERT_EQ(inbox.buried().size(), 4U);
    EXPECT_EQ(inbox.buried()[1].letter.text, "no JSON \xff");
    EXPECT_EQ(rows("SELECT sequence, reason FROM lapd.dead_letters WHERE sequence > 1 ORDER BY sequence"),
              "2|it is no JSON\n"
              "3|it is about another D channel than its subject\n"
              "4|it is of another partition\n");
    EXPECT_EQ(rows("SELECT finished FROM lapd.runs"), "t\n");
    EXPECT_EQ(partition.figures().deadLetters, 4U);
}

TEST_F(Store_, BuriesTheOneLetterThatTheDatabaseRefuses) {
    execute("ALTER TABLE lapd.frames ADD CONSTRAINT small CHECK (number <> 13)");
    const std::vector<Parcel> parcels = parcelsOf(net5, 5);
    FakeInbox inbox;
    for (const Parcel& parcel : parcels)
        inbox.add(parcel);
    pqxx::connection connection(url());
    Partition partition(connection, partitionOf(parcels[0]));
    moveAll(inbox, partition);
    ASSERT_EQ(inbox.buried().size(), 1U);
    EXPECT_EQ(inbox.buried()[0].letter.sequence, 3U);
    EXPECT_TRUE(inbox.buried()[0].reason.starts_with("the database does not take it: "));
    EXPECT_EQ(rows("SELECT assembled FROM lapd.runs"), "11\n");
    EXPECT_EQ(rows("SELECT sequence FROM lapd.positions"), std::to_string(parcels.size()) + "\n");
}

TEST_F(Store_, KeepsDaysInPartitionsAndForgetsThemWhole) {
    std::vector<Parcel> parcels = parcelsOf(net5, 1000, true);
    const auto now =
        std::chrono::duration_cast<std::chrono::nanoseconds>(
            std::chrono::floor<std::chrono::days>(std::chrono::system_clock::now()).time_since_epoch())
            .count();
    std::vector<ParcelFrame>& frames = parcels[0].frames;
    for (std::size_t i = 0; i < frames.size();
         ++i)  // half of them three days ago, the last one in the year 2100
        frames[i].item.time = now - (i < frames.size() / 2 ? 3 * 86'400'000'000'000 : 0);
    frames.back().item.time = 4'102'444'800'000'000'000;
    store(parcels);
    EXPECT_EQ(count("frames_other"), "1\n");
    EXPECT_EQ(rows("SELECT count(*) FROM pg_inherits WHERE inhparent = 'lapd.frames'::regclass"), "3\n");
    EXPECT_EQ(rows("SELECT lapd.forget_before(current_date - 1)"), "1\n");
    EXPECT_EQ(count("frames"), std::to_string(frames.size() - frames.size() / 2) + "\n");
}

// The first half is stored by another Partition, whose frames are read again: what came of them does not
// count twice.
TEST_F(Store_, CountsCallsAndFindingsOnceThoughItReadsFramesAgain) {
    for (const char* const name : {"/examples/net5.pcap", "/tests/reader/data/traps/overlap.hex"}) {
        SCOPED_TRACE(name);
        empty();
        const std::vector<Parcel> parcels = parcelsOf(source + name, 3, true);
        Outcomes sum;
        std::uint64_t frames = 0;
        for (const bool isSecond : {false, true}) {
            FakeInbox inbox;
            for (std::size_t i = 0; i < parcels.size(); ++i) {
                if ((i >= parcels.size() / 2) == isSecond || i == 0)
                    inbox.add(parcels[i]);
            }
            pqxx::connection connection(url());
            Partition partition(connection, partitionOf(parcels[0]));
            moveAll(inbox, partition);
            const TrunkFigures& trunk = partition.figures().trunks.at("london/h1/0/1");
            EXPECT_EQ(partition.figures().doubles, isSecond ? parcels[0].frames.size() : 0U);
            frames += partition.figures().frames;
            sum.add(trunk.outcomes);
        }
        EXPECT_EQ(std::to_string(frames) + "\n", count("frames"));
        EXPECT_EQ(std::to_string(sum.calls) + "\n",
                  rows("SELECT count(*) FROM lapd.calls WHERE ended IS NOT NULL"));
        std::string failed;
        for (const auto& [cause, number] : sum.failed)
            failed += (cause ? std::to_string(*cause) : "-") + "|" + std::to_string(number) + "\n";
        EXPECT_EQ(failed,
                  rows("SELECT cause, count(*) FROM lapd.calls WHERE failed GROUP BY 1 ORDER BY 1 NULLS "
                       "FIRST"));
        std::string findings;
        for (const auto& [kind, number] : sum.findings)
            findings += std::string(kind) + "|" + std::to_string(number) + "\n";
        EXPECT_EQ(findings,
                  rows("SELECT kind COLLATE \"C\", count(*) FROM lapd.findings GROUP BY 1 ORDER BY 1"));
    }
}

TEST_F(Store_, TellsItsFigures) {
    StoreFigures all;
    std::vector<Parcel> parcels = parcelsOf(net5, 1000);
    FakeInbox inbox;
    inbox.add(parcels[0]);
    inbox.add("lapd.1.x", "{}");
    pqxx::connection connection(url());
    Partition partition(connection, partitionOf(parcels[0]));
    moveAll(inbox, partition);
    partition.sawWaiting(7);
    all.set(17, partition.figures());
    all.turned(1, true);
    all.setEngines({1, 2, 3});
    const std::string text = all.text();
    const std::string labels =
        "{site=\"london\",trunk=\"london/h1/0/1\",name=\"" + parcels[0].trunk + "\",group=\"\"";
    const std::string calls = rows("SELECT count(*) FROM lapd.calls WHERE ended IS NOT NULL");
    for (const std::string& line : std::vector<std::string>{
             "lapdstore_partition_leased{partition=\"17\"} 1\n",
             "lapdstore_waiting_parcels{partition=\"17\"} 7\n",
             "lapdstore_dead_letters_total{partition=\"17\"} 1\n",
             "lapdstore_lag_seconds{partition=\"17\"} 0\n",
             "lapdstore_frames_total{partition=\"17\"} " + count("frames"),
             "lapdstore_trunk_frames_total" + labels + "} " + count("frames"),
             "lapdstore_calls_total" + labels + "} " + calls, "lapdstore_link_up" + labels + "} 1\n",
             "lapdstore_findings_total" + labels + ",kind=\"stuck-channel\"} 0\n",
             "lapdstore_connected{thread=\"1\"} 1\n", "lapdstore_database_bytes 1\n",
             std::string("lapdstore_stream_used_bytes 2\n"), std::string("lapdstore_stream_bytes 3\n")})
        EXPECT_NE(text.find("\n" + line), std::string::npos) << line << text;
    // What the link is now, not what it was.
    parcels[0].first += parcels[0].frames.size();
    ParcelItem disconnect = parcels[0].frames.back().item;
    disconnect.transmitted = false;
    disconnect.octets = {0x02, 0x01, 0x53};
    ParcelItem answer = disconnect;
    answer.transmitted = true;
    answer.octets = {0x02, 0x01, 0x73};
    parcels[0].frames = {{disconnect, {}}, {answer, {}}};
    inbox.add(parcels[0]);
    moveAll(inbox, partition);
    all.set(17, partition.figures());
    EXPECT_NE(all.text().find("\nlapdstore_link_up" + labels + "} 0\n"), std::string::npos);
    all.release(17);
    EXPECT_EQ(all.text().find("partition=\"17\""), std::string::npos);
}

TEST_F(Store_, GivesTheFiguresOfKnownTrunksFromTheBeginning) {
    const std::vector<Parcel> parcels = parcelsOf(net5, 1000);
    const unsigned partition = partitionOf(parcels[0]);
    pqxx::connection connection(url());
    StoreFigures all;
    all.set(partition, Partition(connection, partition).figures());
    EXPECT_EQ(all.text().find("site=\"london\""), std::string::npos);
    FakeInbox inbox;
    inbox.add(parcels[0]);
    Partition before(connection, partition);
    moveAll(inbox, before);
    all.set(partition, Partition(connection, partition).figures());
    const std::string text = all.text();
    const std::string labels =
        "{site=\"london\",trunk=\"london/h1/0/1\",name=\"" + parcels[0].trunk + "\",group=\"\"";
    for (const std::string& line :
         {"lapdstore_calls_total" + labels + "} 0\n", "lapdstore_trunk_frames_total" + labels + "} 0\n",
          "lapdstore_findings_total" + labels + ",kind=\"link-flap\"} 0\n"})
        EXPECT_NE(text.find("\n" + line), std::string::npos) << line << text;
    for (const std::string unknown : {"newest_frame_timestamp_seconds", "link_up"})
        EXPECT_EQ(text.find("\nlapdstore_" + unknown + "{"), std::string::npos) << text;
    const unsigned other = partition == 0 ? 1 : 0;
    all.set(other, Partition(connection, other).figures());
    all.release(partition);
    EXPECT_EQ(all.text().find("site=\"london\""), std::string::npos);
}

TEST_F(Store_, LetsWritersAddAndReadersReadAndNothingElse) {
    execute(
        "DO $$ BEGIN CREATE ROLE writes LOGIN IN ROLE lapd_writer; CREATE ROLE reads LOGIN IN ROLE "
        "lapd_reader; "
        "EXCEPTION WHEN duplicate_object THEN NULL; END $$");
    const std::vector<Parcel> parcels = parcelsOf(net5, 10, true);
    FakeInbox inbox;
    for (const Parcel& parcel : parcels)
        inbox.add(parcel);
    pqxx::connection writer(url("writes"));
    Partition partition(writer, partitionOf(parcels[0]));
    moveAll(inbox, partition);
    EXPECT_EQ(rows("SELECT finished FROM lapd.runs"), "t\n");

    pqxx::connection reader(url("reads"));
    EXPECT_NO_THROW(
        pqxx::nontransaction(reader).exec("SELECT * FROM lapd.frames, lapd.calls, lapd.findings"));
    EXPECT_NO_THROW(
        pqxx::nontransaction(reader).exec("SELECT * FROM lapd.joined_calls, lapd.joined_findings"));
    const auto refuses = [](pqxx::connection& connection, const std::string& sql) {
        EXPECT_THROW(pqxx::nontransaction(connection).exec(sql), pqxx::insufficient_privilege) << sql;
    };
    for (const char* const sql :
         {"DELETE FROM lapd.frames", "UPDATE lapd.frames SET role = 0", "DELETE FROM lapd.calls",
          "DELETE FROM lapd.trunks", "UPDATE lapd.findings SET count = 0", "DROP TABLE lapd.gaps",
          "SELECT lapd.forget_before(current_date)", "CREATE TABLE lapd.mine ()",
          "UPDATE lapd.migrations SET version = 0"})
        refuses(writer, sql);
    for (const char* const sql :
         {"INSERT INTO lapd.positions VALUES (1, 1)", "DELETE FROM lapd.calls",
          "UPDATE lapd.runs SET finished = false", "SELECT lapd.make_day(current_date)",
          "INSERT INTO lapd.dead_letters VALUES (1, '', '')"})
        refuses(reader, sql);

    execute(
        "DO $$ BEGIN CREATE ROLE keeps LOGIN IN ROLE lapd_keeper; EXCEPTION WHEN duplicate_object THEN NULL; "
        "END $$");
    pqxx::connection keeper(url("keeps"));
    for (const char* const sql : {"SELECT * FROM lapd.calls", "DELETE FROM lapd.calls",
                                  "DROP TABLE lapd.frames_other", "SELECT lapd.make_day(current_date)"})
        refuses(keeper, sql);
    EXPECT_NE(count("frames"), "0\n");
    EXPECT_NO_THROW(pqxx::nontransaction(keeper).exec("SELECT lapd.forget_before(current_date)"));
    EXPECT_EQ(count("frames"), "0\n");
}

// A letter that is acknowledged must survive a server that is killed.
TEST_F(Store_, CommitsForGoodWhereTheServerWouldNotWait) {
    struct Row {
        std::string configured;
        std::string expected;
    };
    for (const Row& row : {Row{"off", "on"}, Row{"on", "on"}, Row{"remote_apply", "remote_apply"}}) {
        pqxx::connection connection(url());
        pqxx::nontransaction(connection).exec("SET synchronous_commit = " + row.configured);
        const Partition partition(connection, 0);
        EXPECT_EQ(pqxx::nontransaction(connection).exec1("SHOW synchronous_commit")[0].c_str(), row.expected);
    }
}

TEST_F(Store_, LendsAPartitionToOneConnectionUntilThatEnds) {
    auto first = std::make_unique<pqxx::connection>(url());
    pqxx::connection second(url());
    {
        const Lease ours(*first, 17);
        EXPECT_TRUE(ours.isHeld());
        EXPECT_FALSE(Lease(second, 17).isHeld());
        EXPECT_TRUE(Lease(second, 18).isHeld());
    }
    EXPECT_TRUE(Lease(second, 17).isHeld());
    const Lease ours(*first, 17);
    const std::string backend = std::to_string(first->backendpid());
    EXPECT_FALSE(Lease(second, 17).isHeld());
    // The owner dies without a word. The server has let go of the lock once the backend is gone.
    pqxx::nontransaction(second).exec("SELECT pg_terminate_backend(" + backend + ", 10000)");
    EXPECT_TRUE(Lease(second, 17).isHeld());
}

}  // namespace fleet
