#include "reader/Comparison.h"

#include <algorithm>
#include <array>
#include <functional>
#include <map>
#include <optional>

#include "isdn/Field.h"
#include "isdn/words.h"
#include "reader/align.h"
#include "reader/text.h"

namespace reader {

namespace {

using Part = ComparedMessage::Part;

constexpr std::int64_t clockSteps =
    8 * calls::millisecond;  // because the board's clock is exact only to a tick of 4 ms at both ends

// Whether the field names a channel or an interface.
bool namesChannel(const isdn::Element& element, const isdn::Field& field) {
    namespace id = isdn::element;
    constexpr std::array<std::string_view, 3> always{"channel number", "slot map", "interface"};
    if (element.codeset != 0 || element.id != id::channelIdentification)
        return false;
    const bool basic = !element.contents.empty() && (element.contents[0] & 0x20U) == 0;
    return std::find(always.begin(), always.end(), field.name) != always.end() ||
           (basic && field.name == "channel selection");
}

bool isDate(const isdn::Element& element) {
    return element.codeset == 0 && element.id == isdn::element::dateTime;
}

std::string hexOf(isdn::Octets octets) {
    std::string hex;
    appendHex(hex, octets);
    return hex;
}

std::string valueOf(const isdn::Field& field) {
    using enum isdn::Field::Kind;
    if (field.kind == text)
        return "\"" + std::string(field.meaning) + "\"";
    if (field.kind == raw)
        return hexOf(field.at);
    return std::to_string(field.value) +
           (field.meaning.empty() ? std::string() : " " + std::string(field.meaning));
}

bool isCompared(const isdn::Field& field) {
    using enum isdn::Field::Kind;
    return field.kind != extension && field.kind != header && (field.kind != spare || field.value != 0);
}

// Returns "name", or "name (2)" when the name comes for the second time.
std::string counted(std::map<std::string, unsigned>& seen, const std::string& name) {
    const unsigned times = ++seen[name];
    return times == 1 ? name : name + " (" + std::to_string(times) + ")";
}

std::string nameOf(const isdn::Element& element, isdn::Variant variant) {
    if (const std::string_view name = isdn::elementName(element, variant); !name.empty())
        return std::string(name);
    std::string name = "element 0x" + hexOf(element.octets.first(1));
    return element.codeset == 0 ? name : name + " of codeset " + std::to_string(element.codeset);
}

std::string wordsOf(const isdn::Element& element, const calls::Message& message) {
    std::string words;
    isdn::appendWords(words, element, message.variant, message.sender());
    return words.empty() ? hexOf(element.octets) : words;
}

void addElement(ComparedMessage& to, const isdn::Element& element, const std::string& name,
                const calls::Message& message, const CompareAlso& also) {
    to.elements.push_back({name, wordsOf(element, message)});
    isdn::Fields fields;
    const isdn::Problem problem = isdn::fieldsOf(element, message.variant, fields);
    std::map<std::string, unsigned> seen;
    for (const isdn::Field& field : fields) {
        if (isCompared(field) && (also.channels || !namesChannel(element, field)))
            to.parts.push_back({name, counted(seen, std::string(field.name)), valueOf(field)});
    }
    if (problem != isdn::Problem::none)
        to.parts.push_back({name, "problem", std::string(isdn::nameOf(problem))});
}

std::string nameOf(const isdn::Layer3& layer3) {
    if (const std::string_view name = isdn::messageName(layer3); !name.empty())
        return std::string(name);
    return layer3.hasType ? "message 0x" + hexOf(std::array{layer3.type})
                          : "protocol 0x" + hexOf(std::array{layer3.discriminator});
}

std::string directionOf(const ComparedMessage& message, bool byRole) {
    if (!byRole)
        return message.from == calls::Side::us ? "TX" : "RX";
    return message.role == capture::Role::user ? "U>N" : "N>U";
}

// Numbers the kinds of messages. Two messages, also of different series, are of one kind if they have the
// same direction and name.
class Kinds {
  public:
    explicit Kinds(bool byRole) : byRole_(byRole) {}

    Token tokenOf(const ComparedMessage& message) {
        std::string content;
        for (const Part& part : message.parts)
            content.append(part.element)
                .append("\t")
                .append(part.field)
                .append("\t")
                .append(part.value)
                .append("\n");
        const std::string kind = directionOf(message, byRole_) + message.name;
        return {numberOf(kind), numberOf(kind + "\n" + content)};
    }

  private:
    std::uint32_t numberOf(const std::string& text) {
        return numbers_.try_emplace(text, static_cast<std::uint32_t>(numbers_.size())).first->second;
    }

    bool byRole_;
    std::map<std::string, std::uint32_t> numbers_;
};

const Part* find(const ComparedMessage& message, const Part& part) {
    const auto found = std::find_if(message.parts.begin(), message.parts.end(), [&](const Part& each) {
        return each.element == part.element && each.field == part.field;
    });
    return found == message.parts.end() ? nullptr : &*found;
}

const ComparedMessage::Whole* find(const ComparedMessage& message, const std::string& element) {
    const auto found =
        std::find_if(message.elements.begin(), message.elements.end(),
                     [&](const ComparedMessage::Whole& each) { return each.element == element; });
    return found == message.elements.end() ? nullptr : &*found;
}

class Comparer {
  public:
    Comparer(const CompareAlso& also, bool byRole) : also_(also), byRole_(byRole) {}

    void pair(const ComparedMessage& a, const ComparedMessage& b) {
        const std::size_t before = result.differences.size();
        const Difference in = about(a, a.frame, b.frame);
        for (const ComparedMessage::Whole& each : a.elements) {
            if (find(b, each.element) == nullptr)
                add(in, Difference::Kind::element, {each.element, ""}, each.words, "");
        }
        for (const Part& part : a.parts)
            parts(in, part, b, false);
        for (const Part& part : b.parts)
            parts(in, part, a, true);
        for (const ComparedMessage::Whole& each : b.elements) {
            if (find(a, each.element) == nullptr)
                add(in, Difference::Kind::element, {each.element, ""}, "", each.words);
        }
        if (also_.times && std::abs(a.since - b.since) > clockSteps)
            add(in, Difference::Kind::time, {}, std::to_string(a.since / calls::millisecond) + " ms",
                std::to_string(b.since / calls::millisecond) + " ms");
        // Sorts the differences in the order of the elements, those of A first.
        const auto rank = [&](const Difference& each) {
            const auto place = [&](const ComparedMessage& message) {
                return static_cast<std::size_t>(find(message, each.element) - message.elements.data());
            };
            if (each.element.empty())
                return each.kind == Difference::Kind::time ? a.elements.size() + b.elements.size() + 1 : 0;
            return find(a, each.element) != nullptr ? 1 + place(a) : 1 + a.elements.size() + place(b);
        };
        std::stable_sort(result.differences.begin() + static_cast<std::ptrdiff_t>(before),
                         result.differences.end(),
                         [&](const Difference& x, const Difference& y) { return rank(x) < rank(y); });
        ++(result.differences.size() == before ? result.alike : result.differ);
    }
    void onlyInA(const ComparedMessage& message) {
        result.differences.push_back(about(message, message.frame, 0));
        ++result.onlyA;
    }
    void onlyInB(const ComparedMessage& message) {
        result.differences.push_back(about(message, 0, message.frame));
        ++result.onlyB;
    }

    Comparison result;

  private:
    struct Place {
        std::string element, field;
    };

    // A frame number is 0 if that series has no such frame.
    Difference about(const ComparedMessage& message, std::uint64_t frameA, std::uint64_t frameB) const {
        Difference difference;
        difference.message = message.name;
        difference.direction = directionOf(message, byRole_);
        difference.frameA = frameA;
        difference.frameB = frameB;
        return difference;
    }
    void add(Difference in, Difference::Kind kind, Place place, std::string a, std::string b) {
        in.kind = kind;
        in.element = std::move(place.element);
        in.field = std::move(place.field);
        in.a = std::move(a);
        in.b = std::move(b);
        result.differences.push_back(std::move(in));
    }
    // Compares a part of one message with the other message. If the other message lacks the element, the
    // element is reported as a whole. `turned`: the part belongs to B, and only what A lacks is reported.
    void parts(const Difference& in, const Part& part, const ComparedMessage& other, bool turned) {
        const Part* const its = find(other, part);
        if (its != nullptr && (turned || its->value == part.value))
            return;
        if (its == nullptr && !part.element.empty() && find(other, part.element) == nullptr)
            return;
        const std::string otherValue = its == nullptr ? std::string() : its->value;
        add(in, Difference::Kind::field, {part.element, part.field}, turned ? otherValue : part.value,
            turned ? part.value : otherValue);
    }

    const CompareAlso& also_;
    bool byRole_;
};

bool knowsRoles(std::span<const ComparedMessage> messages) {
    return std::all_of(messages.begin(), messages.end(),
                       [](const ComparedMessage& message) { return message.role != capture::Role::unknown; });
}

}  // namespace

ComparedMessage comparedMessage(const calls::Message& message, std::int64_t first, const CompareAlso& also) {
    const isdn::Layer3& layer3 = message.layer3;
    ComparedMessage compared;
    compared.frame = message.number;
    compared.since = message.at - first;
    compared.from = message.from();
    compared.role = message.senderRole();
    compared.name = nameOf(layer3);
    if (also.references) {
        compared.parts.push_back({"", "TEI", std::to_string(message.layer2.tei)});
        compared.parts.push_back({"", "call reference", hexOf(layer3.callReference.octets)});
    }
    if (!layer3.raw.empty())
        compared.parts.push_back({"", "octets that are no elements", hexOf(layer3.raw)});
    std::map<std::string, unsigned> seen;
    for (const isdn::Element& element : layer3.elements) {
        if (!element.shift() && (also.times || !isDate(element)))
            addElement(compared, element, counted(seen, nameOf(element, message.variant)), message, also);
    }
    return compared;
}

std::vector<ComparedPair> pairsOf(std::span<const ComparedMessage> a, std::span<const ComparedMessage> b) {
    Kinds kinds(knowsRoles(a) && knowsRoles(b));
    std::array<std::vector<Token>, 2> tokens;
    for (const ComparedMessage& message : a)
        tokens[0].push_back(kinds.tokenOf(message));
    for (const ComparedMessage& message : b)
        tokens[1].push_back(kinds.tokenOf(message));
    const std::optional<std::vector<AlignedPair>> aligned = align(tokens[0], tokens[1]);
    if (!aligned)
        throw TooDifferent("the two differ in too many messages to be compared; filters choose some");
    std::vector<ComparedPair> pairs;
    std::size_t i = 0, j = 0;
    const auto upTo = [&](std::size_t endA, std::size_t endB) {
        for (; i < endA; ++i)
            pairs.push_back({&a[i], nullptr});
        for (; j < endB; ++j)
            pairs.push_back({nullptr, &b[j]});
    };
    for (const AlignedPair& pair : *aligned) {
        upTo(pair.a, pair.b);
        pairs.push_back({&a[i++], &b[j++]});
    }
    upTo(a.size(), b.size());
    return pairs;
}

Comparison compare(std::span<const ComparedMessage> a, std::span<const ComparedMessage> b,
                   const CompareAlso& also) {
    Comparer comparer(also, knowsRoles(a) && knowsRoles(b));
    for (const ComparedPair& pair : pairsOf(a, b)) {
        if (pair.b == nullptr)
            comparer.onlyInA(*pair.a);
        else if (pair.a == nullptr)
            comparer.onlyInB(*pair.b);
        else
            comparer.pair(*pair.a, *pair.b);
    }
    return std::move(comparer.result);
}

}  // namespace reader
