// Calls that pass several D channels of a group: what SQL says of them is what lapdread says of the group.
#include <functional>
#include <map>
#include <nlohmann/json.hpp>

#include "StoreFixture.h"
#include "isdn/Layer3.h"
#include "tests/calls/CallScript.h"

namespace fleet {

namespace {

using namespace std::chrono_literals;
using namespace calls::test;
using calls::Side;
namespace m = isdn::message;

// 2026-01-05 08:00:00 UTC, in nanoseconds.
constexpr std::int64_t began = 1'767'600'000'000'000'000;

const Bytes disc{0x53}, ua{0x73}, sabme{0x7F};

void talk(CallScript& script, std::int64_t at, std::uint16_t reference) {
    script.at(at).us(
        m::setup, reference, false,
        {bearerSpeech(), channel(static_cast<std::uint8_t>(reference)), calling("0301"), called("4021")});
    script.at(at + 50).peer(m::callProceeding, reference, true,
                            {channel(static_cast<std::uint8_t>(reference))});
    script.at(at + 900).peer(m::connect, reference, true).us(m::connectAcknowledge, reference, false);
}
void ring(CallScript& script, std::int64_t at, std::uint16_t reference) {
    script.at(at).us(m::setup, reference, false, {bearerSpeech(), channel(1), called("4021")});
    script.at(at + 50).peer(m::callProceeding, reference, true, {channel(1)});
    script.at(at + 500).peer(m::alerting, reference, true);
}
void clear(CallScript& script, std::int64_t at, std::uint16_t reference, std::uint8_t value = 16) {
    script.at(at).us(m::disconnect, reference, false, {cause(value)});
    script.peer(m::release, reference, true).us(m::releaseComplete, reference, false);
}
// The link of the D channel of the frames before goes down and stays so for longer than T309, which its next
// frame shows.
void lose(CallScript& script, std::int64_t at) {
    script.at(at).raw(Side::peer, true, disc).raw(Side::us, false, ua);
    script.at(at + 100'000).raw(Side::us, true, sabme);
}

struct Story {
    const char* says;
    void (*tell)(CallScript& a, CallScript& b);
};

// Each D channel has a script of its own; a story's times are those of both.
constexpr Story stories[] = {
    {"a call is cleared on the other D channel",
     [](CallScript& a, CallScript& b) {
         talk(a, 1000, 1);
         clear(b, 60'000, 1);
     }},
    {"the link is down for longer than T309, and the call goes on",
     [](CallScript& a, CallScript& b) {
         talk(a, 1000, 1);
         lose(a, 20'000);
         clear(b, 180'000, 1);
     }},
    {"there and back",
     [](CallScript& a, CallScript& b) {
         talk(a, 1000, 1);
         b.at(30'000).peer(m::statusEnquiry, 1, true).us(m::status, 1, false, {cause(30), callState(10)});
         clear(a, 90'000, 1);
     }},
    {"a call that rings is abandoned",
     [](CallScript& a, CallScript& b) {
         ring(a, 1000, 1);
         clear(b, 8000, 1);
     }},
    {"a call that rings is answered",
     [](CallScript& a, CallScript& b) {
         ring(a, 1000, 1);
         b.at(8000).peer(m::connect, 1, true).us(m::connectAcknowledge, 1, false);
         clear(b, 20'000, 1);
     }},
    {"a call that rings is refused",
     [](CallScript& a, CallScript& b) {
         ring(a, 1000, 1);
         b.at(8000).peer(m::disconnect, 1, true, {cause(17)}).us(m::release, 1, false);
         b.peer(m::releaseComplete, 1, true);
     }},
    {"an answered call fails",
     [](CallScript& a, CallScript& b) {
         talk(a, 1000, 1);
         clear(b, 60'000, 1, 41);
     }},
    {"a call that rings fails",
     [](CallScript& a, CallScript& b) {
         ring(a, 1000, 1);
         b.at(8000).peer(m::disconnect, 1, true, {cause(34)}).us(m::release, 1, false);
         b.peer(m::releaseComplete, 1, true);
     }},
    {"there and back, and then another call the same way",
     [](CallScript& a, CallScript& b) {
         talk(a, 1000, 1);
         b.at(30'000).peer(m::statusEnquiry, 1, true).us(m::status, 1, false, {cause(30), callState(10)});
         clear(a, 90'000, 1);
         talk(a, 100'000, 1);
         clear(a, 120'000, 1);
     }},
    {"a reference is used again on the other D channel",
     [](CallScript& a, CallScript& b) {
         talk(a, 1000, 1);
         talk(b, 60'000, 1);
         clear(b, 90'000, 1);
     }},
    {"both sides use one reference, and one of the calls ends before the change",
     [](CallScript& a, CallScript& b) {
         talk(a, 1000, 1);
         a.at(3000).peer(m::setup, 1, false, {bearerSpeech(), channel(2), called("0301")});
         a.at(3100).us(m::connect, 1, true).peer(m::connectAcknowledge, 1, false);
         clear(a, 5000, 1);
         b.at(60'000).peer(m::disconnect, 1, false, {cause(16)}).us(m::release, 1, true);
         b.peer(m::releaseComplete, 1, false);
     }},
    {"references of one octet and of two name one call",
     [](CallScript& a, CallScript& b) {
         talk(a, 1000, 1);
         clear(b.shortReferences(), 60'000, 1);
     }},
    {"a call that is still open",
     [](CallScript& a, CallScript& b) {
         talk(a, 1000, 1);
         b.at(30'000).peer(m::statusEnquiry, 1, true).us(m::status, 1, false, {cause(30), callState(10)});
     }},
    {"calls that stay where they are",
     [](CallScript& a, CallScript& b) {
         talk(a, 1000, 1);
         clear(a, 5000, 1);
         talk(b, 10'000, 1);
         clear(b, 15'000, 1);
     }},
    {"the clearing begins on one D channel and ends on the other, whose numbers are lower",
     [](CallScript& a, CallScript& b) {
         talk(a, 1000, 1);
         a.at(20'000).us(m::disconnect, 1, false, {cause(16)});
         b.at(21'000).peer(m::release, 1, true).us(m::releaseComplete, 1, false);
     }},
};

Parcel parcelOf(const CallScript& script, const std::string& dChannel, bool ends) {
    Parcel parcel;
    parcel.address = {"london", "h1", "0", dChannel};
    parcel.trunk = dChannel;
    parcel.group = "nfas-a";
    parcel.variant = capture::Variant::net5;
    parcel.run = 1;
    for (const Sent& sent : script.frames()) {
        ParcelFrame frame;
        frame.item.kind = capture::Item::Kind::frame;
        frame.item.time = began + sent.at;
        frame.item.transmitted = sent.frame.transmitted;
        frame.item.octets = sent.octets;
        parcel.frames.push_back(frame);
    }
    if (ends)
        parcel.end.emplace();
    return parcel;
}

class JoinedCalls : public StoreTest {
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
        figures_ = partition.figures();
    }
    void store(const Story& story, bool ends = true) {
        CallScript a, b;
        a.on("a").at(0).linkUp();
        b.on("b").at(0).linkUp();
        story.tell(a, b);
        store({parcelOf(b, "b", ends), parcelOf(a, "a", ends)});
    }

    // A line for each call of the group, from lapdread.
    std::string told(const std::string& options = "") const {
        const std::string objects =
            outputOf("TZ=UTC " + std::string(std::getenv("LAPDREAD")) +
                     " calls --jsonl --sort start --store '" + url() + "' " + options);
        std::string text;
        for (std::size_t at = 0, end = 0; (end = objects.find('\n', at)) != std::string::npos; at = end + 1) {
            const auto call = nlohmann::json::parse(objects.substr(at, end - at));
            for (const char* const key : {"dchannel", "start", "end", "callref", "origin", "dir", "kind",
                                          "calling", "called", "channel", "duration_ms", "outcome",
                                          "ended_by", "cleared_by", "cause", "made", "causes", "flags"}) {
                const auto& value = call.at(key);
                text += (value.is_string() ? value.get<std::string>()
                         : value.is_null() ? ""
                                           : value.dump()) +
                        "|";
            }
            text += '\n';
        }
        return text;
    }
    // The same from SQL.
    std::string asked(const std::string& where = "true") const {
        const std::string moment = ", 'YYYY-MM-DD\"T\"HH24:MI:SS.MS')";
        return rows("SELECT name, to_char(began AT TIME ZONE 'UTC'" + moment +
                    " || '+00:00', coalesce(to_char(ended AT TIME "
                    "ZONE 'UTC'" +
                    moment +
                    " || '+00:00', ''), callref, origin, dir, kind, calling, called, channel, "
                    "coalesce(duration_ms::text, ''), outcome, ended_by, cleared_by, coalesce(cause::text, "
                    "''), made, causes, "
                    "flags, '' FROM lapd.joined_calls JOIN lapd.trunks USING (trunk) WHERE " +
                    where + " ORDER BY began, first_frame");
    }

    PartitionFigures figures_;
};

}  // namespace

TEST_F(JoinedCalls, AreTheCallsOfLapdread) {
    for (const Story& story : stories) {
        SCOPED_TRACE(story.says);
        empty();
        store(story);
        EXPECT_EQ(asked(), told());
        EXPECT_EQ(asked("failed"), told("--failed"));
    }
}

TEST_F(JoinedCalls, SayWhereTheirPartsAre) {
    store(stories[1]);
    EXPECT_EQ(
        rows("SELECT t.name, l.name, parts, first_frame, last_frame, flags, failed FROM lapd.joined_calls c "
             "JOIN lapd.trunks t USING (trunk) JOIN lapd.trunks l ON l.trunk = c.last_trunk"),
        "a|b|2|3|5||f\n");
    EXPECT_EQ(rows("SELECT name, ended_by, failed FROM lapd.calls JOIN lapd.trunks USING (trunk) ORDER BY 1"),
              "a|link|t\nb|release|f\n");
    // The clearing began on one D channel and ended on the other.
    empty();
    store({"", [](CallScript& a, CallScript& b) {
               talk(a, 1000, 1);
               a.at(20'000).us(m::disconnect, 1, false, {cause(31)});
               b.at(21'000).peer(m::release, 1, true, {cause(16)}).us(m::releaseComplete, 1, false);
           }});
    EXPECT_EQ(rows("SELECT outcome, ended_by, cleared_by, cause, causes FROM lapd.joined_calls"),
              "answered|release|us|31|16\n");
}

TEST_F(JoinedCalls, AreFoundWhileTheyAreOpen) {
    store(stories[0], false);
    EXPECT_EQ(rows("SELECT outcome, ended_by, called, parts FROM lapd.joined_calls"),
              "answered|release|4021|2\n");
}

// Each D channel's runs end and begin anew.
TEST_F(JoinedCalls, GoOnInTheNextRun) {
    CallScript first, second;
    first.on("a").at(0).linkUp();
    talk(first, 1000, 1);
    second.on("a").at(40'000).linkUp();
    clear(second, 60'000, 1);
    Parcel again = parcelOf(second, "a", true);
    again.run = 2;
    store({parcelOf(first, "a", true), again});
    EXPECT_EQ(rows("SELECT parts, run, last_run, outcome, duration_ms FROM lapd.joined_calls"),
              "2|1|2|answered|58100\n");
}

// The other D channel of a group, that of another group, and one without a group.
TEST_F(JoinedCalls, LeaveOthersAlone) {
    CallScript a, b;
    a.on("a").at(0).linkUp();
    b.on("b").at(0).linkUp();
    stories[0].tell(a, b);
    for (const std::string group : {"", "nfas-b"}) {
        SCOPED_TRACE(group);
        empty();
        Parcel other = parcelOf(b, "b", true);
        other.group = group;
        store({parcelOf(a, "a", true)});
        store({other});
        EXPECT_EQ(rows("SELECT count(*) FROM lapd.joined_calls"), "2\n");
        EXPECT_EQ(rows("SELECT count(*) FROM lapd.joined_calls WHERE parts <> 1"), "0\n");
    }
}

TEST_F(JoinedCalls, AreNoLostCallsInTheFindings) {
    struct {
        std::uint16_t calls;
        const char* lost;
    } const cases[] = {{1, "stuck-channel\n"}, {6, "mass-clear\n"}};
    for (const auto& each : cases) {
        for (const bool goesOn : {false, true}) {
            SCOPED_TRACE(std::string(each.lost) + (goesOn ? "goes on" : "is lost"));
            empty();
            CallScript a, b;
            a.on("a").at(0).linkUp();
            b.on("b").at(0).linkUp();
            for (std::uint16_t call = 1; call <= each.calls; ++call)
                talk(a, call * 2000, call);
            lose(a, 20'000);
            a.at(200'000).linkUp().at(400'000).poll(Side::us);
            for (std::uint16_t call = 1; goesOn && call <= each.calls; ++call)
                clear(b, 180'000 + call * 2000, call);
            store({parcelOf(a, "a", true), parcelOf(b, "b", true)});
            EXPECT_EQ(rows("SELECT kind FROM lapd.findings"), each.lost);
            EXPECT_EQ(rows("SELECT kind FROM lapd.joined_findings"), goesOn ? "" : each.lost);
            // Calls that the link has ended may go on, so they are counted where they end.
            EXPECT_EQ(rows("SELECT count(*) FROM lapd.calls WHERE ended_by = 'link'"),
                      std::to_string(each.calls) + "\n");
            const Outcomes& left = figures_.trunks.at("london/h1/0/a").outcomes;
            EXPECT_EQ(left.calls, 0U);
            EXPECT_TRUE(left.failed.empty());
            EXPECT_EQ(figures_.trunks.at("london/h1/0/b").outcomes.calls, goesOn ? each.calls : 0U);
        }
    }
}

// The D channel that waits answers SABME with DM.
TEST_F(JoinedCalls, HaveAStandbyThatIsHealthy) {
    CallScript a, b;
    a.on("a").at(0).linkUp();
    talk(a, 1000, 1);
    clear(a, 5000, 1);
    b.on("b").at(0).raw(Side::us, true, sabme).raw(Side::peer, false, {0x1F});
    store({parcelOf(a, "a", true), parcelOf(b, "b", true)});
    EXPECT_EQ(rows("SELECT kind FROM lapd.findings"), "");
}

// A database of the version before has rows of calls already.
TEST_F(JoinedCalls, AreThoseOfRowsFromBeforeTheMigration) {
    execute("DROP SCHEMA lapd CASCADE");
    {
        pqxx::work work(*owner_);
        for (const Migration& step : migrations().first(3)) {
            work.exec(std::string(step.sql));
            if (step.version == 1)
                work.exec("CREATE TABLE lapd.migrations (version integer PRIMARY KEY, name text NOT NULL)");
        }
        work.exec("INSERT INTO lapd.migrations VALUES (1, ''), (2, ''), (3, '')");
        work.commit();
    }
    store(stories[0]);
    EXPECT_EQ(migrate(*owner_).size(), migrations().size() - 3);
    EXPECT_EQ(rows("SELECT parts, outcome FROM lapd.joined_calls"), "2|answered\n");
}

// A shipper that is not ours sends what it likes.
TEST_F(JoinedCalls, AreMadeInFewStepsOfALongChainOfRows) {
    constexpr int length = 100;
    store(stories[0]);
    execute("DELETE FROM lapd.calls WHERE flags LIKE 'before-trace%'");
    execute("UPDATE lapd.calls SET ended_by = 'open', ended = NULL, flags = 'open'");
    execute(
        "INSERT INTO lapd.calls SELECT (jsonb_populate_record(c, jsonb_build_object('first_frame', 1000 + i, "
        "'flags', "
        "'before-trace open', 'began', c.began + i * interval '1 second'))).* FROM lapd.calls c, "
        "generate_series(1, " +
        std::to_string(length) + ") i");
    execute("SET track_functions = 'all'");
    EXPECT_EQ(rows("SELECT parts FROM lapd.joined_calls"), std::to_string(length + 1) + "\n");
    execute("SELECT pg_stat_force_next_flush()");
    const int steps =
        std::stoi(rows("SELECT sum(calls) FROM pg_stat_user_functions WHERE funcname LIKE 'call_%'"));
    EXPECT_GT(steps, length) << "they are counted";
    EXPECT_LT(steps, 40 * length);
}

TEST_F(JoinedCalls, AreForgottenEvenIfTheyNeverEnded) {
    store(stories[1]);
    execute("UPDATE lapd.calls SET ended = NULL, ended_by = 'open'");
    execute("SELECT lapd.forget_before('2026-01-05')");
    EXPECT_EQ(rows("SELECT count(*) FROM lapd.calls"), "2\n");
    execute("SELECT lapd.forget_before('2026-01-06')");
    EXPECT_EQ(rows("SELECT count(*) FROM lapd.calls"), "0\n");
}

}  // namespace fleet
