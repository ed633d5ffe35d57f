// The line ends of a log that went through another system.
#ifndef LAPDLOG_LINE_ENDS_H
#define LAPDLOG_LINE_ENDS_H

#include <string_view>

namespace lapdlog {

// Whether the text is that of a log only when one carriage return in front of each line feed is left out.
bool hasDosLineEnds(std::string_view beginning);

}  // namespace lapdlog

#endif
