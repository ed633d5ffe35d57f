#include "isdn/ber.h"

#include <array>
#include <limits>

namespace isdn {

std::string_view toString(BerProblem problem) {
    static constexpr std::array<std::string_view, 9> texts{
        "",
        "identifier or length is cut off",
        "the tag number is too long",
        "the length is none",
        "the length reaches beyond the end",
        "the end-of-contents octets are missing",
        "a primitive value of indefinite length",
        "nested too deep",
        "too many values",
    };
    return texts[static_cast<std::size_t>(problem)];
}

// A value whose contents are being read.
struct BerTree::Container {
    std::size_t index;  // of the value
    // where its octets end; if its length is indefinite, where those of the enclosing value end
    std::size_t end;
};

struct BerTree::Parser {
    Octets octets;
    std::vector<BerValue>& values;
    std::vector<Container> open{};
    std::size_t at = 0;

    std::size_t limit() const { return open.empty() ? octets.size() : open.back().end; }
    void run();
    bool closes();
    void close();
    void value();
    BerProblem identifier(BerValue& value);
    BerProblem length(BerValue& value);
    BerProblem problemOf(BerValue& value);
};

void BerTree::Parser::run() {
    for (;;) {
        while (!open.empty() && closes())
            close();
        if (at == octets.size())
            return;
        value();
    }
}

// Whether the innermost container ends here. Passes over its end-of-contents octets.
bool BerTree::Parser::closes() {
    BerValue& container = values[open.back().index];
    if (container.indefinite && limit() - at >= 2 && octets[at] == 0 && octets[at + 1] == 0) {
        container.length = at - container.contents;
        at += 2;
        return true;
    }
    if (at < limit())
        return false;
    if (container.indefinite) {
        container.problem = BerProblem::noEnd;
        container.length = at - container.contents;
    }
    return true;
}

void BerTree::Parser::close() {
    values[open.back().index].next = values.size();
    open.pop_back();
}

void BerTree::Parser::value() {
    BerValue value;
    value.offset = at;
    value.depth = static_cast<std::uint16_t>(open.size());
    value.problem = problemOf(value);
    if (value.problem != BerProblem::none) {
        // The values after it cannot be found, so it takes all octets that are left.
        value.contents = at;
        value.length = limit() - at;
        at = limit();
    }
    value.next = values.size() + 1;
    values.push_back(value);
    if (value.problem != BerProblem::none)
        return;
    if (value.constructed)
        open.push_back({values.size() - 1, value.indefinite ? limit() : at + value.length});
    else
        at += value.length;
}

BerProblem BerTree::Parser::problemOf(BerValue& value) {
    if (values.size() >= berMost)
        return BerProblem::tooMany;
    for (const auto step : {&Parser::identifier, &Parser::length}) {
        if (const BerProblem problem = (this->*step)(value); problem != BerProblem::none)
            return problem;
    }
    value.contents = at;
    if (value.indefinite && !value.constructed)
        return BerProblem::endlessPlain;
    if (value.length > limit() - at)
        return BerProblem::overrun;
    if (value.constructed && open.size() >= berDeepest)
        return BerProblem::tooDeep;
    return BerProblem::none;
}

// X.690 8.1.2: a number of 31 and above follows in octets of seven bits.
BerProblem BerTree::Parser::identifier(BerValue& value) {
    const std::uint8_t first = octets[at++];
    value.tag.tagClass = static_cast<BerClass>(first >> 6);
    value.constructed = (first & 0x20) != 0;
    value.tag.number = first & 0x1f;
    if (value.tag.number != 0x1f)
        return BerProblem::none;
    value.tag.number = 0;
    for (;;) {
        if (at == limit())
            return BerProblem::cut;
        if (value.tag.number > std::numeric_limits<std::uint32_t>::max() >> 7)
            return BerProblem::tagTooLong;
        const std::uint8_t octet = octets[at++];
        value.tag.number = value.tag.number << 7 | (octet & 0x7f);
        if ((octet & 0x80) == 0)
            return BerProblem::none;
    }
}

// X.690 8.1.3: one octet, or the number of octets that follow, or 80 for an indefinite length.
BerProblem BerTree::Parser::length(BerValue& value) {
    if (at == limit())
        return BerProblem::cut;
    const std::uint8_t first = octets[at++];
    value.indefinite = first == 0x80;
    if (first <= 0x80) {
        value.length = first & 0x7f;
        return BerProblem::none;
    }
    if (first == 0xff)
        return BerProblem::badLength;
    for (int left = first & 0x7f; left > 0; --left) {
        if (at == limit())
            return BerProblem::cut;
        if (value.length > std::numeric_limits<std::uint32_t>::max() >> 8)
            return BerProblem::badLength;
        value.length = value.length << 8 | octets[at++];
    }
    return BerProblem::none;
}

BerTree::BerTree(Octets octets) : octets_(octets) { Parser{octets_, values_}.run(); }

std::vector<std::size_t> BerTree::childrenOf(std::size_t index) const {
    std::vector<std::size_t> children;
    const std::size_t end = values_[index].next;
    for (std::size_t child = index + 1; child < end; child = values_[child].next)
        children.push_back(child);
    return children;
}

std::optional<std::int64_t> berIntegerOf(Octets contents) {
    if (contents.empty() || contents.size() > sizeof(std::int64_t))
        return std::nullopt;
    std::uint64_t number = (contents[0] & 0x80) != 0 ? ~std::uint64_t{0} : 0;
    for (const std::uint8_t octet : contents)
        number = number << 8 | octet;
    return static_cast<std::int64_t>(number);
}

std::optional<bool> berBooleanOf(Octets contents) {
    if (contents.size() != 1)
        return std::nullopt;
    return contents[0] != 0;
}

std::optional<std::string> berObjectIdentifierOf(Octets contents) {
    if (contents.empty() || (contents.back() & 0x80) != 0)
        return std::nullopt;
    std::string text;
    std::uint64_t number = 0;
    for (const std::uint8_t octet : contents) {
        if (number > std::numeric_limits<std::uint64_t>::max() >> 7)
            return std::nullopt;
        number = number << 7 | (octet & 0x7f);
        if ((octet & 0x80) != 0)
            continue;
        if (text.empty()) {
            // The first two arcs share an octet: 40 times the first plus the second (8.19.4).
            const std::uint64_t first = number < 80 ? number / 40 : 2;
            text = std::to_string(first);
            number -= first * 40;
        }
        text += "." + std::to_string(number);
        number = 0;
    }
    return text;
}

std::string toString(BerTag tag) {
    struct Name {
        std::uint32_t number;
        std::string_view text;
    };
    static constexpr Name names[] = {
        {0, "END OF CONTENTS"},   {1, "BOOLEAN"},
        {2, "INTEGER"},           {3, "BIT STRING"},
        {4, "OCTET STRING"},      {5, "NULL"},
        {6, "OBJECT IDENTIFIER"}, {7, "ObjectDescriptor"},
        {8, "EXTERNAL"},          {9, "REAL"},
        {10, "ENUMERATED"},       {12, "UTF8String"},
        {16, "SEQUENCE"},         {17, "SET"},
        {18, "NumericString"},    {19, "PrintableString"},
        {20, "T61String"},        {21, "VideotexString"},
        {22, "IA5String"},        {23, "UTCTime"},
        {24, "GeneralizedTime"},  {25, "GraphicString"},
        {26, "VisibleString"},    {27, "GeneralString"},
    };
    static constexpr std::array<std::string_view, 4> classes{"UNIVERSAL ", "APPLICATION ", "", "PRIVATE "};
    if (tag.tagClass == BerClass::universal) {
        for (const Name& name : names)
            if (name.number == tag.number)
                return std::string(name.text);
        return "UNIVERSAL " + std::to_string(tag.number);
    }
    return "[" + std::string(classes[static_cast<std::size_t>(tag.tagClass)]) + std::to_string(tag.number) +
           "]";
}

}  // namespace isdn
