#include "reader/LadderSvg.h"

#include "reader/LadderText.h"
#include "reader/text.h"

namespace reader {

namespace {

using calls::Side;

// Sizes are in pixels. Texts use a monospaced font of 12 pixels.
constexpr int pageWidth = 1000;
constexpr int margin = 16;
constexpr int lineHeight = 16;
constexpr int timeAt = margin;
constexpr int deltaEnd = 176;
constexpr int usAt = 230;
constexpr int peerAt = 520;
constexpr int detailsAt = 540;
constexpr std::size_t headlineCharacters = 130;
constexpr std::size_t detailCharacters = 60;

constexpr std::string_view style =
    "text{font:12px monospace;fill:#222}"
    ".name{text-anchor:middle;font-weight:bold}"
    ".end{text-anchor:end;fill:#666}"
    ".dim{fill:#666}"
    ".life{stroke:#999}"
    ".message{stroke:#1f4e9c;stroke-width:1.5}"
    ".link{stroke:#a05a00;stroke-width:1.5;stroke-dasharray:5 4}"
    ".words{fill:#a00000;text-anchor:middle}";

void appendAttribute(std::string& to, std::string_view name, int value) {
    ((to += ' ') += name) += "=\"";
    appendNumber(to, value);
    to += '"';
}

// Appends a text element that keeps blanks as they are.
void appendText(std::string& to, std::string_view kind, int x, int y, std::string_view text) {
    if (text.empty())
        return;
    to += "<text xml:space=\"preserve\"";
    if (!kind.empty())
        ((to += " class=\"") += kind) += '"';
    appendAttribute(to, "x", x);
    appendAttribute(to, "y", y);
    to += '>';
    appendXml(to, text);
    to += "</text>\n";
}

void appendLine(std::string& to, std::string_view kind, int x1, int y1, int x2, int y2,
                std::string_view head = {}) {
    ((to += "<line class=\"") += kind) += '"';
    appendAttribute(to, "x1", x1);
    appendAttribute(to, "y1", y1);
    appendAttribute(to, "x2", x2);
    appendAttribute(to, "y2", y2);
    if (!head.empty())
        ((to += " marker-end=\"url(#") += head) += ")\"";
    to += "/>\n";
}

void appendHead(std::string& to, std::string_view name, std::string_view color) {
    ((to += "<marker id=\"") += name) +=
        "\" viewBox=\"0 0 10 10\" refX=\"10\" refY=\"5\" markerWidth=\"7\" markerHeight=\"7\" "
        "orient=\"auto\">"
        "<path d=\"M0 0L10 5L0 10z\" fill=\"";
    (to += color) += "\"/></marker>\n";
}

}  // namespace

void LadderSvg::add(const CallLadder& ladder, TimeText& times) {
    y_ += margin;
    for (const std::string& line : wrapped(ladder.headline, headlineCharacters))
        appendText(body_, "", margin, y_ += lineHeight, line);
    y_ += lineHeight + lineHeight / 2;
    appendText(body_, "name", usAt, y_, ladder.us);
    appendText(body_, "name", peerAt, y_, ladder.peer);
    const int top = y_ + lineHeight / 2;
    for (std::size_t i = 0; i < ladder.rungs.size(); ++i)
        putRung(ladder, i, times);
    if (ladder.missing != 0)
        appendText(
            body_, "words", (usAt + peerAt) / 2, y_ += 2 * lineHeight,
            "messages that are not shown, since there are too many: " + std::to_string(ladder.missing));
    y_ += lineHeight;
    appendLine(body_, "life", usAt, top, usAt, y_);
    appendLine(body_, "life", peerAt, top, peerAt, y_);
}

void LadderSvg::putRung(const CallLadder& ladder, std::size_t number, TimeText& times) {
    const Rung& rung = ladder.rungs[number];
    y_ += 2 * lineHeight;
    const int textAt = y_ + lineHeight / 4;
    appendText(body_, "dim", timeAt, textAt, timeOfDay(rung.when, times));
    if (const auto since = ladder.sinceBefore(number)) {
        std::string delta;
        appendSeconds(delta, *since);
        appendText(body_, "end", deltaEnd, textAt, delta);
    }
    if (rung.kind == Rung::Kind::words) {
        appendText(body_, "words", (usAt + peerAt) / 2, textAt, rung.name);
        return;
    }
    putArrow(rung, y_);
    const std::vector<std::string> lines = wrapped(detailsOf(ladder, rung), detailCharacters);
    for (std::size_t i = 0; i < lines.size(); ++i)
        appendText(body_, "", detailsAt, textAt + static_cast<int>(i) * lineHeight, lines[i]);
    if (lines.size() > 1)
        y_ += static_cast<int>(lines.size() - 1) * lineHeight;
}

void LadderSvg::putArrow(const Rung& rung, int y) {
    const bool isLink = rung.kind == Rung::Kind::link;
    const bool fromUs = rung.from == Side::us;
    appendText(body_, "name", (usAt + peerAt) / 2, y - lineHeight / 4, rung.name);
    appendLine(body_, isLink ? "link" : "message", fromUs ? usAt : peerAt, y, fromUs ? peerAt : usAt, y,
               isLink ? "link" : "message");
}

std::string LadderSvg::picture() const {
    std::string text = "<svg xmlns=\"http://www.w3.org/2000/svg\"";
    appendAttribute(text, "width", pageWidth);
    appendAttribute(text, "height", y_ + margin);
    text += ">\n<style>";
    text += style;
    text += "</style>\n" + definitions();
    text += "<rect width=\"100%\" height=\"100%\" fill=\"#fff\"/>\n";
    return text + body_ + "</svg>\n";
}

std::string LadderSvg::part(std::string_view label) const {
    std::string text = "<svg class=\"ladder\" role=\"img\" aria-label=\"";
    appendXml(text, label);
    text += "\" viewBox=\"0 0 ";
    appendNumber(text, pageWidth);
    text += ' ';
    appendNumber(text, y_ + margin);
    text += '"';
    appendAttribute(text, "width", pageWidth);
    appendAttribute(text, "height", y_ + margin);
    return text + ">\n" + body_ + "</svg>\n";
}

std::string LadderSvg::definitions() {
    std::string text = "<defs>\n";
    appendHead(text, "message", "#1f4e9c");
    appendHead(text, "link", "#a05a00");
    return text + "</defs>\n";
}

}  // namespace reader
