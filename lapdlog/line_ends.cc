#include "lapdlog/line_ends.h"

#include <algorithm>
#include <string>

#include "lapdlog/between.h"
#include "lapdlog/headers.h"
#include "lapdlog/log.h"

namespace lapdlog {

namespace {

constexpr std::string_view dosLineEnd = "\r\n";

// Whether one of the recorder's entries begins at the beginning of a line.
bool hasEntry(std::string_view text, bool isAll) {
    while (!text.empty()) {
        Between between;
        Header header;
        if (readBetween(text, isAll, between) == Reading::good || readHeader(text, header) == Reading::good)
            return true;
        text.remove_prefix(std::min(text.find('\n'), text.size() - 1) + 1);
    }
    return false;
}

std::string withoutReturns(std::string_view text) {
    std::string joined;
    for (std::size_t end = text.find(dosLineEnd); end != std::string_view::npos;
         end = text.find(dosLineEnd)) {
        (joined += text.substr(0, end)) += '\n';
        text.remove_prefix(end + dosLineEnd.size());
    }
    return joined += text;
}

}  // namespace

bool hasDosLineEnds(std::string_view beginning) {
    return beginning.find(dosLineEnd) != std::string_view::npos && !hasEntry(beginning, true) &&
           hasEntry(withoutReturns(beginning), true);
}

capture::Form::Match isLog(std::string_view beginning, bool isAll) {
    if (hasEntry(beginning, isAll) || hasDosLineEnds(beginning))
        return capture::Form::Match::yes;
    return isAll ? capture::Form::Match::no : capture::Form::Match::perhaps;
}

}  // namespace lapdlog
