#include "reader/explain.h"

#include <algorithm>
#include <filesystem>

#include "calls/standardVariant.h"
#include "reader/Columns.h"
#include "reader/Contents.h"
#include "reader/TextConsumer.h"
#include "reader/errors.h"
#include "reader/session.h"
#include "reader/text.h"

namespace reader {

namespace {

constexpr std::string_view bold = "\x1b[1m", red = "\x1b[31m", plain = "\x1b[0m";

constexpr std::size_t positionWidth = 5, octetWidth = 5, hexWidth = 3, bitsWidth = 9, nameWidth = 34,
                      valueWidth = 6;
constexpr std::size_t octetsInLine = 16;

// "-00-----": the bits of the field at their places.
void appendBits(std::string& to, unsigned octet, unsigned high, unsigned low) {
    for (unsigned bit = 8; bit >= 1; --bit) {
        if (bit > high || bit < low)
            to += '-';
        else
            to += ((octet >> (bit - 1)) & 1U) != 0 ? '1' : '0';
    }
}

void appendPadded(std::string& to, std::string_view text, std::size_t width, bool right = false) {
    const std::size_t start = to.size();
    appendSafe(to, text);
    padTo(to, start, width, right);
    to += ' ';
}

std::string number(std::uint64_t value) {
    std::string text;
    appendNumber(text, value);
    return text;
}

void endLine(std::string& text) {
    text.erase(text.find_last_not_of(' ') + 1);
    text += '\n';
}

// Puts rows into the text.
class ExplainRows : public ContentsVisitor {
  public:
    // Positions count from `begin`.
    ExplainRows(std::string& text, const std::uint8_t* begin, bool colors)
        : text_(text), begin_(begin), colors_(colors) {}

    void heading(std::string_view words) override {
        if (colors_)
            text_ += bold;
        appendSafe(text_, words);
        if (colors_)
            text_ += plain;
        text_ += '\n';
    }
    void problem(isdn::Problem problem) override {
        if (colors_)
            text_ += red;
        (text_ += "      ** ") += isdn::nameOf(problem);
        if (colors_)
            text_ += plain;
        text_ += '\n';
    }
    void field(const isdn::Field& field) override;

  private:
    std::string& text_;
    const std::uint8_t* begin_;
    bool colors_;
};

void ExplainRows::field(const isdn::Field& field) {
    if (field.at.empty())
        return;
    const auto position = static_cast<std::size_t>(field.at.data() - begin_) + 1;
    const bool oneOctet = field.at.size() == 1;
    appendPadded(text_, number(position), positionWidth, true);
    appendPadded(text_, field.octet, octetWidth, true);
    std::string hex;
    std::string bits;
    if (oneOctet) {
        appendHex(hex, field.at);
        appendBits(bits, field.at[0], field.high, field.low);
    }
    appendPadded(text_, hex, hexWidth);
    appendPadded(text_, bits, bitsWidth);
    appendPadded(text_, std::string(std::size_t{2} * field.depth, ' ') + std::string(field.name), nameWidth);
    const bool isNumber = field.kind != isdn::Field::Kind::text && field.at.size() <= sizeof field.value;
    appendPadded(text_, isNumber ? number(field.value) : "", valueWidth, true);
    appendSafe(text_, field.meaning);
    if (!field.clause.empty()) {
        text_ += text_.back() == ' ' ? "(" : " (";
        (text_ += field.clause) += ')';
    }
    endLine(text_);
    for (std::size_t i = 0; i < field.at.size() && !oneOctet; i += octetsInLine) {
        text_.append(positionWidth + octetWidth + 2, ' ');
        for (const std::uint8_t octet : field.at.subspan(i, std::min(octetsInLine, field.at.size() - i))) {
            appendHex(text_, std::span(&octet, 1));
            text_ += ' ';
        }
        endLine(text_);
    }
}

}  // namespace

void ExplainComposer::explainFrame(std::span<const std::uint8_t> octets, isdn::Variant variant,
                                   std::string& text) const {
    ExplainRows rows(text, octets.data(), colors_);
    visitFrame(octets, variant, rows);
}

void ExplainComposer::explainElement(std::span<const std::uint8_t> octets, isdn::Variant variant,
                                     std::string& text) const {
    ExplainRows rows(text, octets.data(), colors_);
    visitElements(isdn::Elements(octets), variant, rows);
}

void ExplainComposer::compose(const Seen& seen, std::string& text, Piece& /*piece*/) {
    const bool isCounted = seen.number != 0;  // what the recorder says is no frame and has no direction
    if (isCounted) {
        text += "Frame ";
        appendNumber(text, seen.number);
        text += ", ";
    }
    times_.append(text, seen.when);
    if (isCounted)
        (text += seen.frame().transmitted ? ", TX " : ", RX ") += direction(seen);
    text += ", ";
    appendSafe(text, capture::toString(seen.frame().place));
    text += '\n';
    if (seen.isFrame()) {
        explainFrame(seen.frame().octets, seen.variant, text);
    } else {
        appendEvent(text, *seen.item);
        text += '\n';
    }
    text += '\n';
}

namespace {

constexpr std::string_view hexDigits = "0123456789abcdefABCDEF";
constexpr std::string_view betweenDigits = " \t\n:-,";

}  // namespace

std::optional<std::vector<std::uint8_t>> readHex(std::string_view text) {
    std::vector<std::uint8_t> octets;
    while (!text.empty()) {
        const std::size_t size = std::min(text.find_first_of(betweenDigits), text.size());
        std::string_view digits = text.substr(0, size);
        text.remove_prefix(std::min(size + 1, text.size()));
        if (digits.starts_with("0x") || digits.starts_with("0X"))
            digits.remove_prefix(2);
        if (digits.find_first_not_of(hexDigits) != std::string_view::npos)
            return std::nullopt;
        if (digits.size() % 2 != 0)
            throw UsageError(std::string(digits) + " is not made of octets, of two hexadecimal digits each");
        for (; !digits.empty(); digits.remove_prefix(2)) {
            unsigned octet = 0;
            readNumber(digits.substr(0, 2), octet, 16);
            octets.push_back(static_cast<std::uint8_t>(octet));
        }
    }
    if (octets.empty())
        return std::nullopt;
    return octets;
}

bool looksLikeElement(std::span<const std::uint8_t> octets) {
    return octets.size() >= 2 && (octets[0] & 0x80U) == 0 && octets[1] == octets.size() - 2;
}

std::span<const OptionRow> explainOptions() {
    static constexpr OptionRow rows[] = {
        {"--frame", "", "The digits are a frame, address field first",
         [](Options& to, const std::string&) { to.explainAs = ExplainAs::frame; }, "digits"},
        {"--element", "", "The digits are elements, identifier first",
         [](Options& to, const std::string&) { to.explainAs = ExplainAs::element; }, "digits"},
    };
    return rows;
}

namespace {

// The octets that the words on the command line stand for, unless the words name files.
std::optional<std::vector<std::uint8_t>> octetsOf(const Options& options) {
    std::string digits;
    for (const std::string& word : options.words) {
        if (options.explainAs == ExplainAs::guess && std::filesystem::exists(word))
            return std::nullopt;
        digits += word + ' ';
    }
    auto octets = readHex(digits);
    if (!octets && options.explainAs != ExplainAs::guess)
        throw UsageError("--frame and --element take hexadecimal digits, two for each octet");
    return octets;
}

}  // namespace

int runExplain(const Options& options, Chatter& chatter) {
    const auto octets = octetsOf(options);
    if (!octets) {
        Session session(options, chatter);
        const bool colors = session.useColors();
        TextConsumer consumer(session.output());
        session.run(consumer, [colors] { return std::make_unique<ExplainComposer>(colors); });
        return good;
    }
    Output out;
    ExplainComposer composer(useColors(options.output, out));
    const isdn::Variant variant = calls::standardVariant(options.input.variant);
    const bool isElement = options.explainAs == ExplainAs::element ||
                           (options.explainAs == ExplainAs::guess && looksLikeElement(*octets));
    std::string text;
    if (isElement)
        composer.explainElement(*octets, variant, text);
    else
        composer.explainFrame(*octets, variant, text);
    out.write(text);
    out.flush();
    return good;
}

}  // namespace reader
