// The store as an input of lapdread: what it prints of the store is what it prints of the files.
#include <filesystem>
#include <map>

#include "StoreFixture.h"

namespace fleet {

namespace {

using namespace std::chrono_literals;

const std::string source = LAPDMON_SOURCE_DIR;

// What lapdread prints, its messages included.
std::string lapdread(const std::string& words) {
    return outputOf("TZ=UTC " + std::string(std::getenv("LAPDREAD")) + " " + words + " 2>&1");
}

// lapdread browse in a terminal of its own, which is tmux.
class Screen {
  public:
    explicit Screen(const std::string& words) {
        folder_ = std::filesystem::temp_directory_path() / "lapd-screen.XXXXXX";
        if (mkdtemp(folder_.data()) == nullptr)
            throw std::runtime_error("cannot make a folder");
        const std::string command =
            "TZ=UTC " + std::string(std::getenv("LAPDREAD")) + " browse --ascii " + words;
        tmux("-f /dev/null new-session -d -x 110 -y 40 \"" + command + "\"");
    }
    ~Screen() {
        tmux("kill-server");
        std::error_code ignored;
        std::filesystem::remove_all(folder_, ignored);
    }
    Screen(const Screen&) = delete;
    Screen& operator=(const Screen&) = delete;

    void press(const std::string& keys) const { tmux("send-keys " + keys); }
    // All but the first line, which names what is read, as soon as it has the text.
    std::string with(const std::string& text) const {
        const auto end = std::chrono::steady_clock::now() + 100s;
        std::string shown;
        do
            shown = tmux("capture-pane -p");
        while (shown.find(text) == std::string::npos && std::chrono::steady_clock::now() < end);
        EXPECT_NE(shown.find(text), std::string::npos) << shown;
        return shown.substr(shown.find('\n') + 1);
    }
    std::string firstLine() const {
        const std::string shown = tmux("capture-pane -p");
        return shown.substr(0, shown.find('\n'));
    }

  private:
    std::string tmux(const std::string& words) const {
        return outputOf("env -u TMUX TERM=screen LC_ALL=C.UTF-8 tmux -S " + folder_ + "/socket " + words +
                        " 2>&1");
    }

    std::string folder_;
};

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
            commands = {"list",
                        "list --relative",
                        "list --message SETUP,DISCONNECT",
                        "list --first 3",
                        "calls",
                        "calls --failed",
                        "ladder",
                        "check",
                        "stats",
                        "stats --csv",
                        "check --level warning"};
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
    EXPECT_EQ(ofStore("list --trunk ni2 --site london,paris"), lapdread("list " + other));
    EXPECT_EQ(ofStore("list --trunk ni2 --site london"),
              "lapdread: the store: it has no trunk of these sites: ni2\n");
    EXPECT_EQ(ofStore("calls --trunk net5,ni2"), lapdread("calls --merge " + pri + " " + other));
    EXPECT_EQ(ofStore("calls"), lapdread("calls --merge " + pri + " " + other));
}

TEST_F(StoreAsInput, SaysWhereANumberIsNotFoundBecausePseudonymsStandInItsPlace) {
    const std::string pri = source + "/examples/net5.pcap";
    store(parcelsOf(pri, 100, true, "london"));
    std::vector<Parcel> redacted = parcelsOf(source + "/examples/ni2.pcap", 100, true, "paris");
    for (Parcel& parcel : redacted)
        parcel.isRedacted = true;
    store(redacted);
    const std::string note =
        "lapdread: pseudonyms stand in place of the numbers of ni2: a number is compared with "
        "the pseudonym there\n";
    EXPECT_NE(ofStore("list --number 0").find(note), std::string::npos);
    EXPECT_EQ(ofStore("list --site london --number 0").find(note), std::string::npos);
    EXPECT_EQ(ofStore("list --quiet --number 0").find(note), std::string::npos);
    EXPECT_EQ(ofStore("list").find(note), std::string::npos);
}

TEST_F(StoreAsInput, JoinsTheDChannelsOfAGroupAsNfasDoes) {
    const std::string traps = source + "/tests/reader/data/traps/changeover-";
    std::string files;
    for (const std::string half : {"a", "b"}) {
        std::vector<Parcel> parcels = parcelsOf(traps + half + ".hex", 7, true);
        for (Parcel& parcel : parcels) {
            parcel.address.dChannel = half;
            parcel.group = "nfas-a";
        }
        store(parcels);
        files += " " + traps + half + ".hex";
    }
    const std::string nfas = " --merge --nfas changeover-a,changeover-b" + files;
    for (const std::string command : {"calls", "check", "stats", "ladder", "list --callref 1"}) {
        SCOPED_TRACE(command);
        EXPECT_EQ(ofStore(command), lapdread(command + nfas));
    }
    // The call of the group goes on over the other D channel; apart, they tell another story.
    EXPECT_NE(ofStore("calls"), lapdread("calls --merge" + files));
    EXPECT_EQ(ofStore("calls --trunk changeover-a"), lapdread("calls" + files.substr(0, files.rfind(' '))));
    // Two sites may use one name for their groups.
    execute("UPDATE lapd.trunks SET site = 'paris' WHERE dchannel = 'b'");
    EXPECT_EQ(ofStore("calls"), lapdread("calls --merge" + files));
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

TEST_F(StoreAsInput, SaysOnceWhatTheRecorderHasSaidToBeLost) {
    std::vector<Parcel> parcels = parcelsOf(source + "/examples/net5.pcap", 4, true);
    parcels.erase(parcels.begin() + 1);
    fleet::ParcelItem lost;
    lost.kind = capture::Item::Kind::lost;
    lost.count = 4;
    parcels[1].frames.front().before.push_back(lost);
    store(parcels);
    const std::string listed = ofStore("list");
    const std::string told = "frames lost by the recorder: ";
    const std::size_t first = listed.find(told + "4\n");
    EXPECT_NE(first, std::string::npos) << listed;
    EXPECT_EQ(listed.find(told, first + 1), std::string::npos) << listed;
}

TEST_F(StoreAsInput, ComparesCallsAndDChannelsAsItComparesFiles) {
    const std::string pri = source + "/examples/net5.pcap";
    const std::string other = source + "/examples/ni2.pcap";
    store(parcelsOf(pri, 100, true, "london"));
    store(parcelsOf(other, 100, true, "paris"));
    // Files are called by their names, and D channels by theirs.
    const auto named = [](std::string text, const std::string& file, const std::string& name) {
        for (std::size_t at = 0; (at = text.find(file, at)) != std::string::npos;)
            text.replace(at, file.size(), name);
        return text;
    };
    for (const std::string options : {"", "--with time,channel", "--jsonl"}) {
        SCOPED_TRACE(options);
        EXPECT_EQ(ofStore("diff " + options + " net5#1 net5#2"),
                  named(lapdread("diff " + options + " " + pri + "#1 " + pri + "#2"), pri, "net5"));
        EXPECT_EQ(ofStore("diff " + options + " net5 paris/h1/0/1"),
                  named(named(lapdread("diff " + options + " " + pri + " " + other), pri, "net5"), other,
                        "paris/h1/0/1"));
    }
    EXPECT_EQ(ofStore("diff --trunk net5 '#1' '#2'"),
              named(lapdread("diff " + pri + "#1 " + pri + "#2"), pri, "the store: net5"));
}

TEST_F(StoreAsInput, ReportsWhatTheFileReports) {
    const std::string file = source + "/examples/net5.pcap";
    store(parcelsOf(file, 7, true));
    std::string expected = lapdread("report " + file);
    const std::string title = "Report of net5.pcap";
    ASSERT_NE(expected.find(title), std::string::npos);
    for (std::size_t at = 0; (at = expected.find(title, at)) != std::string::npos;)
        expected.replace(at, title.size(), "Report of the store: london");
    EXPECT_EQ(ofStore("report --site london"), expected);
    EXPECT_EQ(ofStore("report --site london").find("postgresql"), std::string::npos)
        << "a URL may hold a password";
}

TEST_F(StoreAsInput, BrowsesWhatTheFileHolds) {
    if (outputOf("tmux -V 2>&1").substr(0, 4) != "tmux")
        GTEST_SKIP() << "there is no tmux";
    const std::string file = source + "/examples/net5.pcap";
    store(parcelsOf(file, 7, true));
    const Screen ofFile(file), ofTheStore("--store '" + url() + "'");
    const auto both = [&](const std::string& keys, const std::string& text) {
        SCOPED_TRACE(keys);
        for (const Screen* const each : {&ofFile, &ofTheStore})
            each->press(keys);
        // A terminal may be asked while it is half drawn.
        const auto end = std::chrono::steady_clock::now() + 100s;
        std::string one = ofTheStore.with(text), other = ofFile.with(text);
        while (one != other && std::chrono::steady_clock::now() < end) {
            one = ofTheStore.with(text);
            other = ofFile.with(text);
        }
        EXPECT_EQ(one, other);
    };
    ofFile.with("Calls: 6");
    ofTheStore.with("Calls: 6");
    EXPECT_NE(ofTheStore.firstLine().find("the store"), std::string::npos) << ofTheStore.firstLine();
    both("Home", ">     1");
    both("Enter", "Ladder of call 1");
    both("Down Enter", "Frame 7 of call 1");
    both("Escape", "Ladder of call 1");
    both("q", "Calls: 6");
    both("Tab", "Findings:");
    both("BTab BTab", "1 D channel");
}

TEST_F(StoreAsInput, RefusesWhatItCannotDo) {
    store(parcelsOf(source + "/examples/net5.pcap", 100, true));
    EXPECT_EQ(ofStore("list --trunk pri9"), "lapdread: the store: it has no trunk pri9\n");
    EXPECT_EQ(ofStore("list --site rome"), "lapdread: the store: it has no site rome\n");
    EXPECT_EQ(ofStore("list day.log"), "lapdread: --store takes the place of files: day.log\n");
    EXPECT_EQ(ofStore("list --follow"), "lapdread: --follow takes a file; a store is read as it is now\n");
    EXPECT_EQ(ofStore("redact a"), "lapdread: redact takes files; --store is for other commands\n");
    EXPECT_EQ(ofStore("diff net5"),
              "lapdread: diff takes two D channels of a store, or calls of them: lapdread diff --store URL "
              "pri1#3 pri2#7\n");
    EXPECT_EQ(ofStore("diff net5#1 pri9#1"), "lapdread: the store: it has no trunk pri9\n");
    EXPECT_EQ(ofStore("diff net5#1 '#99'"), "lapdread: the store has no message of a call 99\n");
    EXPECT_EQ(lapdread("list --site london " + source + "/examples/net5.pcap"),
              "lapdread: --site chooses among the trunks of a store: name it with --store URL\n");
    EXPECT_EQ(lapdread("list --store '" + urlOf("postgres") + "'"),
              "lapdread: the store: it has no tables of lapdstore (lapdstore migrate makes them)\n");
    EXPECT_TRUE(lapdread("list --store postgresql://nobody@/lapd?host=/nowhere")
                    .starts_with("lapdread: the store: "));
}

}  // namespace fleet
