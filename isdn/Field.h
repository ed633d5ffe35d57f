// The fields of an element, a message header or a link header: where each stands, and what it means.
#ifndef ISDN_FIELD_H
#define ISDN_FIELD_H

#include <cstddef>
#include <cstdint>
#include <deque>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "isdn/Layer2.h"
#include "isdn/Layer3.h"
#include "isdn/Variant.h"
#include "isdn/octets.h"

namespace isdn {

// A field is some bits of one octet, or several octets from a bit of the first to one of the last. The fields
// of an element cover each of its bits exactly once, in their order, so that whoever prints or rewrites them
// leaves nothing out.
struct Field {
    enum class Kind : std::uint8_t {
        value,      // a number, and its name in `meaning` if the number has one
        text,       // characters or digits; `meaning` holds them
        raw,        // octets that no table describes
        extension,  // bit 8: set if the octet is the last of its group
        spare,      // bits that the standard reserves
        header,     // identifier and length
    };

    std::string_view octet;    // as the standard numbers it: "3", "3a", "5.1"
    std::string_view name;     // "cause value"
    std::string_view meaning;  // "user busy"; empty if the value has no name
    std::string_view clause;   // "Q.931 4.5.12"
    Octets at;                 // the octets in which it stands, within the frame
    std::uint64_t value = 0;   // of at most eight octets; of more the last eight
    std::uint8_t high = 8;     // of the first octet, 8 to 1

    std::uint8_t low = 1;  // of the last octet
    Kind kind = Kind::value;
    bool personal = false;   // identifies a person: a number, a name, user data
    bool doubtful = false;   // no table says what it holds, or the octets contradict the table
    std::uint8_t depth = 0;  // 0, or how deep it stands in nested contents (facility)

    // "8-1", "7-6", "4".
    std::string_view bits() const;
};

// Fields in their order, and the texts that had to be composed for them. Reusing one object saves
// allocations.
class Fields {
  public:
    void add(const Field& field) { fields_.push_back(field); }
    // Keeps a composed text for as long as the fields; a view of it may be a field's name, octet or meaning.
    std::string_view keep(std::string text) { return texts_.emplace_back(std::move(text)); }
    void clear() {
        fields_.clear();
        texts_.clear();
    }

    bool empty() const { return fields_.empty(); }
    std::size_t size() const { return fields_.size(); }
    const Field& operator[](std::size_t i) const { return fields_[i]; }
    Field& back() { return fields_.back(); }
    auto begin() const { return fields_.begin(); }
    auto end() const { return fields_.end(); }
    auto begin() { return fields_.begin(); }
    auto end() { return fields_.end(); }

    // The first field of this name, or null. Looked for linearly.
    const Field* find(std::string_view name) const;

  private:
    std::vector<Field> fields_;
    std::deque<std::string> texts_;  // a deque leaves texts where they are
};

// Appends the fields of an element. Returns the element's own problem, or what its contents have shown.
// Fields point into the element's octets.
Problem fieldsOf(const Element& element, Variant variant, Fields& fields);

// Appends the fields of address and control; with `information` also of a frame reject, a TEI message, or the
// raw octets of XID. A layer-3 message is not among them.
Problem fieldsOf(const Layer2& frame, Fields& fields);

// Appends discriminator, call reference and message type, and what is raw in the message. Its elements are
// not among them.
Problem fieldsOf(const Layer3& message, Fields& fields);

// "CHANNEL IDENTIFICATION"; empty for an element that no table knows on this variant. In the words of the
// standard, in capitals.
std::string_view elementName(const Element& element, Variant variant);
// The same of an identifier in a message of call control.
std::string_view elementName(std::uint8_t codeset, std::uint8_t id, Variant variant);

}  // namespace isdn

#endif
