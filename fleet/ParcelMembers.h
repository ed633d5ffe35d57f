// Reads the members of a JSON object in a parcel's text, each within limits. Internal to fleet/Parcel.cc.
#ifndef FLEET_PARCELMEMBERS_H
#define FLEET_PARCELMEMBERS_H

#include <cstddef>
#include <cstdint>
#include <nlohmann/json.hpp>
#include <optional>
#include <string>

#include "fleet/Parcel.h"
#include "fleet/subjects.h"

namespace fleet {

// Every function throws BadParcel, which names the member, for a value of another type or beyond the limits
// that the caller gives. `find` throws nothing. Keeps a reference to the object, which must outlive this one.
class ParcelMembers {
  public:
    using json = nlohmann::json;

    explicit ParcelMembers(const json& object) : object_(object) {
        if (!object.is_object())
            throw BadParcel("not an object where one must stand");
    }

    // Null if the object has no such member.
    const json* find(const char* key) const {
        const auto found = object_.find(key);
        return found == object_.end() ? nullptr : &*found;
    }

    std::uint64_t number(const char* key, std::uint64_t least, std::uint64_t most) const {
        const json& value = at(key);
        if (!value.is_number_unsigned() || value.get<std::uint64_t>() < least ||
            value.get<std::uint64_t>() > most)
            refuse(key);
        return value.get<std::uint64_t>();
    }

    // Functions whose names end with "If" return nothing, or an empty value, for a member that is absent.
    template <class Number>
    std::optional<Number> numberIf(const char* key, std::uint64_t most) const {
        if (find(key) == nullptr)
            return std::nullopt;
        return static_cast<Number>(number(key, 0, most));
    }

    std::string text(const char* key, std::size_t longest) const {
        const json& value = at(key);
        if (!value.is_string())
            refuse(key);
        const auto& text = value.get_ref<const std::string&>();
        constexpr char forbidden = '\0';  // the store cannot hold it
        if (text.size() > longest || text.find(forbidden) != std::string::npos)
            refuse(key);
        return text;
    }

    std::string textIf(const char* key, std::size_t longest) const {
        return find(key) == nullptr ? std::string() : text(key, longest);
    }

    std::string name(const char* key) const {
        std::string name = text(key, Parcel::longestText);
        if (!isName(name))
            refuse(key);
        return name;
    }

    bool truthIf(const char* key) const {
        const json* value = find(key);
        if (value != nullptr && !value->is_boolean())
            refuse(key);
        return value != nullptr && value->get<bool>();
    }

    const json& listIf(const char* key, std::size_t longest) const {
        static const json none = json::array();
        const json* value = find(key);
        if (value == nullptr)
            return none;
        if (!value->is_array() || value->size() > longest)
            refuse(key);
        return *value;
    }

    [[noreturn]] static void refuse(const char* key) {
        throw BadParcel(std::string("\"") + key + "\" is not what it must be");
    }

  private:
    const json& at(const char* key) const {
        const json* value = find(key);
        if (value == nullptr)
            throw BadParcel(std::string("\"") + key + "\" is missing");
        return *value;
    }

    const json& object_;
};

}  // namespace fleet

#endif
