// The tables of all elements, found by codeset, identifier and variant.
#include <array>
#include <iterator>

#include "isdn/Table.h"
#include "isdn/tables/bearer.h"
#include "isdn/tables/channel.h"
#include "isdn/tables/compatibility.h"
#include "isdn/tables/numbers.h"
#include "isdn/tables/services.h"
#include "isdn/tables/states.h"

namespace isdn {

namespace {

constexpr std::span<const ElementTable> families[] = {
    tables::bearerTables, tables::compatibilityTables, tables::channelTables,
    tables::numberTables, tables::serviceTables,       tables::stateTables,
};

constexpr std::size_t codesets = 8;
consteval std::size_t countTables() {
    std::size_t count = 0;
    for (const auto& family : families)
        count += family.size();
    return count;
}
constexpr std::size_t tablesInAll = countTables();

// The tables in one row, sorted into chains of one codeset and identifier; 0 ends a chain, others count
// from 1.
struct Index {
    std::array<std::array<std::uint8_t, 256>, codesets> first{};
    std::array<std::uint8_t, tablesInAll + 1> next{};
    std::array<const ElementTable*, tablesInAll + 1> tables{};
};

consteval Index makeIndex() {
    Index made;
    std::uint8_t number = 0;
    for (const auto& family : families) {
        for (const ElementTable& table : family) {
            made.tables[++number] = &table;
            std::uint8_t& first = made.first[table.codeset][table.id];
            for (std::uint8_t other = first; other != 0; other = made.next[other]) {
                if ((made.tables[other]->variants.members & table.variants.members) != 0)
                    throw "two tables of one element on one variant";
            }
            made.next[number] = first;
            first = number;
        }
    }
    return made;
}

constexpr Index tableIndex = makeIndex();

// Single-octet elements are identified by bits 7 to 5, but for those of type 2, 1010 (Q.931 4.5.1, figure
// 4-7).
constexpr std::uint8_t identifierOf(std::uint8_t id) {
    const bool valueInside = (id & 0x80U) != 0 && (id & 0xF0U) != 0xA0U;
    return valueInside ? id & 0xF0U : id;
}

const ElementTable unknownElement{0, 0, "", "Q.931 4.5.1", {}};

void addHeader(const Element& element, std::string_view label, std::string_view name, std::size_t at,
               std::string_view meaning, Fields& fields) {
    Field field;
    field.octet = label;
    field.name = name;
    field.meaning = meaning;
    field.clause = "Q.931 4.5.1";
    field.at = element.octets.subspan(at, 1);
    field.value = field.at[0];
    field.kind = Field::Kind::header;
    fields.add(field);
}

Problem unknownContents(Octets contents, Fields& fields) {
    if (!contents.empty()) {
        Field field;
        field.octet = "3";
        field.name = "contents";
        field.clause = unknownElement.clause;
        field.at = contents;
        field.kind = Field::Kind::raw;
        field.personal = true;
        field.doubtful = true;
        for (const std::uint8_t octet : contents)
            field.value = field.value << 8 | octet;
        fields.add(field);
    }
    return Problem::unknown;
}

}  // namespace

const ElementTable* elementTable(std::uint8_t codeset, std::uint8_t id, Variant variant, bool ofService) {
    if ((id & 0xF0U) == tables::shiftTable.id)
        return &tables::shiftTable;
    for (const ElementTable& table : tables::serviceMessageTables) {
        if (ofService && table.codeset == codeset && table.id == id)
            return &table;
    }
    const std::uint8_t first = tableIndex.first[codeset % codesets][identifierOf(id)];
    for (std::uint8_t number = first; number != 0; number = tableIndex.next[number]) {
        const ElementTable& table = *tableIndex.tables[number];
        if (table.variants.has(variant))
            return &table;
    }
    return nullptr;
}

std::string_view elementName(std::uint8_t codeset, std::uint8_t id, Variant variant) {
    const ElementTable* const table = elementTable(codeset, id, variant);
    return table == nullptr ? std::string_view() : table->name;
}

std::string_view elementName(const Element& element, Variant variant) {
    const ElementTable* const table = elementTable(element, variant);
    return table == nullptr ? std::string_view() : table->name;
}

Problem fieldsOf(const Element& element, Variant variant, Fields& fields) {
    if (element.octets.empty())
        return Problem::none;
    const ElementTable* const table = elementTable(element, variant);
    Problem found = Problem::none;
    if (element.singleOctet()) {
        found = table != nullptr ? readRows(*table, element.octets, variant, fields) : Problem::unknown;
        if (table == nullptr)
            addHeader(element, "1", "identifier", 0, {}, fields);
    } else {
        addHeader(element, "1", "identifier", 0, table != nullptr ? table->name : std::string_view(), fields);
        if (element.octets.size() > 1)
            addHeader(element, "2", "length", 1, {}, fields);
        found = table != nullptr ? readRows(*table, element.contents, variant, fields)
                                 : unknownContents(element.contents, fields);
    }
    return element.problem != Problem::none ? element.problem : found;
}

}  // namespace isdn
