#include "lapdlog/variants.h"

#include <algorithm>
#include <array>

#include "decoder/log_lines.h"

namespace lapdlog {

namespace {

using capture::Variant;

// By the value of Variant.
constexpr std::array swits{0, 1, 2, 3, 4, 7, 10};

}  // namespace

int switOf(Variant variant) { return swits[static_cast<std::size_t>(variant)]; }

Variant variantOfLine(std::string_view line) {
    for (std::size_t i = 1; i < swits.size(); ++i) {
        const std::string_view known = decoder::variantLine(swits[i]);
        if (line == known.substr(0, known.size() - 1))
            return static_cast<Variant>(i);
    }
    return Variant::unknown;
}

}  // namespace lapdlog
