// Names of operations, errors and problems in facilities.
#ifndef ISDN_FACILITY_TABLES_H
#define ISDN_FACILITY_TABLES_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "isdn/ber_types.h"

namespace isdn::facility {

// The set of services that a local operation number belongs to. The same number means another operation in
// another set.
enum class Family : std::uint8_t {
    etsi,            // supplementary services of public networks (EN 300 series)
    privateNetwork,  // between private exchanges (ECMA, ISO/IEC)
    northAmerica
};

// An operation or an error is known by a number, or by an object identifier as "0.4.0.359.1.2".
struct Code {
    std::optional<std::int64_t> local;
    std::string global;
};
// "34" or "0.4.0.359.1.2"; empty if it is neither.
std::string toString(const Code& code);

struct Operation {
    std::int64_t local;  // its number, or -1 if it has an object identifier
    std::string_view global;
    std::string_view name;
    std::string_view clause;
    const BerType* argument = nullptr;  // null if there is none, or if no type describes it
    const BerType* result = nullptr;
};

// The operation with this code, or null if no table knows it.
const Operation* findOperation(Family family, const Code& code);

// The name of an error, "not subscribed"; empty if no table knows it.
std::string_view errorName(Family family, const Code& code);

// What a reject component says: `kind` is the tag of its problem, 0 general to 3 return error (X.880 9.5).
std::string_view problemName(std::uint32_t kind, std::int64_t problem);

// "remote operations", ...; empty for an unknown protocol profile (Q.932 8.2.3).
std::string_view profileName(std::uint8_t profile);

}  // namespace isdn::facility

#endif
