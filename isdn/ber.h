// Reads values in the Basic Encoding Rules of ASN.1 (X.690 clause 8), which facilities contain.
#ifndef ISDN_BER_H
#define ISDN_BER_H

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "isdn/octets.h"

namespace isdn {

// X.690 8.1.2.2. The numbers are bits 8 and 7 of the identifier octet.
enum class BerClass : std::uint8_t { universal, application, context, privateUse };

// Identifies a type. Whether the value is constructed is no part of it.
struct BerTag {
    BerClass tagClass = BerClass::universal;
    std::uint32_t number = 0;

    bool operator==(const BerTag&) const = default;
};

// Universal tags (X.680 table 1).
inline constexpr BerTag berBoolean{BerClass::universal, 1};
inline constexpr BerTag berInteger{BerClass::universal, 2};
inline constexpr BerTag berOctetString{BerClass::universal, 4};
inline constexpr BerTag berNull{BerClass::universal, 5};
inline constexpr BerTag berObjectIdentifier{BerClass::universal, 6};
inline constexpr BerTag berEnumerated{BerClass::universal, 10};
inline constexpr BerTag berSequence{BerClass::universal, 16};
inline constexpr BerTag berSet{BerClass::universal, 17};
inline constexpr BerTag berNumericString{BerClass::universal, 18};
inline constexpr BerTag berIa5String{BerClass::universal, 22};

constexpr BerTag contextTag(std::uint32_t number) { return {BerClass::context, number}; }

enum class BerProblem : std::uint8_t {
    none,
    cut,           // the identifier or length octets are not all there
    tagTooLong,    // the tag number does not fit 32 bits
    badLength,     // the length octet is FF, or its number does not fit 32 bits (8.1.3.5)
    overrun,       // the length reaches beyond the value around it, or beyond the octets
    noEnd,         // of indefinite length, without end-of-contents octets
    endlessPlain,  // primitive, yet of indefinite length (8.1.3.2)
    tooDeep,       // it stands deeper than berDeepest; its contents are not read
    tooMany        // the octets hold more values than berMost; this value holds the rest of them
};
// "the length reaches beyond the end"; "" for none.
std::string_view toString(BerProblem problem);

// A value. Offsets count from the first octet that was handed to parseBer.
struct BerValue {
    BerTag tag;
    bool constructed = false;
    bool indefinite = false;
    BerProblem problem = BerProblem::none;
    std::uint16_t depth = 0;   // 0 for values that stand in no other
    std::size_t offset = 0;    // of the identifier octet
    std::size_t contents = 0;  // offset of the contents octets
    std::size_t length = 0;    // of the contents octets; with a problem, all octets that remained
    std::size_t next = 0;      // the index of the value behind this one and all that it holds
};

// Limits on the work that octets from outside can cause.
inline constexpr std::uint16_t berDeepest = 32;
inline constexpr std::size_t berMost = 4096;

// All values in some octets. Each value is followed by those that it holds. A value with a problem is the
// last one inside its enclosing value and takes all octets that are left there, so that each octet belongs to
// a value.
class BerTree {
  public:
    // Keeps a view of the octets, which must outlive the tree.
    explicit BerTree(Octets octets);

    const std::vector<BerValue>& values() const { return values_; }
    Octets octets() const { return octets_; }
    Octets contentsOf(const BerValue& value) const { return octets_.subspan(value.contents, value.length); }

    // The indices of the values directly inside values()[index]; empty for a primitive value.
    std::vector<std::size_t> childrenOf(std::size_t index) const;

  private:
    struct Container;
    struct Parser;

    Octets octets_;
    std::vector<BerValue> values_;
};

// Read contents octets. The result is empty if the octets are no such value, or if the number does not fit.
std::optional<std::int64_t> berIntegerOf(Octets contents);          // X.690 8.3; ENUMERATED likewise
std::optional<bool> berBooleanOf(Octets contents);                  // 8.2
std::optional<std::string> berObjectIdentifierOf(Octets contents);  // 8.19, as "0.4.0.359.1.2"

// "[1]", "[APPLICATION 0]", "INTEGER", "UNIVERSAL 31".
std::string toString(BerTag tag);

}  // namespace isdn

#endif
