// The fields of link headers, management messages and message headers.
#include <array>
#include <string>

#include "isdn/Table.h"
#include "isdn/readers.h"

namespace isdn {

namespace {

// clang-format off

// Octets are numbered as Q.921 numbers them: octet 1 is the flag.
constexpr Name sapis[] = {{0, "call control"}, {1, "packet mode call control"}, {16, "packet data"}, {63, "management"}};
constexpr Name teis[] = {{127, "all terminals"}};
constexpr Name extensions[] = {{0, "the address goes on"}, {1, "last octet of the address"}};
constexpr Row addressRows[] = {
    {"2", bits(8, 3), "SAPI", sapis},
    {"", bits(2, 2), "C/R"},
    {"", bits(1, 1), "address extension", extensions},
    {"3", bits(8, 2), "TEI", teis},
    {"", bits(1, 1), "address extension", extensions},
};

constexpr Name informationFormat[] = {{0, "information"}};
constexpr Row informationRows[] = {
    {"4", bits(8, 2), "N(S)"},
    {"", bits(1, 1), "format", informationFormat},
    {"5", bits(8, 2), "N(R)"},
    {"", bits(1, 1), "P"},
};

constexpr Name supervisoryFormat[] = {{1, "supervisory"}};
constexpr Name functions[] = {{0, "RR"}, {1, "RNR"}, {2, "REJ"}};
constexpr Row supervisoryRows[] = {
    {"4", reserved(8, 5), "spare"},
    {"", bits(4, 3), "function", functions},
    {"", bits(2, 1), "format", supervisoryFormat},
    {"5", bits(8, 2), "N(R)"},
    {"", bits(1, 1), "P/F"},
};

constexpr Name unnumberedFormat[] = {{3, "unnumbered"}};
constexpr Row unnumberedRows[] = {
    {"4", bits(8, 6), "function, upper bits"},
    {"", bits(5, 5), "P/F"},
    {"", bits(4, 3), "function, lower bits"},
    {"", bits(2, 1), "format", unnumberedFormat},
};

// Q.921 3.6.11, figure 6.
constexpr Name commandOrResponse[] = {{0, "command"}, {1, "response"}};
constexpr Name yesOrNo[] = {{0, "no"}, {1, "yes"}};
constexpr Row rejectRows[] = {
    {"5", octets(2, readNumber), "rejected control field"},
    {"7", bits(8, 2), "V(S)"},
    {"", reserved(1, 1), "spare"},
    {"8", bits(8, 2), "V(R)"},
    {"", bits(1, 1), "rejected frame was a", commandOrResponse},
    {"9", reserved(8, 5), "spare"},
    {"", bits(4, 4), "Z, N(R) invalid", yesOrNo},
    {"", bits(3, 3), "Y, information too long", yesOrNo},
    {"", bits(2, 2), "X, information not permitted", yesOrNo},
    {"", bits(1, 1), "W, control field undefined", yesOrNo},
};

// Q.921 5.3, table 8.
constexpr Name entities[] = {{0x0F, "TEI management"}};
constexpr Name anyTei[] = {{127, "any"}};
constexpr Name actionExtensions[] = {{0, "more follow"}, {1, "the last"}};
constexpr Row teiRows[] = {
    {"5", bits(8, 1), "management entity", entities},
    {"6", octets(2, readNumber), "reference number Ri"},
    {"8", bits(8, 1), "message", teiMessageName},
    {"9", toEnd(bits(8, 2)), "action indicator Ai", anyTei},
    {"", bits(1, 1), "action extension", actionExtensions},
};

// clang-format on

constexpr ElementTable addressTable{0, 0, "", "Q.921 3.2", addressRows};
constexpr ElementTable informationTable{0, 0, "", "Q.921 3.4", informationRows};
constexpr ElementTable supervisoryTable{0, 0, "", "Q.921 3.4", supervisoryRows};
constexpr ElementTable unnumberedTable{0, 0, "", "Q.921 3.4", unnumberedRows};
constexpr ElementTable rejectTable{0, 0, "", "Q.921 3.6.11", rejectRows};
constexpr ElementTable teiTable{0, 0, "", "Q.921 5.3", teiRows};

const ElementTable& controlTable(std::uint8_t control) {
    if ((control & 1U) == 0)
        return informationTable;
    return (control & 2U) == 0 ? supervisoryTable : unnumberedTable;
}

// Link headers are the same on all variants.
Problem read(const ElementTable& table, Octets octets, Fields& fields) {
    return readRows(table, octets, Variant::net5, fields);
}

void addRaw(Octets octets, std::string_view label, std::string_view name, std::string_view clause,
            Fields& fields) {
    if (octets.empty())
        return;
    Field field;
    field.octet = label;
    field.name = name;
    field.clause = clause;
    field.at = octets;
    field.kind = Field::Kind::raw;
    field.personal = true;
    field.doubtful = true;
    for (const std::uint8_t octet : octets)
        field.value = field.value << 8 | octet;
    fields.add(field);
}

Problem informationFields(const Layer2& frame, Fields& fields) {
    if (frame.carriesMessage())
        return Problem::none;
    if (frame.type == FrameType::FRMR)
        return read(rejectTable, frame.information, fields);
    if (frame.carriesTeiMessage())
        return read(teiTable, frame.information, fields);
    const std::string_view label = frame.header.size() > 3 ? "6" : "5";
    addRaw(frame.information, label, "information", "Q.921 3.5", fields);
    return Problem::none;
}

// The octets of a message's header, counted as Q.931 counts them.
class MessageHeader {
  public:
    MessageHeader(const Layer3& message, Fields& fields) : message_(message), fields_(fields) {}

    void run() {
        add("protocol discriminator", "Q.931 4.2", 1, 8, 1).meaning = protocolName(message_.discriminator);
        if (message_.hasCallReference)
            addReference();
        if (message_.hasType)
            addType();
        addRaw(message_.header.subspan(at_), label(), "contents", "Q.931 4", fields_);
        at_ = message_.header.size();
    }
    std::string_view label() { return fields_.keep(std::to_string(at_ + 1)); }

  private:
    Field& add(std::string_view name, std::string_view clause, std::size_t count, unsigned high,
               unsigned low) {
        Field field;
        field.octet = label();
        field.name = name;
        field.clause = clause;
        field.at = message_.header.subspan(at_, count);
        field.high = static_cast<std::uint8_t>(high);
        field.low = static_cast<std::uint8_t>(low);
        field.value = bitsOf(field.at[0], high, count == 1 ? low : 1);
        for (const std::uint8_t octet : field.at.subspan(1))
            field.value = field.value << 8 | octet;
        fields_.add(field);
        if (low == 1)
            at_ += count;
        return fields_.back();
    }

    void addReference() {
        constexpr std::string_view clause = "Q.931 4.3";
        add("spare", clause, 1, 8, 5).kind = Field::Kind::spare;
        add("length of call reference", clause, 1, 4, 1);
        const CallReference& reference = message_.callReference;
        if (reference.octets.empty())
            return;
        add("flag", clause, 1, 8, 8).meaning =
            reference.flag ? "to the side that chose it" : "from the side that chose it";
        add("call reference", clause, reference.octets.size(), 7, 1).meaning =
            reference.global() ? "global" : std::string_view();
    }

    void addType() {
        constexpr std::string_view clause = "Q.931 4.4";
        if (message_.national)
            add("escape to national types", clause, 1, 8, 1);
        add("message type", clause, 1, 8, 1).meaning = messageName(message_);
    }

    const Layer3& message_;
    Fields& fields_;
    std::size_t at_ = 0;
};

}  // namespace

Problem fieldsOf(const Layer2& frame, Fields& fields) {
    const std::size_t address = std::min<std::size_t>(2, frame.header.size());
    read(addressTable, frame.header.first(address), fields);
    if (frame.header.size() > address)
        read(controlTable(frame.header[address]), frame.header.subspan(address), fields);
    const Problem problem = informationFields(frame, fields);
    return frame.problem != Problem::none ? frame.problem : problem;
}

Problem fieldsOf(const Layer3& message, Fields& fields) {
    if (message.octets.empty())
        return message.problem;
    MessageHeader header(message, fields);
    header.run();
    const bool segment = message.hasType && !message.elements.octets().empty();
    addRaw(message.raw, header.label(), segment ? "piece of a message" : "contents", "Q.931 4.1", fields);
    return message.problem;
}

std::string_view Field::bits() const {
    // By the highest bit, then by the lowest.
    constexpr std::string_view names[8][8] = {
        {"1"},
        {"2-1", "2"},
        {"3-1", "3-2", "3"},
        {"4-1", "4-2", "4-3", "4"},
        {"5-1", "5-2", "5-3", "5-4", "5"},
        {"6-1", "6-2", "6-3", "6-4", "6-5", "6"},
        {"7-1", "7-2", "7-3", "7-4", "7-5", "7-6", "7"},
        {"8-1", "8-2", "8-3", "8-4", "8-5", "8-6", "8-7", "8"},
    };
    return names[(high - 1U) % 8][(low - 1U) % 8];
}

const Field* Fields::find(std::string_view name) const {
    for (const Field& field : fields_) {
        if (field.name == name)
            return &field;
    }
    return nullptr;
}

}  // namespace isdn
