// The tables that describe elements. A row describes a field at its place. One engine (isdn/engine.cc) reads
// all tables.
//
//     inline constexpr Row progressRows[] = {
//         {"3", bits(7, 6), "coding standard", codingStandards},
//         {"", bits(4, 1), "location", locations},
//         {"4", bits(7, 1), "progress description", progressDescriptions},
//     };
//
// A row with a label begins an octet, or octets; one without a label is another field of the same octet. Bits
// that no row names need no row: bit 8 is then the extension bit, and any other is spare. The condition
// `when` in the first row of an octet decides whether the octet is present. In any other row it decides
// whether the field is.
#ifndef ISDN_TABLE_H
#define ISDN_TABLE_H

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <iterator>
#include <span>
#include <string_view>

#include "isdn/Field.h"
#include "isdn/Variant.h"
#include "isdn/When.h"
#include "isdn/octets.h"

namespace isdn {

struct Name {
    std::uint8_t value;
    std::string_view text;
};

// The names of a field's values: rows, or a function that knows them.
class Names {
  public:
    constexpr Names() = default;
    template <std::size_t N>
    constexpr Names(const Name (&rows)[N])
        : rows_(rows) {}  // NOLINT(*-explicit-*): the rows of tables convert to it
    constexpr Names(std::string_view (*function)(std::uint8_t))
        : function_(function) {}  // NOLINT(*-explicit-*)

    // Empty if the value has no name.
    constexpr std::string_view operator()(std::uint8_t value) const {
        if (function_ != nullptr)
            return function_(value);
        for (const Name& row : rows_) {
            if (row.value == value)
                return row.text;
        }
        return {};
    }

  private:
    std::span<const Name> rows_;
    std::string_view (*function_)(std::uint8_t) = nullptr;
};

// Octets that a function of their own takes apart: characters, digits, diagnostics, components.
struct Contents {
    Octets octets;
    std::string_view octet;  // the label of the first
    std::string_view name;
    std::string_view clause;
    bool personal;
    Variant variant;
    const Seen& seen;  // what came before in the element
};
// Appends fields that cover the octets, each exactly once.
using ContentsReader = Problem (*)(const Contents&, Fields&);

struct Place {
    enum class Kind : std::uint8_t {
        bits,      // of one octet
        heading,   // bits that hold the identifier
        reserved,  // bits that are spare even where bit 8 would be the extension bit
        nothing,   // the row itself is no field; the following rows describe the octet's fields
        octets,
    };
    enum class Repeat : std::uint8_t { once, whileExtended, toEnd };

    Kind kind = Kind::bits;
    std::uint8_t high = 8;
    std::uint8_t low = 1;
    Repeat repeat = Repeat::once;
    std::uint8_t count = 0;           // the number of octets; 0 stands for all that are left
    std::string_view countedBy;       // the label of the octet that holds the number of octets, if any
    std::uint8_t alreadyCounted = 0;  // how many of these octets other rows have taken
    ContentsReader reader = nullptr;  // null reads octets as they are
};

constexpr Place bits(unsigned high, unsigned low) {
    return {Place::Kind::bits,
            static_cast<std::uint8_t>(high),
            static_cast<std::uint8_t>(low),
            Place::Repeat::once,
            0,
            {},
            0,
            nullptr};
}
constexpr Place heading(unsigned high, unsigned low) {
    Place place = bits(high, low);
    place.kind = Place::Kind::heading;
    return place;
}
constexpr Place reserved(unsigned high, unsigned low) {
    Place place = bits(high, low);
    place.kind = Place::Kind::reserved;
    return place;
}
inline constexpr Place nothing{Place::Kind::nothing, 8, 1, Place::Repeat::once, 0, {}, 0, nullptr};
// The octet is read again while bit 8 of the last one is clear.
constexpr Place repeated(Place place) {
    place.repeat = Place::Repeat::whileExtended;
    return place;
}
// The octet is read again until the element ends.
constexpr Place toEnd(Place place) {
    place.repeat = Place::Repeat::toEnd;
    return place;
}
constexpr Place octets(unsigned count, ContentsReader reader = nullptr) {
    return {Place::Kind::octets, 8, 1, Place::Repeat::once, static_cast<std::uint8_t>(count), {}, 0, reader};
}
constexpr Place rest(ContentsReader reader = nullptr) { return octets(0, reader); }
constexpr Place counted(std::string_view by, unsigned already, ContentsReader reader = nullptr) {
    return {
        Place::Kind::octets, 8, 1, Place::Repeat::once, 0, by, static_cast<std::uint8_t>(already), reader};
}

struct Row {
    std::string_view octet;
    Place place;
    std::string_view name = {};
    Names names = {};
    When when = {};
    bool isPersonal = false;
    std::string_view clause = {};  // where it is not the element's own
};

// The field identifies a person.
constexpr Row personal(Row row) {
    row.isPersonal = true;
    return row;
}

// Joins rows to one table, for elements that share some rows.
template <std::size_t... Sizes>
consteval auto join(const Row (&... parts)[Sizes]) {
    std::array<Row, (Sizes + ...)> all{};
    auto end = all.begin();
    ((end = std::copy(std::begin(parts), std::end(parts), end)), ...);
    return all;
}

struct ElementTable {
    // What happens to the octets when `understood` fails.
    enum class Otherwise : std::uint8_t {
        unnamed,  // they are fields all the same, but their values have no names
        raw,      // they are raw
    };

    std::uint8_t codeset;
    std::uint8_t id;  // of a single-octet element the bits that identify it, the others 0
    std::string_view name;
    std::string_view clause;
    std::span<const Row> rows;
    Variants variants = everywhere;
    Test understood = {};  // passes if the coding standard is one whose values the rows describe
    Otherwise otherwise = Otherwise::unnamed;
};

// The table of an element on a variant, or null. Elements of SERVICE messages have tables of their own before
// the others.
const ElementTable* elementTable(std::uint8_t codeset, std::uint8_t id, Variant variant,
                                 bool ofService = false);
inline const ElementTable* elementTable(const Element& element, Variant variant) {
    return elementTable(element.codeset, element.id, variant, element.ofService);
}

// Reads octets by a table and appends their fields.
Problem readRows(const ElementTable& table, Octets octets, Variant variant, Fields& fields);

}  // namespace isdn

#endif
