// Makes a tuple of references to the fields of a row, which is a plain struct of fields, in the order of
// their declaration.
#ifndef VELA_FIELDSOF_H
#define VELA_FIELDSOF_H

#include <cstddef>
#include <tuple>
#include <type_traits>
#include <utility>

#include "vela/field.h"

namespace vela {

namespace detail {

struct AnyField {
    template <typename T>
    operator T() const;
};

template <typename Row, std::size_t... i>
constexpr bool takes(std::index_sequence<i...>) {
    return requires { Row{(static_cast<void>(i), AnyField{})...}; };
}

template <typename Row, std::size_t n = 0>
constexpr std::size_t fieldCount() {
    if constexpr (takes<Row>(std::make_index_sequence<n + 1>{}))
        return fieldCount<Row, n + 1>();
    else
        return n;
}

}  // namespace detail

template <typename Row>
inline constexpr std::size_t fieldCount = detail::fieldCount<std::remove_const_t<Row>>();

template <typename Row>
constexpr auto fieldsOf(Row& row) {
    constexpr std::size_t n = fieldCount<Row>;
    static_assert(n <= 11, "a longer row needs a longer ladder here");
    // clang-format off
    if constexpr (n == 0) { return std::tie(); }
    else if constexpr (n == 1) { auto& [a] = row; return std::tie(a); }
    else if constexpr (n == 2) { auto& [a, b] = row; return std::tie(a, b); }
    else if constexpr (n == 3) { auto& [a, b, c] = row; return std::tie(a, b, c); }
    else if constexpr (n == 4) { auto& [a, b, c, d] = row; return std::tie(a, b, c, d); }
    else if constexpr (n == 5) { auto& [a, b, c, d, e] = row; return std::tie(a, b, c, d, e); }
    else if constexpr (n == 6) { auto& [a, b, c, d, e, f] = row; return std::tie(a, b, c, d, e, f); }
    else if constexpr (n == 7) { auto& [a, b, c, d, e, f, g] = row; return std::tie(a, b, c, d, e, f, g); }
    else if constexpr (n == 8) { auto& [a, b, c, d, e, f, g, h] = row; return std::tie(a, b, c, d, e, f, g, h); }
    else if constexpr (n == 9) { auto& [a, b, c, d, e, f, g, h, i] = row; return std::tie(a, b, c, d, e, f, g, h, i); }
    else if constexpr (n == 10) { auto& [a, b, c, d, e, f, g, h, i, j] = row; return std::tie(a, b, c, d, e, f, g, h, i, j); }
    else { auto& [a, b, c, d, e, f, g, h, i, j, k] = row; return std::tie(a, b, c, d, e, f, g, h, i, j, k); }
    // clang-format on
}

template <typename Row, std::size_t i>
using FieldAt = std::remove_reference_t<std::tuple_element_t<i, decltype(fieldsOf(std::declval<Row&>()))>>;

// How many of the first i fields of a row are not counts; and how many of all its fields.
template <typename Row, std::size_t i>
constexpr std::size_t valuesBefore() {
    if constexpr (i == 0)
        return 0;
    else
        return valuesBefore<Row, i - 1>() + (CountField<FieldAt<Row, i - 1>> ? 0 : 1);
}
template <typename Row>
inline constexpr std::size_t valueCount = valuesBefore<Row, fieldCount<Row>>();

// Whether a body can be bound to variables of these types: one for each field, or one for each field that is
// no count.
template <typename Row, typename... Variables>
concept BindsTo = (sizeof...(Variables) > 0) &&
                  (sizeof...(Variables) == fieldCount<Row> ||
                   sizeof...(Variables) == valueCount<Row>)&&(!std::is_base_of_v<Row, Variables> && ...);

}  // namespace vela

#endif
