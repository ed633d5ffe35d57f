#include "reader/LadderText.h"

#include <algorithm>

#include "reader/text.h"

namespace reader {

namespace {

using calls::Side;

// The characters for arrows and life lines.
struct Pen {
    std::string_view line, dotted, toPeer, toUs, life;
};
constexpr Pen ascii{"-", ".", ">", "<", "|"};
constexpr Pen utf8{"─", "╌", "▶", "◀", "│"};

constexpr std::size_t timeWidth = 12;
constexpr std::size_t deltaWidth = 10;
constexpr std::size_t arrowWidth =
    24;  // the longest name of a message, two blanks, a piece of line and a head
constexpr std::size_t leastForDetails = 14;  // columns beside the ladder; with fewer, details stand between
                                             // the life lines

void repeat(std::string& to, std::string_view what, std::size_t times) {
    while (times-- > 0)
        to += what;
}

class Drawing {
  public:
    Drawing(std::string& to, const CallLadder& ladder, const LadderTextForm& form, TimeText& times)
        : to_(to), ladder_(ladder), times_(times), pen_(form.utf8 ? utf8 : ascii) {
        const std::size_t width = std::max(form.width, form.least);
        constexpr std::size_t beside = timeWidth + 1 + deltaWidth + 1 + 1 + arrowWidth + 1 + 2;
        width_ = width;
        isWide_ = width >= beside + leastForDetails;
        start_ = isWide_ ? timeWidth + 1 + deltaWidth + 1 : timeWidth + 1;
        arrow_ = isWide_ ? arrowWidth : std::min<std::size_t>(width - start_ - 2, 40);
        details_ = isWide_ ? width - beside : arrow_ - 2;
    }

    void draw() {
        putHeadline();
        putSides();
        for (std::size_t i = 0; i < ladder_.rungs.size(); ++i) {
            rungs_.push_back(to_.size());
            putRung(i);
        }
        if (ladder_.missing != 0) {
            std::string words = "messages that are not shown, since there are too many: ";
            appendNumber(words, ladder_.missing);
            putLine(words);
        }
    }

    // Where each rung begins in the text.
    const std::vector<std::size_t>& rungs() const { return rungs_; }

  private:
    void putHeadline() {
        std::vector<std::string> items = ladder_.headline;
        constexpr std::size_t indent = 2;
        bool first = true;
        for (const std::string& line : wrapped(items, width_ - indent)) {
            if (!first)
                to_.append(indent, ' ');
            first = false;
            putLine(line);
        }
    }

    void putLine(std::string_view line) {
        to_ += line;
        while (to_.back() == ' ')
            to_.pop_back();
        to_ += '\n';
    }

    // Appends the name of each side at its life line.
    void putSides() {
        std::string line(start_, ' ');
        line += ladder_.us;
        const std::size_t end = start_ + arrow_ + 2;
        const std::size_t peer = std::max(end - std::min(end, ladder_.peer.size()), line.size() + 1);
        line.resize(peer, ' ');
        putLine(line + ladder_.peer);
    }

    void putRung(std::size_t number) {
        const Rung& rung = ladder_.rungs[number];
        std::string delta;
        if (const auto since = ladder_.sinceBefore(number))
            appendSeconds(delta, *since);
        std::vector<std::string> details;
        for (const std::string& detail : detailsOf(ladder_, rung))
            details.push_back(safe(detail));
        putPrefix(rung, delta);
        if (rung.kind == Rung::Kind::words) {
            putWords(rung);
            return;
        }
        if (!isWide_ && !delta.empty())
            details.insert(details.begin(), "+" + delta);
        const std::vector<std::string> lines = wrapped(details, details_);
        std::string line;
        putArrow(line, rung);
        if (isWide_ && !lines.empty())
            line += "  " + lines[0];
        putLine(line);
        for (std::size_t i = isWide_ ? 1 : 0; i < lines.size(); ++i) {
            to_.append(start_, ' ');
            putLine(besideOrBetween(lines[i]));
        }
    }

    void putPrefix(const Rung& rung, std::string_view delta) {
        std::size_t start = to_.size();
        to_ += timeOfDay(rung.when, times_);
        padTo(to_, start, timeWidth, true);
        to_ += ' ';
        if (!isWide_)
            return;
        start = to_.size();
        to_ += delta;
        padTo(to_, start, deltaWidth, true);
        to_ += ' ';
    }

    // "|--- SETUP --->|"
    void putArrow(std::string& line, const Rung& rung) const {
        const std::string_view stroke = rung.kind == Rung::Kind::link ? pen_.dotted : pen_.line;
        const std::string name = safe(rung.name);
        const std::size_t text = name.size() + 3;  // two blanks and the head
        const std::size_t rest = arrow_ > text ? arrow_ - text : 0;
        line += pen_.life;
        if (rung.from == Side::peer)
            line += pen_.toUs;
        repeat(line, stroke, rest / 2);
        line += ' ' + name + ' ';
        repeat(line, stroke, rest - rest / 2);
        if (rung.from == Side::us)
            line += pen_.toPeer;
        line += pen_.life;
    }

    // Appends words between the life lines.
    void putWords(const Rung& rung) {
        bool first = true;
        for (const std::string& words : wrapped({safe(rung.name)}, arrow_ - 2)) {
            if (!first)
                to_.append(start_, ' ');
            first = false;
            std::string line(pen_.life);
            line += ' ' + words;
            line.append(arrow_ - 1 - words.size(), ' ');
            putLine(line + std::string(pen_.life));
        }
    }

    std::string besideOrBetween(const std::string& words) const {
        std::string line(pen_.life);
        if (isWide_) {
            line.append(arrow_, ' ');
            return (line += pen_.life) + "  " + words;
        }
        line += ' ' + words;
        line.append(arrow_ - 1 - words.size(), ' ');
        return line += pen_.life;
    }

    std::string& to_;
    const CallLadder& ladder_;
    TimeText& times_;
    const Pen& pen_;
    std::size_t width_;
    bool isWide_;          // details stand beside the ladder
    std::size_t start_;    // columns in front of our life line
    std::size_t arrow_;    // columns between the life lines
    std::size_t details_;  // columns for details
    std::vector<std::size_t> rungs_;
};

}  // namespace

std::vector<std::string> wrapped(const std::vector<std::string>& items, std::size_t width) {
    std::vector<std::string> lines;
    const auto put = [&](std::string_view word, std::size_t gap) {
        if (!lines.empty() && lines.back().size() + gap + word.size() <= width) {
            lines.back().append(gap, ' ');
            lines.back() += word;
            return;
        }
        for (; word.size() > width; word.remove_prefix(width))
            lines.emplace_back(word.substr(0, width));
        if (!word.empty())
            lines.emplace_back(word);
    };
    for (const std::string& item : items) {
        const bool fits = !lines.empty() && lines.back().size() + 2 + item.size() <= width;
        if (fits || item.size() <= width) {
            put(item, 2);
            continue;
        }
        // An item that is longer than a line begins one, and is broken between its words.
        std::size_t gap = width;
        for (std::string_view rest = item; !rest.empty(); gap = 1) {
            const std::size_t end = std::min(rest.find(' '), rest.size());
            put(rest.substr(0, end), gap);
            rest.remove_prefix(std::min(end + 1, rest.size()));
        }
    }
    return lines;
}

void appendLadder(std::string& to, const CallLadder& ladder, const LadderTextForm& form, TimeText& times) {
    Drawing(to, ladder, form, times).draw();
}

LadderLines ladderLines(const CallLadder& ladder, const LadderTextForm& form, TimeText& times) {
    std::string text;
    Drawing drawing(text, ladder, form, times);
    drawing.draw();
    LadderLines result;
    std::size_t rung = 0;
    for (std::size_t at = 0; at < text.size();) {
        for (; rung < drawing.rungs().size() && drawing.rungs()[rung] == at; ++rung)
            result.rungs.push_back(result.lines.size());
        const std::size_t end = text.find('\n', at);
        result.lines.push_back(text.substr(at, end - at));
        at = end + 1;
    }
    return result;
}

}  // namespace reader
