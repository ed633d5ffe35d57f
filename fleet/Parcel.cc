#include "fleet/Parcel.h"

#include <algorithm>
#include <limits>
#include <nlohmann/json.hpp>

#include "capture/hex_digits.h"
#include "fleet/ParcelMembers.h"
#include "fleet/utf8.h"

namespace fleet {

namespace {

using nlohmann::json;
using Output = nlohmann::ordered_json;  // people read it, too
using Kind = capture::Item::Kind;

constexpr unsigned version = 1;
constexpr std::uint64_t mostNumber = Parcel::mostNumber;
constexpr std::int64_t latest = Parcel::latest;

bool hasOctets(Kind kind) { return kind == Kind::frame || kind == Kind::cut; }
bool isNumbered(Kind kind) { return kind == Kind::frame || kind == Kind::oversized; }

std::vector<std::uint8_t> octetsIn(const ParcelMembers& members) {
    const std::string hex = members.text("hex", 2 * Parcel::mostOctets);
    std::vector<std::uint8_t> octets;
    octets.reserve(hex.size() / 2);
    if (!capture::appendOctets(hex, octets))
        ParcelMembers::refuse("hex");
    return octets;
}

capture::Role roleIn(const ParcelMembers& members) {
    const std::string role = members.textIf("role", Parcel::longestText);
    if (role == "user")
        return capture::Role::user;
    if (role == "network")
        return capture::Role::network;
    if (!role.empty())
        ParcelMembers::refuse("role");
    return capture::Role::unknown;
}

capture::Variant variantIn(const ParcelMembers& members) {
    const std::string name = members.textIf("variant", Parcel::longestText);
    const capture::Variant variant = capture::variantNamed(name);
    if (variant == capture::Variant::unknown && !name.empty())
        ParcelMembers::refuse("variant");
    return variant;
}

Kind kindIn(const ParcelMembers& members) {
    if (members.find("kind") == nullptr)
        return Kind::frame;
    const auto kind = capture::kindNamed(members.text("kind", Parcel::longestText));
    if (!kind)
        ParcelMembers::refuse("kind");
    return *kind;
}

bool isTransmitted(const ParcelMembers& members) {
    const std::string direction = members.text("dir", Parcel::longestText);
    if (direction != "tx" && direction != "rx")
        ParcelMembers::refuse("dir");
    return direction == "tx";
}

ParcelItem itemIn(const ParcelMembers& members) {
    ParcelItem item;
    item.kind = kindIn(members);
    item.time = members.numberIf<std::int64_t>("time", latest);
    item.ticks = members.numberIf<std::uint32_t>("ticks", std::numeric_limits<std::uint32_t>::max());
    item.written = members.numberIf<std::int64_t>("written", latest);
    item.transmitted = isTransmitted(members);
    item.role = roleIn(members);
    if (hasOctets(item.kind))
        item.octets = octetsIn(members);
    item.count = members.numberIf<std::uint64_t>("count", mostNumber).value_or(0);
    item.text = members.textIf("text", Parcel::longestText);
    item.variant = variantIn(members);
    return item;
}

std::vector<ParcelItem> notesIn(const json& list) {
    std::vector<ParcelItem> notes;
    for (const json& each : list) {
        notes.push_back(itemIn(ParcelMembers(each)));
        if (isNumbered(notes.back().kind))
            throw BadParcel("a frame among what the recorder said");
    }
    return notes;
}

ParcelFrame frameIn(const json& from, std::uint64_t number) {
    const ParcelMembers members(from);
    if (members.number("n", 1, mostNumber) != number)
        throw BadParcel("the numbers of frames do not follow each other");
    ParcelFrame frame{itemIn(members), notesIn(members.listIf("before", Parcel::mostNotes))};
    if (!isNumbered(frame.item.kind))
        throw BadParcel("no frame where one must stand");
    if (!frame.item.time)
        throw BadParcel("a frame without a time");
    return frame;
}

ParcelGap gapIn(const json& from) {
    const ParcelMembers members(from);
    return {members.number("first", 1, mostNumber), members.numberIf<std::uint64_t>("last", mostNumber),
            members.text("why", Parcel::longestText)};
}

// Checks the rules between several members of a parcel.
void check(const Parcel& parcel) {
    std::uint64_t next = 1;
    for (const ParcelGap& gap : parcel.gaps) {
        const bool isOpen = !gap.last;
        const bool isLast = &gap == &parcel.gaps.back();
        if (gap.first < next || (gap.last && *gap.last < gap.first))
            throw BadParcel("gaps that are not in their order");
        if (isOpen && !(isLast && parcel.end && parcel.frames.empty()))
            throw BadParcel("a gap without an end in a run that goes on");
        next = isOpen ? gap.first : *gap.last + 1;
    }
    if (parcel.first < next)
        throw BadParcel("a gap that does not end before the frames");
    if (parcel.frames.size() > mostNumber - parcel.first)
        throw BadParcel("the numbers of frames are too large");
    if (parcel.frames.empty() && parcel.gaps.empty() && !parcel.end)
        throw BadParcel("nothing is in it");
}

Parcel parcelFrom(const json& from) {
    const ParcelMembers members(from);
    if (members.number("v", 0, std::numeric_limits<std::uint32_t>::max()) != version)
        throw BadParcel("it is of another version");
    Parcel parcel;
    parcel.address = {members.name("site"), members.name("host"), members.name("board"),
                      members.name("dchannel")};
    parcel.trunk = members.text("trunk", Parcel::longestText);
    if (members.find("group") != nullptr)
        parcel.group = members.name("group");
    parcel.variant = variantIn(members);
    parcel.isRedacted = members.truthIf("redacted");
    parcel.run = members.number("run", 1, mostNumber);
    parcel.first = members.number("first", 1, mostNumber);
    for (const json& each : members.listIf("frames", Parcel::mostFrames))
        parcel.frames.push_back(frameIn(each, parcel.first + parcel.frames.size()));
    for (const json& each : members.listIf("gaps", Parcel::mostGaps))
        parcel.gaps.push_back(gapIn(each));
    if (members.find("end") != nullptr)
        parcel.end = notesIn(members.listIf("end", Parcel::mostNotes));
    check(parcel);
    return parcel;
}

void putItem(Output& to, const ParcelItem& item) {
    if (item.kind != Kind::frame)
        to["kind"] = capture::kindName(item.kind);
    if (item.time)
        to["time"] = *item.time;
    if (item.ticks)
        to["ticks"] = *item.ticks;
    if (item.written)
        to["written"] = *item.written;
    to["dir"] = item.transmitted ? "tx" : "rx";
    if (item.role != capture::Role::unknown)
        to["role"] = item.role == capture::Role::user ? "user" : "network";
    if (hasOctets(item.kind)) {
        std::string hex;
        capture::appendDigits(item.octets, hex);
        to["hex"] = std::move(hex);
    }
    if (item.count != 0)
        to["count"] = item.count;
    if (!item.text.empty())
        to["text"] = cleanUtf8(item.text, Parcel::longestText);
    if (item.variant != capture::Variant::unknown)
        to["variant"] = capture::variantName(item.variant);
}

Output toJson(const std::vector<ParcelItem>& notes) {
    Output list = Output::array();
    for (const ParcelItem& note : notes)
        putItem(list.emplace_back(Output::object()), note);
    return list;
}

Output toJson(const ParcelGap& gap) {
    Output to{{"first", gap.first}, {"why", cleanUtf8(gap.why, Parcel::longestText)}};
    if (gap.last)
        to["last"] = *gap.last;
    return to;
}

Output toJson(const Parcel& parcel) {
    Output to{{"v", version},
              {"site", parcel.address.site},
              {"host", parcel.address.host},
              {"board", parcel.address.board},
              {"dchannel", parcel.address.dChannel},
              {"trunk", cleanUtf8(parcel.trunk, Parcel::longestText)},
              {"run", parcel.run},
              {"first", parcel.first}};
    if (!parcel.group.empty())
        to["group"] = parcel.group;
    if (parcel.variant != capture::Variant::unknown)
        to["variant"] = capture::variantName(parcel.variant);
    if (parcel.isRedacted)
        to["redacted"] = true;
    std::uint64_t number = parcel.first;
    Output& frames = to["frames"] = Output::array();
    for (const ParcelFrame& frame : parcel.frames) {
        Output& each = frames.emplace_back(Output::object());
        each["n"] = number++;
        putItem(each, frame.item);
        if (!frame.before.empty())
            each["before"] = toJson(frame.before);
    }
    for (const ParcelGap& gap : parcel.gaps)
        to["gaps"].push_back(toJson(gap));
    if (parcel.end)
        to["end"] = toJson(*parcel.end);
    return to;
}

}  // namespace

std::string Parcel::id() const {
    return fleet::toText(address) + "/" + std::to_string(run) + "/" + std::to_string(first) + "/" +
           std::to_string(frames.size()) + (gaps.empty() ? "" : "/gap") + (end ? "/end" : "");
}

std::string toText(const Parcel& parcel) {
    check(parcel);
    std::string text = toJson(parcel).dump();
    if (text.size() > Parcel::largest)
        throw BadParcel("it is too large");
    return text;
}

Parcel parcelIn(std::string_view text) {
    if (text.size() > Parcel::largest)
        throw BadParcel("it is too large");
    const json all = json::parse(text, nullptr, false);
    if (all.is_discarded())
        throw BadParcel("it is no JSON");
    return parcelFrom(all);
}

std::string toText(const std::vector<ParcelItem>& notes) {
    return toJson(notes).dump(-1, ' ', false, json::error_handler_t::replace);
}

std::vector<ParcelItem> notesInText(std::string_view text) {
    const json list = json::parse(text, nullptr, false);
    if (!list.is_array())
        throw BadParcel("no list of what the recorder said");
    return notesIn(list);
}

}  // namespace fleet
