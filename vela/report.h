// Diagnostics on the standard error stream.
#ifndef VELA_REPORT_H
#define VELA_REPORT_H

#include <iostream>
#include <sstream>

namespace vela {

// Each item and an end of line, all in one piece: reports of several threads do not mix.
template <typename... Items>
void report(const Items&... items) {
    std::ostringstream text;
    ((text << items << "\n"), ...);
    std::cerr << text.str() << std::flush;
}

// "{label}{number}" and the like, as one item.
template <typename... Parts>
std::string joined(const Parts&... parts) {
    std::ostringstream text;
    (text << ... << parts);
    return text.str();
}

// The frame of the longer ones.
inline constexpr const char* BannerBegin = "\n********************************************";
inline constexpr const char* BannerEnd = "********************************************\n";

}  // namespace vela

#endif
