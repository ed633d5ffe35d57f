#include "lapdlog/headers.h"

#include <algorithm>

#include "decoder/lines.h"

namespace lapdlog {

namespace {

constexpr std::string_view indent(decoder::indent, decoder::indentSize);
constexpr std::uint64_t ticksPerSecond = 250;
constexpr std::uint64_t millisecondsPerTick = 4;
constexpr std::uint64_t mostTicks = 0xffffffff;

// Reads a text as long as it agrees with what is expected.
class Scan {
  public:
    explicit Scan(std::string_view text) : rest_(text) {}

    void take(std::string_view words) {
        if (reading_ != Reading::good)
            return;
        if (rest_.starts_with(words))
            rest_.remove_prefix(words.size());
        else
            reading_ = words.starts_with(rest_) ? Reading::cut : Reading::bad;
    }

    // Takes this many characters, none of which may be a line feed.
    std::string_view takeText(std::size_t size) {
        if (reading_ != Reading::good)
            return {};
        const std::string_view taken = rest_.substr(0, size);
        if (taken.find('\n') != std::string_view::npos)
            reading_ = Reading::bad;
        else if (taken.size() < size)
            reading_ = Reading::cut;
        rest_.remove_prefix(taken.size());
        return taken;
    }

    // A number without leading zeros.
    std::uint64_t takeNumber(std::uint64_t most) {
        constexpr std::size_t mostDigits = 11;
        std::uint64_t number = 0;
        std::size_t at = 0;
        for (; at < rest_.size() && at < mostDigits && '0' <= rest_[at] && rest_[at] <= '9'; ++at)
            number = number * 10 + static_cast<std::uint64_t>(rest_[at] - '0');
        if (reading_ != Reading::good)
            return 0;
        if (number > most || (at > 1 && rest_[0] == '0') || (at == 0 && !rest_.empty()))
            reading_ = Reading::bad;
        else if (at == rest_.size())
            reading_ = Reading::cut;
        rest_.remove_prefix(at);
        return number;
    }

    Reading reading() const { return reading_; }
    std::string_view rest() const { return rest_; }

  private:
    std::string_view rest_;
    Reading reading_ = Reading::good;
};

}  // namespace

Reading readHeader(std::string_view text, Header& header) {
    Scan scan(text);
    scan.take("\n");
    header.transmitted = scan.rest().starts_with(' ');
    const std::string_view before = header.transmitted ? indent : std::string_view();
    scan.take(before);
    header.written = scan.takeText(dateSize);
    scan.take("\n");
    scan.take(before);
    scan.take(header.transmitted ? "TX Frame: Time = " : "RX Frame: Time = ");
    const std::uint64_t seconds = scan.takeNumber(mostTicks / ticksPerSecond);
    scan.take(".");
    const std::uint64_t milliseconds = scan.takeNumber(999);
    scan.take("\n");
    header.size = text.size() - scan.rest().size();
    const std::uint64_t ticks = seconds * ticksPerSecond + milliseconds / millisecondsPerTick;
    if (scan.reading() == Reading::good && (milliseconds % millisecondsPerTick != 0 || ticks > mostTicks))
        return Reading::bad;
    header.ticks = static_cast<std::uint32_t>(ticks);
    return scan.reading();
}

Reading readPieces(std::string_view text, std::initializer_list<std::string_view> pieces, std::size_t& size) {
    size = 0;
    for (const std::string_view piece : pieces) {
        const std::string_view rest = text.substr(size);
        if (!rest.starts_with(piece))
            return piece.starts_with(rest) ? Reading::cut : Reading::bad;
        size += piece.size();
    }
    return Reading::good;
}

// Counts each piece of the text in 8 bits, which suffice for a piece, because the compiler can then count 16
// characters at a time.
std::uint64_t lineEndsIn(std::string_view text) {
    constexpr std::size_t pieceSize = 255;
    std::uint64_t all = 0;
    for (; !text.empty(); text.remove_prefix(std::min(pieceSize, text.size()))) {
        std::uint8_t ends = 0;
        for (const char c : text.substr(0, pieceSize))
            ends = static_cast<std::uint8_t>(ends + (c == '\n' ? 1 : 0));
        all += ends;
    }
    return all;
}

}  // namespace lapdlog
