// The fields of a body that one call of nvMsgVarFieldGet or nvMsgVarFieldPut moves, for the tests' own
// transport libraries.
#ifndef TESTS_SUPPORT_BODY_FIELDS_H
#define TESTS_SUPPORT_BODY_FIELDS_H

#include <cstdarg>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <vector>

namespace body_fields {

// The octets are moved unchanged, because both the host and the wire are little-endian.
struct Field {
    std::uint32_t descriptor;
    void* storage;

    std::size_t size() const {
        const std::size_t elements = (descriptor >> 11 & 0xFF) + 1;
        switch (descriptor >> 19 & 0x1F) {
            case 0:
            case 4:
            case 10:
                return elements;
            case 1:
            case 5:
                return 2 * elements;
            default:
                return 4 * elements;
        }
    }
    void get(const std::uint8_t* body) const { std::memcpy(storage, body, size()); }
    void put(std::uint8_t* body) const { std::memcpy(body, storage, size()); }
};

// Reads the arguments of a call, which the caller has started.
inline std::vector<Field> fieldsOf(std::uint32_t count, std::va_list arguments) {
    std::vector<Field> fields;
    for (std::uint32_t i = 0; i < count; ++i) {
        // NOLINTNEXTLINE(clang-analyzer-valist.Uninitialized): the callers start it
        const std::uint32_t descriptor = va_arg(arguments, std::uint32_t);
        fields.push_back({descriptor, va_arg(arguments, void*)});
    }
    return fields;
}

}  // namespace body_fields

#endif
