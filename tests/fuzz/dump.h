// The hexadecimal dump that must end a frame's text, whatever stands above it.
#ifndef TESTS_FUZZ_DUMP_H
#define TESTS_FUZZ_DUMP_H

#include <string>

#include "tests/fuzz/fuzz.h"

namespace fuzz {

// Ten octets to a line; transmitted frames are indented by 33 blanks.
inline std::string dumpOf(const Octets& octets, bool transmitted) {
    constexpr std::string_view digits = "0123456789abcdef";
    const std::string indent(transmitted ? 33 : 0, ' ');
    std::string text = indent + "Hex Dump: \n" + indent;
    for (std::size_t i = 0; i < octets.size(); ++i) {
        if (i > 0 && i % 10 == 0)
            text += "\n" + indent;
        text += {digits[octets[i] >> 4U], digits[octets[i] & 15U], ' '};
    }
    return text + "\n";
}

}  // namespace fuzz

#endif
