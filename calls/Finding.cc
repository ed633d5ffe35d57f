#include "calls/Finding.h"

#include <algorithm>
#include <array>

#include "calls/FindingKinds.h"

namespace calls {

std::string_view nameOf(Severity severity) {
    constexpr std::array<std::string_view, 3> names{"note", "warning", "error"};
    return names[static_cast<std::size_t>(severity)];
}

std::span<const FindingKind* const> findingKinds() { return findings::kinds; }

const FindingKind* findingKind(std::string_view id) {
    const auto kinds = findingKinds();
    const auto found =
        std::find_if(kinds.begin(), kinds.end(), [&](const FindingKind* kind) { return kind->id == id; });
    return found == kinds.end() ? nullptr : *found;
}

}  // namespace calls
