// Reads numbers on a command line.
#ifndef BENCH_ARGUMENTS_H
#define BENCH_ARGUMENTS_H

#include <charconv>
#include <optional>
#include <string_view>
#include <system_error>

namespace bench {

// The number that the whole text is. Nothing when the text is not a number or the number is not between
// `least` and `most`.
template <typename Number>
std::optional<Number> numberIn(std::string_view text, Number least, Number most) {
    Number value{};
    const char* const end = text.data() + text.size();
    const auto [at, error] = std::from_chars(text.data(), end, value);
    if (error != std::errc() || at != end || !(least <= value && value <= most))
        return std::nullopt;
    return value;
}

}  // namespace bench

#endif
