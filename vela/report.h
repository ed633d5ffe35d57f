// Diagnostics on the standard error stream.
#ifndef VELA_REPORT_H
#define VELA_REPORT_H

#include <iostream>
#include <sstream>
#include <string>

#include "vela/Exception.h"

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

// What begins the dispatcher's diagnostics. The line numbers are part of the text.
inline std::string diagnostic(int line, const char* what) {
    return joined("(EvtCallback_Class", line, ") ", what);
}

// Reports the exception that is being handled as one that has kept the dispatcher from handing on a message.
inline void reportInternalError() {
    try {
        throw;
    } catch (const Exception& exception) {
        report(diagnostic(214, "vela internal error"), exception);
    } catch (...) {
        report(diagnostic(219, "vela internal error"));
    }
}

// The frame of the longer ones.
inline constexpr const char* BannerBegin = "\n********************************************";
inline constexpr const char* BannerEnd = "********************************************\n";

}  // namespace vela

#endif
