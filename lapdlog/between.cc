#include "lapdlog/between.h"

#include <algorithm>
#include <charconv>

#include "decoder/log_lines.h"
#include "lapdlog/variants.h"

namespace lapdlog {

namespace {

using Kind = capture::Item::Kind;

// The longest line of a variant is "DMS100 Switch ".
constexpr std::size_t longestVariantLine = 16;

Reading readHead(std::string_view text, bool isAll, Between& between) {
    const Reading head =
        readPieces(text, {"\n", decoder::logTitle, "\n", decoder::logNotice, "\n", decoder::logVersion, "\n"},
                   between.size);
    if (head != Reading::good)
        return head;
    between.kind = Kind::run;
    const std::string_view rest = text.substr(between.size, longestVariantLine);
    const std::size_t end = rest.find('\n');
    if (end == std::string_view::npos && rest.size() < longestVariantLine && !isAll)
        return Reading::cut;
    between.variant =
        end == std::string_view::npos ? capture::Variant::unknown : variantOfLine(rest.substr(0, end));
    if (between.variant != capture::Variant::unknown)
        between.size += end + 1;
    return Reading::good;
}

Reading readLost(std::string_view text, Between& between) {
    const Reading words = readPieces(text, {decoder::framesLost}, between.size);
    if (words != Reading::good)
        return words;
    const char* const end = text.data() + text.size();
    const auto [behind, error] = std::from_chars(text.data() + between.size, end, between.count);
    if (behind == end)
        return error == std::errc() || between.size == text.size() ? Reading::cut : Reading::bad;
    between.kind = Kind::lost;
    std::size_t size = 0;
    const Reading rest = readPieces({behind, end}, {" \n"}, size);
    between.size = static_cast<std::size_t>(behind - text.data()) + size;
    return error == std::errc() && between.count > 0 ? rest : Reading::bad;
}

Reading readLine(std::string_view text, std::string_view line, Kind kind, Between& between) {
    between.kind = kind;
    between.count = 1;
    return readPieces(text, {line}, between.size);
}

}  // namespace

Reading readBetween(std::string_view text, bool isAll, Between& between) {
    between = {};
    switch (text.empty() ? '\0' : text.front()) {
        case '\n':
            return readHead(text, isAll, between);
        case 'E':
            return readLine(text, decoder::enqueueFailed, Kind::notQueued, between);
        case 'G':
            return readLine(text, decoder::getFailed, Kind::notTaken, between);
        case 'F':
            return readLost(text, between);
        default:
            return Reading::bad;
    }
}

}  // namespace lapdlog
