#include "capture/Frame.h"

#include <algorithm>
#include <array>

namespace capture {

namespace {

// By the value of Variant.
constexpr std::array<std::string_view, 7> names{"", "4ess", "5ess", "dms100", "ntt", "net5", "ni2"};

}  // namespace

std::string_view variantName(Variant variant) { return names[static_cast<std::size_t>(variant)]; }

Variant variantNamed(std::string_view name) {
    const auto* const found = std::find(names.begin(), names.end(), name);
    return found == names.end() ? Variant::unknown : static_cast<Variant>(found - names.begin());
}

std::string toString(const Place& place) {
    return std::string(place.file) + (place.unit == Place::Unit::line ? ":" : ": packet ") +
           std::to_string(place.number);
}

}  // namespace capture
