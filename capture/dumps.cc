#include <algorithm>
#include <array>
#include <optional>
#include <utility>
#include <vector>

#include "capture/hex_digits.h"
#include "capture/lines.h"
#include "capture/text_forms.h"
#include "capture/time_text.h"

namespace capture {

namespace {

constexpr std::string_view blanks = " \t";

void skipBlanks(std::string_view& text) {
    text.remove_prefix(std::min(text.find_first_not_of(blanks), text.size()));
}

bool take(std::string_view& text, char c) {
    if (text.empty() || text.front() != c)
        return false;
    text.remove_prefix(1);
    return true;
}

enum class Octets { more, closed, bad };

// Takes octets up to the closing bracket, or to the line's end.
Octets takeOctets(std::string_view& text, std::vector<std::uint8_t>& octets) {
    while (true) {
        skipBlanks(text);
        if (text.empty())
            return Octets::more;
        if (take(text, ']'))
            return Octets::closed;
        const std::size_t end = std::min(text.find_first_of(" \t]"), text.size());
        if (!appendOctets(text.substr(0, end), octets))
            return Octets::bad;
        text.remove_prefix(end);
    }
}

struct Opening {
    bool transmitted;
    std::string_view rest;  // behind the bracket
};

// The first sign of a direction with a bracket behind it.
std::optional<Opening> openingIn(std::string_view line) {
    for (std::size_t at = line.find_first_of("<>"); at != std::string_view::npos;
         at = line.find_first_of("<>", at + 1)) {
        std::string_view rest = line.substr(at + 1);
        skipBlanks(rest);
        if (take(rest, '['))
            return Opening{line[at] == '>', rest};
    }
    return std::nullopt;
}

bool beginsDump(std::string_view line) {
    std::vector<std::uint8_t> octets;
    auto opening = openingIn(line);
    return opening && takeOctets(opening->rest, octets) != Octets::bad && !octets.empty();
}

// "Nov 21 11:25:33", as nanoseconds since the year began, in a leap year.
std::optional<std::int64_t> takeTimeOfYear(std::string_view& text) {
    constexpr std::array<std::string_view, 12> months{"Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                                      "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};
    constexpr std::array<int, 12> before{0, 31, 60, 91, 121, 152, 182, 213, 244, 274, 305, 335};
    constexpr std::int64_t day = std::int64_t{86400} * 1'000'000'000;
    const auto* const month = std::find(months.begin(), months.end(), text.substr(0, 3));
    if (month == months.end())
        return std::nullopt;
    text.remove_prefix(3);
    skipBlanks(text);
    auto dayOfMonth = takeDigits(text, 2);
    if (!dayOfMonth)
        dayOfMonth = takeDigits(text, 1);
    skipBlanks(text);
    const auto ofDay = dayOfMonth ? takeTimeOfDay(text) : std::nullopt;
    if (!ofDay)
        return std::nullopt;
    return (before[static_cast<std::size_t>(month - months.begin())] + *dayOfMonth - 1) * day + *ofDay;
}

class DumpParser final : public Parser {
  public:
    explicit DumpParser(const Context& context)
        : lines_(context.source), file_(context.source.name()), interface_(context.unnamed) {}

    Reader::Next next(Item& item) override {
        std::string_view line;
        while (true) {
            const Source::State state = lines_.next(line);
            if (state == Source::State::pause)
                return Reader::Next::pause;
            if (state == Source::State::end && !std::exchange(isOpen_, false))
                return Reader::Next::end;
            if (state == Source::State::end)
                return give(item, Octets::bad);
            if (const auto done = goOn(line)) {
                isOpen_ = false;
                return give(item, *done);
            }
        }
    }

  private:
    static constexpr int mostLines = 64;  // the most lines of a dump

    // Takes a line. Returns how the dump has ended; nothing while it goes on, or while there is none.
    std::optional<Octets> goOn(std::string_view line) {
        if (!isOpen_) {
            auto opening = openingIn(line);
            if (!opening)
                return std::nullopt;
            begin(line, *opening);
            line = opening->rest;
        }
        const Octets result = takeOctets(line, octets_);
        if (result == Octets::bad && octets_.empty()) {
            isOpen_ = false;  // brackets around something else
            return std::nullopt;
        }
        return result == Octets::more && ++linesOpen_ < mostLines ? std::nullopt : std::optional(result);
    }

    void begin(std::string_view line, const Opening& opening) {
        isOpen_ = true;
        linesOpen_ = 0;
        octets_.clear();
        transmitted_ = opening.transmitted;
        line_ = lines_.number();
        time_ = timeOf(line);
    }

    // The time at the beginning of a line.
    ToldTime timeOf(std::string_view line) {
        const bool inBrackets = take(line, '[');
        constexpr std::size_t dateSize = 10;
        const std::size_t end =
            line.find_first_of(inBrackets ? "]" : " \t", std::min(line.size(), dateSize + 1));
        if (const auto absolute = timeIn(line.substr(0, end)))
            return *absolute;
        const auto ofYear = takeTimeOfYear(line);
        if (!ofYear)
            return {};
        if (!first_)
            first_ = ofYear;
        return {Clock::relative, *ofYear - *first_};
    }

    Reader::Next give(Item& item, Octets how) {
        item = {};
        item.frame.octets = octets_;
        item.frame.transmitted = transmitted_;
        item.frame.clock = time_.clock;
        item.frame.time = time_.time;
        item.frame.interface = interface_;
        item.frame.place = {file_, line_, Place::Unit::line};
        if (how != Octets::closed) {
            item.kind = Item::Kind::cut;
            item.text = "the dump has no closing bracket";
        }
        return Reader::Next::item;
    }

    Lines lines_;
    std::string_view file_;
    const Interface* interface_;
    std::vector<std::uint8_t> octets_;
    bool isOpen_ = false;
    int linesOpen_ = 0;
    bool transmitted_ = false;
    std::uint64_t line_ = 0;
    ToldTime time_;
    std::optional<std::int64_t> first_;
};

}  // namespace

Form::Match isDumps(std::string_view beginning, bool isAll) {
    while (!beginning.empty()) {
        const std::size_t end = beginning.find('\n');
        if (end == std::string_view::npos && !isAll)
            return Form::Match::perhaps;
        if (beginsDump(beginning.substr(0, end)))
            return Form::Match::yes;
        beginning.remove_prefix(end == std::string_view::npos ? beginning.size() : end + 1);
    }
    return isAll ? Form::Match::no : Form::Match::perhaps;
}

std::unique_ptr<Parser> readDumps(const Context& context) { return std::make_unique<DumpParser>(context); }

}  // namespace capture
