#include "isdn/words.h"

#include <array>
#include <charconv>

#include "isdn/wording.h"

namespace isdn {

namespace wording {

void add(std::string& line, unsigned number) {
    std::array<char, 12> digits;
    char* const end = std::to_chars(digits.data(), digits.data() + digits.size(), number).ptr;
    line.append(digits.data(), end);
}

void addHex(std::string& line, Octets octets) {
    constexpr char digits[] = "0123456789abcdef";
    for (const std::uint8_t octet : octets) {
        line.push_back(digits[octet >> 4]);
        line.push_back(digits[octet & 0x0FU]);
    }
}

void addName(std::string& line, const Names& names, std::uint8_t value) {
    const std::string_view name = names(value);
    if (name.empty())
        add(line, value);
    else
        line.append(name);
}

}  // namespace wording

namespace {

using namespace wording;

const WordingRow* findWording(const Element& element, std::string_view name) {
    for (const auto& rows : {stateWordings(), bearerWordings(), partyWordings()}) {
        for (const WordingRow& row : rows) {
            if (row.id == element.id && row.codeset == element.codeset &&
                (row.name.empty() || row.name == name))
                return &row;
        }
    }
    return nullptr;
}

// "element 6/3b 01ff": codeset, identifier and contents of an element that no table knows.
void addUnknown(std::string& line, const Element& element) {
    line.append("element ");
    if (element.codeset != 0) {
        add(line, element.codeset);
        line.push_back('/');
    }
    addHex(line, element.octets.first(1));
    if (!element.contents.empty())
        line.push_back(' ');
    addHex(line, element.contents);
}

}  // namespace

void appendWords(std::string& line, const Element& element, Variant variant, Sender sender) {
    if (element.octets.empty() || element.shift())
        return;
    const std::string_view name = elementName(element, variant);
    const WordingRow* const row = findWording(element, name);
    if (name.empty())
        addUnknown(line, element);
    else if (row != nullptr)
        row->words(line, element, {variant, sender});
    else
        line.append(name);
    if (element.problem != Problem::none)
        line.append(" (").append(nameOf(element.problem)).append(")");
}

void appendWords(std::string& line, const Layer3& message, Variant variant, Sender sender) {
    const std::size_t before = line.size();
    for (const Element& element : message.elements) {
        const std::size_t start = line.size();
        if (start != before)
            line.append("  ");
        const std::size_t wordsStart = line.size();
        appendWords(line, element, variant, sender);
        if (line.size() == wordsStart)
            line.resize(start);
    }
}

void appendWords(std::string& line, const TeiMessage& message) {
    constexpr std::uint8_t any = 127;
    const std::string_view name = teiMessageName(message.type);
    line.append(name.empty() ? "unknown TEI message" : name).append(", Ri ");
    add(line, message.reference);
    line.append(", TEI ");
    if (message.actions.empty()) {
        line.append("missing");
        return;
    }
    const char* separator = "";
    for (const std::uint8_t octet : message.actions) {
        line.append(separator);
        separator = ",";
        if (octet >> 1 == any)
            line.append("any");
        else
            add(line, octet >> 1);
    }
}

void appendWords(std::string& line, const FrameReject& reject) {
    line.append("rejected control ");
    addHex(line, reject.rejectedControl);
    line.append(reject.response ? " of a response" : " of a command");
    line.append(", V(S) ");
    add(line, reject.vs);
    line.append(", V(R) ");
    add(line, reject.vr);
    const struct {
        bool set;
        std::string_view text;
    } reasons[] = {
        {reject.undefinedControl, ", control field undefined"},
        {reject.informationNotPermitted, ", information not permitted"},
        {reject.informationTooLong, ", information too long"},
        {reject.invalidNr, ", N(R) invalid"},
    };
    for (const auto& reason : reasons) {
        if (reason.set)
            line.append(reason.text);
    }
    if (reject.problem != Problem::none)
        line.append(" (").append(nameOf(reject.problem)).append(")");
}

}  // namespace isdn
