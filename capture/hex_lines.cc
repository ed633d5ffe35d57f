#include <algorithm>
#include <array>
#include <charconv>
#include <string>
#include <vector>

#include "capture/hex_digits.h"
#include "capture/lines.h"
#include "capture/notes.h"
#include "capture/text_forms.h"
#include "capture/time_text.h"

namespace capture {

namespace {

constexpr std::string_view blanks = " \t\r";

std::string_view takeWord(std::string_view& rest) {
    const std::size_t begin = std::min(rest.find_first_not_of(blanks), rest.size());
    const std::size_t end = std::min(rest.find_first_of(blanks, begin), rest.size());
    const std::string_view word = rest.substr(begin, end - begin);
    rest.remove_prefix(end);
    return word;
}

// A line taken apart.
struct HexLine {
    bool transmitted = false;
    ToldTime time;
    std::optional<std::uint32_t> ticks;
};

std::optional<bool> directionIn(std::string_view word) {
    if (word == "TX" || word == "tx" || word == "1")
        return true;
    if (word == "RX" || word == "rx" || word == "0")
        return false;
    return std::nullopt;
}

// Whether the word is a number of ticks: decimal, and one group of octets follows.
std::optional<std::uint32_t> ticksIn(std::string_view word, std::string_view rest) {
    std::uint32_t ticks = 0;
    const auto [end, error] = std::from_chars(word.data(), word.data() + word.size(), ticks);
    if (error != std::errc() || end != word.data() + word.size())
        return std::nullopt;
    constexpr std::size_t shortestGroup = 4;
    if (takeWord(rest).size() < shortestGroup || !takeWord(rest).empty())
        return std::nullopt;
    return ticks;
}

std::string_view withoutComment(std::string_view line) { return line.substr(0, line.find('#')); }

// Reads a line of a frame, and its octets into `octets`. Returns false for any other line.
bool parse(std::string_view rest, HexLine& line, std::vector<std::uint8_t>& octets) {
    octets.clear();
    const std::optional<bool> direction = directionIn(takeWord(rest));
    if (!direction)
        return false;
    line = {*direction, {}, {}};
    std::string_view word = takeWord(rest);
    if (const auto time = timeIn(word)) {
        line.time = *time;
        word = takeWord(rest);
    } else if (line.ticks = ticksIn(word, rest); line.ticks) {
        word = takeWord(rest);
    }
    for (; !word.empty(); word = takeWord(rest)) {
        if (!appendOctets(word, octets))
            return false;
    }
    return !octets.empty();
}

// The comment that says with which key the lines were redacted; empty if the line is none.
std::string_view redactionIn(std::string_view line) {
    constexpr std::string_view sign = "# ";
    return line.starts_with(sign) && line.substr(sign.size()).starts_with(redactedPrefix)
               ? line.substr(sign.size())
               : std::string_view();
}

bool isBlank(std::string_view line) { return line.find_first_not_of(blanks) == std::string_view::npos; }

class HexParser final : public Parser {
  public:
    explicit HexParser(const Context& context)
        : lines_(context.source), file_(context.source.name()), interface_(context.unnamed) {}

    Reader::Next next(Item& item) override {
        std::string_view line;
        do {
            const Source::State state = lines_.next(line);
            if (state != Source::State::ready)
                return state == Source::State::pause ? Reader::Next::pause : Reader::Next::end;
            if (const std::string_view note = redactionIn(line); !note.empty()) {
                item = itemHere(Item::Kind::comment);
                item.text = note;
                return Reader::Next::item;
            }
            line = withoutComment(line);
        } while (isBlank(line));
        take(line, item);
        return Reader::Next::item;
    }

  private:
    void take(std::string_view line, Item& item) {
        HexLine parsed;
        const bool isGood = parse(line, parsed, octets_);
        item = itemHere(isGood ? Item::Kind::frame : Item::Kind::unproved);
        if (!isGood) {
            item.count = 1;
            item.text = "this line is no direction, time and octets; it is passed over";
            return;
        }
        item.frame.octets = octets_;
        item.frame.transmitted = parsed.transmitted;
        item.frame.clock = parsed.time.clock;
        item.frame.time = parsed.time.time;
        item.frame.ticks = parsed.ticks;
    }

    Item itemHere(Item::Kind kind) const {
        Item item;
        item.kind = kind;
        item.frame.interface = interface_;
        item.frame.place = {file_, lines_.number(), Place::Unit::line};
        return item;
    }

    Lines lines_;
    std::string_view file_;
    const Interface* interface_;
    std::vector<std::uint8_t> octets_;
};

}  // namespace

// The first line that is neither blank nor a comment decides.
Form::Match isHexLines(std::string_view beginning, bool isAll) {
    while (!beginning.empty()) {
        const std::size_t end = beginning.find('\n');
        if (end == std::string_view::npos && !isAll)
            return Form::Match::perhaps;
        const std::string_view line = withoutComment(beginning.substr(0, end));
        if (!isBlank(line)) {
            HexLine parsed;
            std::vector<std::uint8_t> octets;
            return parse(line, parsed, octets) ? Form::Match::yes : Form::Match::no;
        }
        beginning.remove_prefix(end == std::string_view::npos ? beginning.size() : end + 1);
    }
    return isAll ? Form::Match::no : Form::Match::perhaps;
}

std::unique_ptr<Parser> readHexLines(const Context& context) { return std::make_unique<HexParser>(context); }

}  // namespace capture
