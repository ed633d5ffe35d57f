#include "fleet/Parcel.h"

#include <gtest/gtest.h>

#include <functional>
#include <nlohmann/json.hpp>
#include <string>

namespace {

using fleet::BadParcel;
using fleet::Parcel;
using fleet::ParcelItem;
using Kind = capture::Item::Kind;
using nlohmann::json;

// A frame, an oversized one, what the recorder said before and behind them, and a gap: each member once.
constexpr char whole[] =
    R"({"v":1,"site":"london","host":"h1","board":"0","dchannel":"1","trunk":"pri1","run":1795260333000001,)"
    R"("first":17,"group":"nfas-a","variant":"net5","redacted":true,"frames":[)"
    R"({"n":17,"time":1795260333300000001,"ticks":75,"written":1795260333,"dir":"tx","role":"network",)"
    R"("hex":"00017f","before":[{"kind":"frames-lost","dir":"rx","count":3},)"
    R"({"kind":"run","dir":"rx","variant":"ni2"},{"kind":"comment","dir":"rx","text":"a \"word\""}]},)"
    R"({"n":18,"kind":"oversized","time":1795260333304000001,"dir":"rx"}],)"
    R"("gaps":[{"first":10,"why":"the disk was full","last":16}],)"
    R"("end":[{"kind":"cut","dir":"rx","hex":"0001","count":40}]})";

ParcelItem note(Kind kind) {
    ParcelItem item;
    item.kind = kind;
    return item;
}

Parcel parcelOfWhole() {
    Parcel parcel;
    parcel.address = {"london", "h1", "0", "1"};
    parcel.trunk = "pri1";
    parcel.group = "nfas-a";
    parcel.variant = capture::Variant::net5;
    parcel.isRedacted = true;
    parcel.run = 1795260333000001;
    parcel.first = 17;

    ParcelItem lost = note(Kind::lost);
    lost.count = 3;
    ParcelItem run = note(Kind::run);
    run.variant = capture::Variant::ni2;
    ParcelItem comment = note(Kind::comment);
    comment.text = "a \"word\"";
    ParcelItem frame;
    frame.time = 1795260333300000001;
    frame.ticks = 75;
    frame.written = 1795260333;
    frame.transmitted = true;
    frame.role = capture::Role::network;
    frame.octets = {0x00, 0x01, 0x7f};
    ParcelItem oversized = note(Kind::oversized);
    oversized.time = 1795260333304000001;
    parcel.frames = {{frame, {lost, run, comment}}, {oversized, {}}};

    parcel.gaps = {{10, 16, "the disk was full"}};
    ParcelItem cut = note(Kind::cut);
    cut.octets = {0x00, 0x01};
    cut.count = 40;
    parcel.end = {cut};
    return parcel;
}

std::string changed(const std::function<void(json&)>& change) {
    json all = json::parse(whole);
    change(all);
    return all.dump();
}

TEST(Parcel, ItsTextHasEachMemberOnce) { EXPECT_EQ(toText(parcelOfWhole()), whole); }

TEST(Parcel, ItsTextLeadsBackToIt) { EXPECT_EQ(fleet::parcelIn(whole), parcelOfWhole()); }

TEST(Parcel, MembersThatAreNotKnownArePassedOver) {
    EXPECT_EQ(fleet::parcelIn(changed([](json& all) {
                  all["later"] = {1, 2};
                  all["frames"][0]["later"] = "x";
              })),
              parcelOfWhole());
}

TEST(Parcel, ItsIdNamesTheFramesAndWhatElseIsInIt) {
    Parcel parcel = parcelOfWhole();
    EXPECT_EQ(parcel.id(), "london/h1/0/1/1795260333000001/17/2/gap/end");
    parcel.gaps.clear();
    parcel.end.reset();
    EXPECT_EQ(parcel.id(), "london/h1/0/1/1795260333000001/17/2");
    EXPECT_EQ(parcel.subject().address, parcel.address);
    EXPECT_EQ(parcel.subject().partition, fleet::partitionOf(parcel.address, "nfas-a"));
}

TEST(Parcel, ARunMayEndInAGapOfUnknownSize) {
    Parcel parcel = parcelOfWhole();
    parcel.frames.clear();
    parcel.gaps = {{17, std::nullopt, "the log was emptied"}};
    EXPECT_EQ(fleet::parcelIn(toText(parcel)), parcel);
    parcel.end.reset();
    EXPECT_THROW(toText(parcel), BadParcel) << "the run goes on";
}

TEST(Parcel, TextsOfAnyOriginAreMadeFit) {
    Parcel parcel = parcelOfWhole();
    parcel.trunk = "a\xff";
    parcel.frames[0].before[2].text = std::string("x\0y", 3) + std::string(2000, 'z');
    const Parcel read = fleet::parcelIn(toText(parcel));
    EXPECT_EQ(read.trunk, "a?");
    EXPECT_EQ(read.frames[0].before[2].text, "x?y" + std::string(Parcel::longestText - 3, 'z'));
}

TEST(Parcel, AnEmptyOneAndOneThatIsTooLargeAreNotWritten) {
    Parcel parcel = parcelOfWhole();
    parcel.frames.resize(1);
    parcel.frames[0].item.octets.resize(Parcel::mostOctets);
    parcel.frames.resize(200, parcel.frames[0]);
    EXPECT_THROW(toText(parcel), BadParcel);
    parcel.frames.clear();
    parcel.gaps.clear();
    parcel.end.reset();
    EXPECT_THROW(toText(parcel), BadParcel);
}

TEST(Parcel, WhatIsNoParcelIsRefused) {
    const std::string nested = std::string(400'000, '[');
    for (const std::string& text :
         {std::string(), std::string("{"), std::string("null"), std::string("[]"), std::string("{}"), nested,
          std::string(whole) + "x", std::string("{\"v\":1,\"site\":\"\xff\"}"),
          std::string(Parcel::largest + 1, ' ')})
        EXPECT_THROW(fleet::parcelIn(text), BadParcel) << text.substr(0, 40);
}

// Each change alone makes the parcel one that nothing of ours has sent.
TEST(Parcel, HostileMembersAreRefused) {
    struct Case {
        const char* says;
        std::function<void(json&)> change;
    };
    const json longList =
        json(std::vector<json>(Parcel::mostNotes + 1, {{"kind", "restart"}, {"dir", "rx"}}));
    const Case cases[] = {
        {"another version", [](json& all) { all["v"] = 2; }},
        {"a version of another type", [](json& all) { all["v"] = "1"; }},
        {"no site", [](json& all) { all.erase("site"); }},
        {"an empty host", [](json& all) { all["host"] = ""; }},
        {"a board that is too long", [](json& all) { all["board"] = std::string(65, 'x'); }},
        {"a D channel with a control character", [](json& all) { all["dchannel"] = "a\nb"; }},
        {"a site that is a number", [](json& all) { all["site"] = 1; }},
        {"a group that is no name", [](json& all) { all["group"] = "\x7f"; }},
        {"a NUL in a text", [](json& all) { all["trunk"] = std::string(1, '\0'); }},
        {"a text that is too long",
         [](json& all) { all["trunk"] = std::string(Parcel::longestText + 1, 'x'); }},
        {"an unknown variant", [](json& all) { all["variant"] = "net6"; }},
        {"redacted by a word", [](json& all) { all["redacted"] = "no"; }},
        {"run 0", [](json& all) { all["run"] = 0; }},
        {"a run below 0", [](json& all) { all["run"] = -1; }},
        {"a run beyond 63 bits", [](json& all) { all["run"] = std::uint64_t{1} << 63U; }},
        {"a run with a fraction", [](json& all) { all["run"] = 1.5; }},
        {"first 0", [](json& all) { all["first"] = 0; }},
        {"numbers that do not follow first", [](json& all) { all["first"] = 18; }},
        {"numbers with a hole", [](json& all) { all["frames"][1]["n"] = 19; }},
        {"numbers beyond 63 bits",
         [](json& all) {
             const auto most = std::uint64_t{INT64_MAX};
             all["first"] = all["frames"][0]["n"] = most - 1;
             all["frames"][1]["n"] = most;
         }},
        {"frames that are no list",
         [](json& all) {
             all["frames"] = {{"n", 1}};
         }},
        {"a frame that is no object", [](json& all) { all["frames"][0] = 1; }},
        {"too many frames",
         [](json& all) { all["frames"] = json(std::vector<int>(Parcel::mostFrames + 1)); }},
        {"a frame without a time", [](json& all) { all["frames"][0].erase("time"); }},
        {"a time below 0", [](json& all) { all["frames"][0]["time"] = -1; }},
        {"a time beyond the year 2199", [](json& all) { all["frames"][0]["time"] = 7258118400000000000; }},
        {"ticks beyond 32 bits", [](json& all) { all["frames"][0]["ticks"] = std::uint64_t{1} << 32U; }},
        {"no direction", [](json& all) { all["frames"][0].erase("dir"); }},
        {"an unknown direction", [](json& all) { all["frames"][0]["dir"] = "up"; }},
        {"an unknown role", [](json& all) { all["frames"][0]["role"] = "both"; }},
        {"a frame without octets", [](json& all) { all["frames"][0].erase("hex"); }},
        {"half an octet", [](json& all) { all["frames"][0]["hex"] = "000"; }},
        {"no hexadecimal digits", [](json& all) { all["frames"][0]["hex"] = "0g"; }},
        {"too many octets",
         [](json& all) { all["frames"][0]["hex"] = std::string(2 * Parcel::mostOctets + 2, '0'); }},
        {"an unknown kind", [](json& all) { all["frames"][1]["kind"] = "other"; }},
        {"a loss where a frame must stand", [](json& all) { all["frames"][1]["kind"] = "frames-lost"; }},
        {"a frame among what the recorder said",
         [](json& all) { all["frames"][0]["before"][0] = all["frames"][0]; }},
        {"too much before a frame", [&](json& all) { all["frames"][0]["before"] = longList; }},
        {"a count below 0", [](json& all) { all["frames"][0]["before"][0]["count"] = -3; }},
        {"too much at the end", [&](json& all) { all["end"] = longList; }},
        {"an end that is no list", [](json& all) { all["end"] = true; }},
        {"a gap that reaches into the frames", [](json& all) { all["gaps"][0]["last"] = 17; }},
        {"a gap that ends before it begins", [](json& all) { all["gaps"][0]["last"] = 9; }},
        {"a gap from number 0", [](json& all) { all["gaps"][0]["first"] = 0; }},
        {"a gap without an end before frames", [](json& all) { all["gaps"][0].erase("last"); }},
        {"a gap without a reason", [](json& all) { all["gaps"][0].erase("why"); }},
        {"gaps that overlap", [](json& all) { all["gaps"].push_back(all["gaps"][0]); }},
        {"nothing in it",
         [](json& all) {
             all["frames"] = json::array();
             all.erase("gaps");
             all.erase("end");
         }},
    };
    for (const Case& each : cases) {
        try {
            fleet::parcelIn(changed(each.change));
            ADD_FAILURE() << each.says << " is taken";
        } catch (const BadParcel& error) {
            EXPECT_LE(std::string(error.what()).size(), 200U) << each.says;
        }
    }
}

// Nothing but BadParcel comes out of a parcel that is cut off, or has one octet changed.
TEST(Parcel, DamagedTextsNeverDoAnythingElse) {
    const std::string text = whole;
    for (std::size_t size = 0; size < text.size(); ++size)
        EXPECT_THROW(fleet::parcelIn(text.substr(0, size)), BadParcel);
    for (std::size_t at = 0; at < text.size(); ++at) {
        for (const char octet : {'\0', '"', '0', '9', '{', '}', ',', '\xff', '\\', '-'}) {
            std::string damaged = text;
            damaged[at] = octet;
            try {
                fleet::parcelIn(damaged);
            } catch (const BadParcel&) {
            }
        }
    }
}

}  // namespace
