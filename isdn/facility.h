// Reads the contents of FACILITY and EXTENDED FACILITY: components of supplementary services (Q.932 8.2.3,
// X.880, and ECMA-165 for networking extensions).
#ifndef ISDN_FACILITY_H
#define ISDN_FACILITY_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "isdn/Field.h"
#include "isdn/Variant.h"
#include "isdn/ber.h"
#include "isdn/ber_types.h"
#include "isdn/facility_tables.h"
#include "isdn/octets.h"

namespace isdn {

// One component: a request for an operation, or an answer to one.
struct Component {
    enum class Kind : std::uint8_t {
        invoke = 1,
        result = 2,
        error = 3,
        reject = 4
    };  // the tag number (X.880 9)

    Kind kind = Kind::invoke;
    std::size_t index = 0;  // the index of its value in the tree
    std::optional<std::int64_t> invokeId;
    std::optional<std::int64_t> linkedId;
    facility::Code code;                             // the code of the operation or of the error
    const facility::Operation* operation = nullptr;  // null if there is none, or no table knows it
    std::string_view error;    // the error's name, or what a reject says; empty if unknown
    std::size_t argument = 0;  // index of its argument, result or parameter; 0: there is none
};

// "invoke", "return result", "return error", "reject".
std::string_view nameOf(Component::Kind kind);

// The contents of a facility, taken apart. Keeps views of the octets, which must outlive it.
class Facility {
  public:
    // `contents` is what follows the element's length octet. If the profile does not say which set of
    // services the operation numbers belong to, the variant of the trunk decides.
    Facility(Octets contents, Variant variant);

    std::uint8_t profile() const { return profile_; }  // 0x11 remote operations, 0x12, 0x13, 0x1F
    const BerTree& tree() const { return tree_; }
    const BerMeanings& meanings() const { return meanings_; }
    const std::vector<Component>& components() const { return components_; }
    // The problem of the first value that has one.
    Problem problem() const { return problem_; }

    // Appends a field for each bit of the contents: the profile, then for each value its identifier and
    // length, and for each primitive value its contents. `depth` of a field says how deep its value stands.
    // In operations that no table knows, each string and number is personal.
    void appendFields(Fields& fields) const;
    // Appends "invoke 5 charges during the call, units: units 3, subtotal", for each component.
    void appendWords(std::string& line) const;

  private:
    struct Fielder;

    void readValues();
    void readComponent(std::size_t index);
    void readReject(Component& component, const std::vector<std::size_t>& children);
    void readAnswer(Component& component, const std::vector<std::size_t>& children);
    void readInvoke(Component& component, const std::vector<std::size_t>& children);
    void readOperation(Component& component, std::size_t index);
    void readError(Component& component, std::size_t index);
    void setCode(Component& component, std::size_t index, std::string_view name);
    void appendValueWords(std::string& line, std::size_t index) const;
    std::optional<std::int64_t> integerAt(std::size_t index) const;

    Octets contents_;
    std::size_t valuesAt_ = 0;  // where the values begin, behind the profile's octets
    std::uint8_t profile_ = 0;
    facility::Family family_;
    BerTree tree_;
    BerMeanings meanings_;
    std::vector<Component> components_;
    Problem problem_ = Problem::none;
};

// The same in one call, for the tables of elements. Returns Facility::problem().
Problem facilityFields(Octets contents, Variant variant, Fields& fields);

}  // namespace isdn

#endif
