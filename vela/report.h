// Reports on the standard error stream.
#ifndef VELA_REPORT_H
#define VELA_REPORT_H

#include <iostream>
#include <sstream>
#include <string>

#include "vela/Exception.h"

namespace vela {

// Writes the items and a line end in one piece, so that reports of several threads do not mix.
template <typename... Items>
void report(const Items&... items) {
    std::ostringstream text;
    ((text << items << "\n"), ...);
    std::cerr << text.str() << std::flush;
}

// Makes one item of several parts, for example a label and a number.
template <typename... Parts>
std::string joined(const Parts&... parts) {
    std::ostringstream text;
    (text << ... << parts);
    return text.str();
}

// The beginning of the dispatcher's reports. The line numbers are part of the text.
inline std::string diagnostic(int line, const char* what) {
    return joined("(EvtCallback_Class", line, ") ", what);
}

// Called in a catch block. Reports that the exception has prevented the dispatcher from handing on a message.
inline void reportInternalError() {
    try {
        throw;
    } catch (const Exception& exception) {
        report(diagnostic(214, "vela internal error"), exception);
    } catch (...) {
        report(diagnostic(219, "vela internal error"));
    }
}

// The asterisks before and after longer reports.
inline constexpr const char* bannerBegin = "\n********************************************";
inline constexpr const char* bannerEnd = "********************************************\n";

}  // namespace vela

#endif
