#include "capture/Item.h"

#include <algorithm>
#include <array>

namespace capture {

namespace {

// By the value of Kind.
constexpr std::array<std::string_view, 14> names{
    "frame", "oversized", "cut",      "frames-lost", "not-queued", "not-taken", "dropped",
    "run",   "restart",   "replaced", "mixed",       "unproved",   "damaged",   "comment"};

}  // namespace

std::string_view kindName(Item::Kind kind) { return names[static_cast<std::size_t>(kind)]; }

std::optional<Item::Kind> kindNamed(std::string_view name) {
    const auto* const found = std::find(names.begin(), names.end(), name);
    if (found == names.end())
        return std::nullopt;
    return static_cast<Item::Kind>(found - names.begin());
}

}  // namespace capture
