// Types of ASN.1 as tables, and the meanings that they give to the values of a tree.
#ifndef ISDN_BER_TYPES_H
#define ISDN_BER_TYPES_H

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "isdn/ber.h"

namespace isdn {

struct BerType;

// A number of an ENUMERATED or INTEGER, and what it means.
struct BerName {
    std::int64_t number;
    std::string_view name;
};

// A member of a SEQUENCE, an alternative of a CHOICE, or the one member type of a SEQUENCE OF.
struct BerMember {
    // Whether the member has a context tag: none; implicit: it replaces the type's own tag; explicitly: it
    // stands around the tagged value.
    enum class Tagging : std::uint8_t { none, implicit, explicitly };
    // Whether a line of words shows the member's name and value, or only its value.
    enum class Words : std::uint8_t { named, valueAlone };

    std::string_view name;
    const BerType* type;
    Tagging tagging = Tagging::none;
    std::uint32_t tag = 0;
    Words words = Words::named;
};

struct BerType {
    enum class Kind : std::uint8_t {
        boolean,
        integer,
        enumerated,
        null,
        digits,  // NumericString
        text,    // IA5String
        name,    // OCTET STRING that holds characters
        octets,  // OCTET STRING
        sequence,
        sequenceOf,
        choice
    };

    Kind kind;
    std::span<const BerMember> members{};
    std::span<const BerName> names{};
    bool personal = false;  // identifies a person
};

// What a value of the tree is. A value that no type describes has no type and no name.
struct BerMeaning {
    std::string_view name;
    const BerType* type = nullptr;
    BerMember::Words words = BerMember::Words::named;
    // The name of the alternative that was taken, if the member is a choice.
    std::string_view alternative{};
    BerMember::Words alternativeWords = BerMember::Words::valueAlone;
    std::string_view says{};  // what its value means, where more than its type tells
};

// Finds the meanings of the values of a tree. Skips members that are absent, and values that the type does
// not know.
class BerMeanings {
  public:
    // Keeps a pointer to the tree, which must outlive this object.
    explicit BerMeanings(const BerTree& tree) : tree_(&tree), meanings_(tree.values().size()) {}

    // Gives the value at `index`, and all that it holds, the meaning of `member`. Returns false and does
    // nothing if the value cannot be that member.
    bool tell(std::size_t index, const BerMember& member);
    // Names a value that is part of no type.
    void name(std::size_t index, std::string_view name) { meanings_[index].name = name; }
    void say(std::size_t index, std::string_view meaning) { meanings_[index].says = meaning; }

    const BerMeaning& operator[](std::size_t index) const { return meanings_[index]; }

  private:
    void tellContents(std::size_t index, const BerType& type);
    void tellSequence(std::size_t index, std::span<const BerMember> members);

    const BerTree* tree_;
    std::vector<BerMeaning> meanings_;
};

// A primitive value in words: "busy", "12345", "yes", "0.4.0.359.1.2"; empty if it has no value or is
// damaged. Characters are given as they came, control characters too. Without a type the value's own tag
// decides.
std::string wordsOf(const BerTree& tree, const BerValue& value, const BerType* type);

// Whether a primitive value holds characters; without a type, whether it looks as if it did.
bool isText(const BerTree& tree, const BerValue& value, const BerType* type);

// Whether a primitive value identifies a person. Where no type is known, each string and number may.
bool isPersonal(const BerValue& value, const BerType* type);

}  // namespace isdn

#endif
