// Recognises the line ends of a log that was copied through another system.
#ifndef LAPDLOG_LINE_ENDS_H
#define LAPDLOG_LINE_ENDS_H

#include <string_view>

namespace lapdlog {

// Whether the text is a log if, and only if, one carriage return before each line feed is left out.
bool hasDosLineEnds(std::string_view beginning);

}  // namespace lapdlog

#endif
