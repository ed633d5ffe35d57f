// The fields of an element, a message header or a link header: which octets and bits each takes, and what it
// means.
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

// A field consists of some bits of one octet, or of several octets, from a bit of the first to a bit of the
// last. The fields of an element are in order and cover each of its bits exactly once, so that code that
// prints or rewrites them leaves nothing out.
struct Field {
    enum class Kind : std::uint8_t {
        value,      // a number, and its name in `meaning` if the number has one
        text,       // characters or digits; `meaning` holds them
        raw,        // octets that no table describes
        extension,  // bit 8: set if the octet is the last of its group
        spare,      // bits that the standard reserves
        header,     // identifier and length
    };

    std::string_view octet;    // the octet's number in the standard: "3", "3a", "5.1"
    std::string_view name;     // "cause value"
    std::string_view meaning;  // "user busy"; empty if the value has no name
    std::string_view clause;   // "Q.931 4.5.12"
    Octets at;                 // the octets of the frame in which the field stands
    std::uint64_t value = 0;   // the number in the field's octets, or in the last eight of them
    std::uint8_t high = 8;     // the field's highest bit in the first octet, 8 to 1

    std::uint8_t low = 1;  // its lowest bit in the last octet, 8 to 1
    Kind kind = Kind::value;
    bool personal = false;   // identifies a person: a number, a name, user data
    bool doubtful = false;   // no table says what it holds, or the octets contradict the table
    std::uint8_t depth = 0;  // how deep the field stands in nested contents (facility); 0 elsewhere

    // The field's bits as text: "8-1", "7-6", "4".
    std::string_view bits() const;
};

// Fields in their order, and the texts that had to be composed for them. Using one object again saves
// allocations.
class Fields {
  public:
    void add(const Field& field) { fields_.push_back(field); }
    // Keeps a composed text as long as the fields. A field's name, octet or meaning may be a view of it.
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

    // The first field of this name, or null. Searches all fields one after another.
    const Field* find(std::string_view name) const;

  private:
    std::vector<Field> fields_;
    std::deque<std::string> texts_;  // a deque leaves texts where they are
};

// Appends the fields of an element. Returns the element's own problem, or else the problem of its contents.
// The fields are views of the element's octets.
Problem fieldsOf(const Element& element, Variant variant, Fields& fields);

// Appends the fields of the address and the control field, and those of the information field of FRMR, TEI
// messages and XID. The fields of a layer-3 message are not appended.
Problem fieldsOf(const Layer2& frame, Fields& fields);

// Appends the fields of discriminator, call reference and message type, and of octets that are no elements.
// The fields of elements are not appended.
Problem fieldsOf(const Layer3& message, Fields& fields);

// The standard's name of an element, in capitals: "CHANNEL IDENTIFICATION". Empty if no table knows the
// element on this variant.
std::string_view elementName(const Element& element, Variant variant);
// The same for an identifier in a message of call control.
std::string_view elementName(std::uint8_t codeset, std::uint8_t id, Variant variant);

}  // namespace isdn

#endif
