#include "isdn/readers.h"

#include <charconv>
#include <string>

#include "isdn/facility.h"
#include "isdn/tables/numbers.h"
#include "isdn/values.h"

namespace isdn {

namespace {

// A field of `count` octets, beginning at octet `from` of the contents. Its label is that of the first octet
// of the contents plus `from`.
Field fieldAt(const Contents& contents, std::size_t from, std::size_t count, Fields& fields) {
    Field field;
    field.octet = contents.octet;
    if (from != 0) {
        int first = 0;
        std::from_chars(contents.octet.data(), contents.octet.data() + contents.octet.size(), first);
        field.octet = fields.keep(std::to_string(static_cast<std::size_t>(first) + from));
    }
    field.name = contents.name;
    field.clause = contents.clause;
    field.at = contents.octets.subspan(from, count);
    for (const std::uint8_t octet : field.at)
        field.value = field.value << 8 | octet;
    return field;
}

void addText(const Contents& contents, std::size_t from, Fields& fields) {
    if (from >= contents.octets.size())
        return;
    Field field = fieldAt(contents, from, contents.octets.size() - from, fields);
    field.kind = Field::Kind::text;
    field.meaning = asCharacters(field.at);
    field.personal = contents.personal;
    fields.add(field);
}

void addRaw(const Contents& contents, std::size_t from, Fields& fields) {
    if (from >= contents.octets.size())
        return;
    Field field = fieldAt(contents, from, contents.octets.size() - from, fields);
    field.kind = Field::Kind::raw;
    field.personal = contents.personal;
    fields.add(field);
}

void addDoubtful(const Contents& contents, std::size_t from, Fields& fields) {
    if (from >= contents.octets.size())
        return;
    addRaw(contents, from, fields);
    fields.back().doubtful = true;
}

// clang-format off

constexpr Name providers[] = {{0, "provider"}, {1, "user"}};
constexpr Name normalities[] = {{0, "normal"}, {1, "abnormal"}};
constexpr Name conditions[] = {{0, "unknown"}, {1, "permanent"}, {2, "transient"}};
constexpr Row conditionRows[] = {
    {"5", bits(4, 4), "network service", providers},
    {"", bits(3, 3), "condition is", normalities},
    {"", bits(2, 1), "condition", conditions},
};

constexpr Name rejections[] = {{0, "user-specific"}, {1, "element missing"}, {2, "element contents not sufficient"}};
constexpr When byUser = ifSeen("5", 7, 3, {0});
constexpr When byElement = ifSeen("5", 7, 3, {1, 2});
std::string_view nameOfElement(std::uint8_t id) { return elementName(0, id, Variant::net5); }
constexpr Row rejectionRows[] = {
    {"5", bits(7, 3), "reason", rejections},
    {"", bits(2, 1), "condition", conditions},
    personal({"6", rest(), "user's diagnostic", {}, optional & byUser}),
    {"6", toEnd(bits(8, 1)), "element", nameOfElement, optional & byElement},
};

constexpr Name completions[] = {{1, "possible"}, {2, "not possible"}};
constexpr Row completionRows[] = {{"5", bits(7, 1), "call completion", completions}};

constexpr Row elementRows[] = {{"5", toEnd(bits(8, 1)), "element", nameOfElement, optional}};
constexpr Row messageRows[] = {{"5", bits(8, 1), "message", callControlMessageName}};
constexpr Row transitNetworkRows[] = {
    {"5", bits(7, 5), "type of network identification", tables::networkTypes},
    {"", bits(4, 1), "network identification plan", tables::networkPlans},
    {"6", rest(readCharacters), "network", {}, optional},
};

// clang-format on

// "T303" of the characters 303. Some equipment adds characters of its own.
Problem readTimer(const Contents& contents, Fields& fields) {
    Field field = fieldAt(contents, 0, contents.octets.size(), fields);
    field.name = "timer";
    field.kind = Field::Kind::text;
    field.meaning = fields.keep("T" + std::string(asCharacters(contents.octets)));
    fields.add(field);
    return Problem::none;
}

template <const auto& rows>
Problem readAs(const Contents& contents, Fields& fields) {
    static constexpr ElementTable table{0, 0, "", "Q.850 table 1", rows};
    return readRows(table, contents.octets, contents.variant, fields);
}

Problem readPersonal(const Contents& contents, Fields& fields) {
    Contents all = contents;
    all.personal = true;
    addDoubtful(all, 0, fields);
    return Problem::none;
}

struct DiagnosticRow {
    std::uint8_t cause;
    ContentsReader read;
};

// Q.850 table 1, the column "diagnostics". Those of other causes are raw.
// clang-format off
constexpr DiagnosticRow diagnosticRows[] = {
    {1, readAs<conditionRows>},
    {2, readAs<transitNetworkRows>},
    {3, readAs<conditionRows>},
    {17, readAs<completionRows>},
    {21, readAs<rejectionRows>},
    {22, readPersonal},
    {34, readAs<completionRows>},
    {43, readAs<elementRows>},
    {49, readAs<conditionRows>},
    {88, readAs<elementRows>},
    {96, readAs<elementRows>},
    {97, readAs<messageRows>},
    {98, readAs<messageRows>},
    {99, readAs<elementRows>},
    {100, readAs<elementRows>},
    {101, readAs<messageRows>},
    {102, readTimer},
};

constexpr Name displayTypes[] = {{1, "calling party name"}};
constexpr Row displayTypeRows[] = {
    {"3", bits(7, 5), "associated information"},
    {"", bits(4, 1), "type of display", displayTypes},
    personal({"4", rest(readCharacters), "display", {}, optional}),
};

constexpr std::uint8_t callAppearance = 0x94;  // the tag whose contents are no characters and identify nobody
constexpr Row displayKindRows[] = {{"3", bits(7, 1), "kind of display"}};

// The fields of a display, as North American switches send them to their terminals.
constexpr Name displayTags[] = {
    {0x80, "blank"},
    {0x81, "skip"},
    {0x82, "continuation"},
    {0x83, "called number"},
    {0x84, "cause"},
    {0x85, "progress"},
    {0x86, "notification"},
    {0x87, "prompt"},
    {0x88, "digits so far"},
    {0x89, "status"},
    {0x8A, "in band"},
    {0x8B, "calling number"},
    {0x8C, "reason"},
    {0x8D, "calling party name"},
    {0x8E, "called party name"},
    {0x8F, "original called name"},
    {0x90, "redirecting name"},
    {0x91, "connected name"},
    {0x92, "restrictions of the origin"},
    {0x93, "date and time"},
    {0x94, "call appearance"},
    {0x95, "feature address"},
    {0x96, "redirection name"},
    {0x97, "redirection number"},
    {0x98, "redirecting number"},
    {0x99, "original called number"},
    {0x9A, "connected number"},
    {0x9E, "text"},
};

// clang-format on

}  // namespace

std::string_view callControlMessageName(std::uint8_t type) { return messageName(callControl, type); }

Problem readCharacters(const Contents& contents, Fields& fields) {
    addText(contents, 0, fields);
    return Problem::none;
}

Problem readNumber(const Contents& contents, Fields& fields) {
    Field field = fieldAt(contents, 0, contents.octets.size(), fields);
    field.personal = contents.personal;
    fields.add(field);
    return Problem::none;
}

// The first octet of an NSAP address names the authority and the format of what follows.
Problem readSubaddress(const Contents& contents, Fields& fields) {
    constexpr unsigned nsap = 0;
    constexpr std::uint8_t localCharacters = 0x50;
    const std::uint8_t* const octet3 = contents.seen.find("3");
    if (octet3 == nullptr || bitsOf(*octet3, 7, 5) != nsap) {
        addRaw(contents, 0, fields);
        return Problem::none;
    }
    Field authority = fieldAt(contents, 0, 1, fields);
    authority.name = "authority and format";
    if (authority.value == localCharacters)
        authority.meaning = "local, IA5 characters";
    fields.add(authority);
    if (authority.value == localCharacters)
        addText(contents, 1, fields);
    else
        addRaw(contents, 1, fields);
    return Problem::none;
}

// Appends a field for each octet. Its meaning lists the channels whose bits are set: "1 2 3".
Problem readSlotMap(const Contents& contents, Fields& fields) {
    for (std::size_t i = 0; i < contents.octets.size(); ++i) {
        Field field = fieldAt(contents, i, 1, fields);
        field.octet = contents.octet;
        std::string channels;
        for (unsigned bit = 8; bit >= 1; --bit) {
            const int slot = slotOf(i, bit, contents.octets.size());
            if (bitsOf(contents.octets[i], bit, bit) != 0 && slot >= 0)
                channels.insert(0, (channels.empty() ? "" : " ")).insert(0, std::to_string(slot));
        }
        field.meaning = fields.keep(std::move(channels));
        fields.add(field);
    }
    return Problem::none;
}

Problem readDiagnostics(const Contents& contents, Fields& fields) {
    const std::uint8_t* const value = contents.seen.find("4");
    for (const DiagnosticRow& row : diagnosticRows) {
        if (value != nullptr && row.cause == bitsOf(*value, 7, 1))
            return row.read(contents, fields);
    }
    addDoubtful(contents, 0, fields);
    return Problem::none;
}

Problem readUserInformation(const Contents& contents, Fields& fields) {
    constexpr std::uint8_t ia5 = 4;
    const std::uint8_t* const protocol = contents.seen.find("3");
    if (protocol != nullptr && *protocol == ia5)
        addText(contents, 0, fields);
    else
        addRaw(contents, 0, fields);
    return Problem::none;
}

Problem readDisplay(const Contents& contents, Fields& fields) {
    static constexpr ElementTable typed{0, element::display, "", "national", displayTypeRows};
    const std::uint8_t first = contents.octets[0];
    if (!northAmerica.has(contents.variant) || (first & 0x80U) == 0)
        return readCharacters(contents, fields);
    const bool tagged = first == 0x80 && contents.octets.size() > 1 && (contents.octets[1] & 0x80U) != 0;
    return tagged ? readDisplayFields(contents, fields)
                  : readRows(typed, contents.octets, contents.variant, fields);
}

// Octet 3, then tag, length and text again and again.
Problem readDisplayFields(const Contents& contents, Fields& fields) {
    static constexpr ElementTable kind{0, element::display, "", "national", displayKindRows};
    const Octets octets = contents.octets;
    readRows(kind, octets.first(1), contents.variant, fields);
    std::size_t at = 1;
    while (at < octets.size()) {
        const std::size_t left = octets.size() - at;
        if (left < 2 || octets[at + 1] > left - 2) {
            addDoubtful(contents, at, fields);
            return Problem::tooShort;
        }
        Field tag = fieldAt(contents, at, 1, fields);
        tag.name = "tag";
        tag.meaning = Names(displayTags)(octets[at]);
        fields.add(tag);
        Field length = fieldAt(contents, at + 1, 1, fields);
        length.name = "length";
        length.kind = Field::Kind::header;
        fields.add(length);
        const std::size_t size = octets[at + 1];
        if (size != 0) {
            Field text = fieldAt(contents, at + 2, size, fields);
            text.name = tag.meaning.empty() ? contents.name : tag.meaning;
            text.personal = octets[at] != callAppearance;
            text.kind = text.personal ? Field::Kind::text : Field::Kind::raw;
            if (text.personal)
                text.meaning = asCharacters(text.at);
            fields.add(text);
        }
        at += 2 + size;
    }
    return Problem::none;
}

Problem readFacility(const Contents& contents, Fields& fields) {
    return facilityFields(contents.octets, contents.variant, fields);
}

}  // namespace isdn
