// The store as an input of lapdread: what it prints of the store is what it prints of the files.
#include <array>
#include <cstdio>
#include <filesystem>
#include <memory>

#include "StoreFixture.h"

namespace fleet {

namespace {

using namespace std::chrono_literals;

const std::string source = LAPDMON_SOURCE_DIR;

// What lapdread prints, its messages included, and how it ended.
std::string lapdread(const std::string& words) {
    const std::string command = "TZ=UTC " + std::string(std::getenv("LAPDREAD")) + " " + words + " 2>&1";
    const std::unique_ptr<std::FILE, int (*)(std::FILE*)> pipe(popen(command.c_str(), "r"), pclose);
    std::string text;
    std::array<char, 4096> part{};
    while (const std::size_t size = std::fread(part.data(), 1, part.size(), pipe.get()))
        text.append(part.data(), size);
    return text;
}

// Inputs whose frames have dates: only these can be shipped.
std::vector<std::string> recordings() {
    std::vector<std::string> files;
    for (const char* const folder : {"examples", "tests/reader/data", "tests/reader/data/traps"}) {
        for (const auto& entry : std::filesystem::directory_iterator(source + "/" + folder)) {
            const std::string ending = entry.path().extension();
            if (ending == ".pcap" || ending == ".hex")
                files.push_back(entry.path());
        }
    }
    std::sort(files.begin(), files.end());
    return files;
}

bool hasDates(const std::string& file) {
    const std::vector<Parcel> parcels = parcelsOf(file, 1000);
    for (const Parcel& parcel : parcels) {
        for (const ParcelFrame& frame : parcel.frames) {
            if (!frame.item.time)
                return false;
        }
    }
    return true;
}

class StoreAsInput : public StoreTest {
  protected:
    void store(const std::vector<Parcel>& parcels) {
        pqxx::connection connection(url());
        Partition partition(connection, parcels.front().subject().partition);
        FakeInbox inbox;
        for (const Parcel& parcel : parcels)
            inbox.add(parcel);
        while (moveOnce(inbox, partition, 0ms, [](std::string_view) {}) != 0) {
        }
        EXPECT_TRUE(inbox.buried().empty());
    }
    std::string ofStore(const std::string& words) const {
        return lapdread(words + " --store '" + url() + "'");
    }
};

}  // namespace

TEST_F(StoreAsInput, PrintsWhatTheFilesPrint) {
    std::size_t compared = 0;
    for (const std::string& file : recordings()) {
        if (!hasDates(file))
            continue;
        SCOPED_TRACE(file);
        ++compared;
        empty();
        store(parcelsOf(file, 7, true));
        std::vector<std::string> commands{
            "list --columns n,time,delta,trunk,ticks,dir,link,message,details,marks,hex",
            "calls --jsonl --sort start", "check --jsonl"};
        if (file.ends_with("net5.pcap") || file.ends_with("national-bri.hex"))
            commands = {"list",           "list --relative", "list --message SETUP,DISCONNECT",
                        "list --first 3", "calls",           "calls --failed",
                        "ladder",         "check",           "stats"};
        for (const std::string& command : commands) {
            SCOPED_TRACE(command);
            std::string expected = lapdread(command + " " + file);
            // The place of a frame is the one thing that differs.
            const std::string named = "\"file\":\"" + file + "\"";
            for (std::size_t at = 0; (at = expected.find(named, at)) != std::string::npos;)
                expected.replace(at, named.size(), "\"file\":\"london/h1/0/1\"");
            EXPECT_EQ(ofStore(command), expected);
        }
    }
    EXPECT_GT(compared, 20U);
}

TEST_F(StoreAsInput, HasTheCallsOfItsTableAsLapdreadHasThem) {
    for (const std::string& file : recordings()) {
        if (!hasDates(file))
            continue;
        SCOPED_TRACE(file);
        empty();
        store(parcelsOf(file, 7, true));
        const std::string table = rows(
            "SELECT format('\"callref\":\"%s\",\"origin\":\"%s\",\"dir\":\"%s\",\"kind\":\"%s\"', callref, "
            "origin, dir, "
            "kind), first_frame, last_frame, outcome, ended_by, cleared_by, coalesce(cause::text, 'null') "
            "FROM lapd.calls ORDER BY first_frame");
        // The same of lapdread's objects.
        std::string expected;
        const std::string objects = lapdread("calls --jsonl --sort start " + file);
        const auto value = [](const std::string& line, const std::string& key) {
            const std::size_t at = line.find("\"" + key + "\":") + key.size() + 3;
            std::string text = line.substr(at, line.find_first_of(",}", at) - at);
            std::erase(text, '"');
            return text;
        };
        std::map<std::uint64_t, std::string> inOrder;
        for (std::size_t at = 0, end = 0; (end = objects.find('\n', at)) != std::string::npos; at = end + 1) {
            const std::string line = objects.substr(at, end - at);
            std::string text;
            for (const std::string key : {"callref", "origin", "dir", "kind"})
                text += (text.empty() ? "\"" : ",\"") + key + "\":\"" + value(line, key) + "\"";
            for (const std::string key :
                 {"first_frame", "last_frame", "outcome", "ended_by", "cleared_by", "cause"})
                text += "|" + value(line, key);
            inOrder[std::stoull(value(line, "first_frame"))] = text + "\n";
        }
        for (const auto& [frame, text] : inOrder)
            expected += text;
        EXPECT_EQ(table, expected);
    }
}

TEST_F(StoreAsInput, ChoosesTrunksAndSites) {
    const std::string pri = source + "/examples/net5.pcap";
    const std::string other = source + "/examples/ni2.pcap";
    store(parcelsOf(pri, 100, true, "london"));
    store(parcelsOf(other, 100, true, "paris"));
    EXPECT_EQ(ofStore("list --site london"), lapdread("list " + pri));
    EXPECT_EQ(ofStore("list --trunk ni2"), lapdread("list " + other));
    EXPECT_EQ(ofStore("list --trunk paris/h1/0/1"), lapdread("list " + other));
    EXPECT_EQ(ofStore("calls --trunk net5,ni2"), lapdread("calls --merge " + pri + " " + other));
    EXPECT_EQ(ofStore("calls"), lapdread("calls --merge " + pri + " " + other));
}

TEST_F(StoreAsInput, TellsTrunksOfOneNameApartByTheirAddresses) {
    const std::string file = source + "/examples/net5.pcap";
    store(parcelsOf(file, 100, true, "london"));
    store(parcelsOf(file, 100, true, "paris"));
    EXPECT_EQ(ofStore("list --columns trunk --site paris --first 1"), "paris/h1/0/1\n");
}

TEST_F(StoreAsInput, ReadsTheDaysAroundTheTimesThatAreAskedFor) {
    const std::string file = source + "/tests/reader/data/traps/three-days.hex";
    store(parcelsOf(file, 100, true));
    // The call began days before: it is read whole.
    const std::string last = rows(
        "SELECT to_char(max(ended) - interval '1 second', 'YYYY-MM-DD\"T\"HH24:MI:SS\"Z\"') "
        "FROM lapd.calls");
    const std::string since = " --since " + last.substr(0, last.size() - 1);
    const std::string columns = "--columns time,message,details";
    EXPECT_EQ(ofStore("list " + columns + since), lapdread("list " + columns + since + " " + file));
    EXPECT_EQ(ofStore("calls" + since), lapdread("calls" + since + " " + file));
    EXPECT_NE(ofStore("calls" + since).find("3d"), 0U);
}

TEST_F(StoreAsInput, SaysWhatIsMissingAsALoss) {
    std::vector<Parcel> parcels = parcelsOf(source + "/examples/net5.pcap", 4, true);
    parcels.erase(parcels.begin() + 1);
    store(parcels);
    EXPECT_NE(ofStore("list").find("frames lost by the recorder: 4"), std::string::npos) << ofStore("list");
}

TEST_F(StoreAsInput, RefusesWhatItCannotDo) {
    store(parcelsOf(source + "/examples/net5.pcap", 100, true));
    EXPECT_EQ(ofStore("list --trunk pri9"), "lapdread: the store: it has no trunk pri9\n");
    EXPECT_EQ(ofStore("list --site rome"), "lapdread: the store: it has no site rome\n");
    EXPECT_EQ(ofStore("list day.log"), "lapdread: --store takes the place of files: day.log\n");
    EXPECT_EQ(ofStore("list --follow"), "lapdread: --follow takes a file; a store is read as it is now\n");
    EXPECT_EQ(ofStore("diff a b"), "lapdread: diff takes files; --store is for other commands\n");
    EXPECT_EQ(lapdread("list --site london " + source + "/examples/net5.pcap"),
              "lapdread: --site chooses among the trunks of a store: name it with --store URL\n");
    EXPECT_EQ(lapdread("list --store '" + urlOf("postgres") + "'"),
              "lapdread: the store: it has no tables of lapdstore (lapdstore migrate makes them)\n");
    EXPECT_TRUE(lapdread("list --store postgresql://nobody@/lapd?host=/nowhere")
                    .starts_with("lapdread: the store: "));
}

}  // namespace fleet
