#include "isdn/facility.h"

#include <algorithm>
#include <array>

#include "isdn/facility_types.h"

namespace isdn {
namespace {

constexpr std::uint8_t networkingExtensions = 0x1F;
constexpr std::uint8_t remoteOperations = 0x11;

// Context tags of a facility with networking extensions (ECMA-165 annex A).
constexpr std::uint32_t extensionTag = 10, interpretationTag = 11, protocolTag = 18;

// The profile ends with the first octet whose bit 8 is set, as in any group of octets (Q.931 4.5.1).
std::size_t lengthOfProfile(Octets contents) {
    const auto last = std::ranges::find_if(contents, [](std::uint8_t octet) { return (octet & 0x80) != 0; });
    return last == contents.end() ? contents.size() : static_cast<std::size_t>(last - contents.begin()) + 1;
}

facility::Family familyOf(std::uint8_t profile, Variant variant) {
    if (profile == networkingExtensions)
        return facility::Family::privateNetwork;
    return northAmerica.has(variant) ? facility::Family::northAmerica : facility::Family::etsi;
}

Problem problemOf(BerProblem problem) {
    switch (problem) {
        case BerProblem::none:
            return Problem::none;
        case BerProblem::cut:
        case BerProblem::overrun:
        case BerProblem::noEnd:
            return Problem::truncated;
        default:
            return Problem::invalid;
    }
}

}  // namespace

std::string_view nameOf(Component::Kind kind) {
    static constexpr std::array<std::string_view, 5> names{"", "invoke", "return result", "return error",
                                                           "reject"};
    return names[static_cast<std::size_t>(kind)];
}

Facility::Facility(Octets contents, Variant variant)
    : contents_(contents),
      valuesAt_(lengthOfProfile(contents)),
      profile_(contents.empty() ? std::uint8_t{0} : static_cast<std::uint8_t>(contents[0] & 0x1f)),
      family_(familyOf(profile_, variant)),
      tree_(facility::profileName(profile_).empty() ? Octets() : contents.subspan(valuesAt_)),
      meanings_(tree_) {
    if (contents.empty())
        problem_ = Problem::tooShort;
    else if (facility::profileName(profile_).empty())
        problem_ = Problem::unknown;
    else
        readValues();
}

std::optional<std::int64_t> Facility::integerAt(std::size_t index) const {
    const BerValue& value = tree_.values()[index];
    if (value.constructed || value.problem != BerProblem::none)
        return std::nullopt;
    return berIntegerOf(tree_.contentsOf(value));
}

void Facility::readValues() {
    const std::vector<BerValue>& values = tree_.values();
    const auto bad =
        std::ranges::find_if(values, [](const BerValue& value) { return value.problem != BerProblem::none; });
    if (bad != values.end())
        problem_ = problemOf(bad->problem);
    if (profile_ != remoteOperations && profile_ != networkingExtensions)
        return;
    for (std::size_t index = 0; index < values.size(); index = values[index].next) {
        const BerValue& value = values[index];
        if (value.tag.tagClass != BerClass::context)
            continue;
        // After these, the components belong to private networks, whatever the profile is.
        if (value.tag.number == extensionTag || value.tag.number == interpretationTag)
            family_ = facility::Family::privateNetwork;
        if (value.tag.number >= 1 && value.tag.number <= 4 && value.constructed)
            readComponent(index);
        else if (value.tag.number == extensionTag)
            meanings_.tell(index, {"network facility extension", &facility::networkExtension,
                                   BerMember::Tagging::implicit, extensionTag});
        else if (value.tag.number == interpretationTag)
            meanings_.tell(index, {"interpretation", &facility::interpretation, BerMember::Tagging::implicit,
                                   interpretationTag});
        else if (value.tag.number == protocolTag)
            meanings_.tell(index, {"network protocol profile", &facility::number,
                                   BerMember::Tagging::implicit, protocolTag});
    }
}

void Facility::readComponent(std::size_t index) {
    Component component;
    component.kind = static_cast<Component::Kind>(tree_.values()[index].tag.number);
    component.index = index;
    meanings_.name(index, nameOf(component.kind));
    std::vector<std::size_t> children = tree_.childrenOf(index);
    if (!children.empty()) {
        // A reject that cannot say which invocation it means has NULL here.
        const BerMember id{"invoke id", &facility::number};
        if (meanings_.tell(children.front(), id))
            component.invokeId = integerAt(children.front());
        else
            meanings_.name(children.front(), id.name);
        children.erase(children.begin());
    }
    switch (component.kind) {
        case Component::Kind::invoke:
            readInvoke(component, children);
            break;
        case Component::Kind::result:
        case Component::Kind::error:
            readAnswer(component, children);
            break;
        case Component::Kind::reject:
            readReject(component, children);
            break;
    }
    components_.push_back(component);
}

// An operation or error: an INTEGER or an OBJECT IDENTIFIER.
void Facility::setCode(Component& component, std::size_t index, std::string_view name) {
    const BerValue& value = tree_.values()[index];
    if (value.tag == berInteger) {
        meanings_.tell(index, {name, &facility::number});
        component.code.local = integerAt(index);
    } else if (value.tag == berObjectIdentifier && !value.constructed && value.problem == BerProblem::none) {
        meanings_.name(index, name);
        component.code.global = berObjectIdentifierOf(tree_.contentsOf(value)).value_or("");
    }
}

void Facility::readOperation(Component& component, std::size_t index) {
    setCode(component, index, "operation");
    component.operation = findOperation(family_, component.code);
    if (component.operation != nullptr)
        meanings_.say(index, component.operation->name);
}

void Facility::readError(Component& component, std::size_t index) {
    setCode(component, index, "error");
    component.error = errorName(family_, component.code);
    meanings_.say(index, component.error);
}

// X.880 9.2: [0] linked id, the operation, its argument.
void Facility::readInvoke(Component& component, const std::vector<std::size_t>& children) {
    auto next = children.begin();
    if (next != children.end() && tree_.values()[*next].tag == contextTag(0)) {
        meanings_.tell(*next, {"linked id", &facility::number, BerMember::Tagging::implicit, 0});
        component.linkedId = integerAt(*next++);
    }
    if (next == children.end())
        return;
    readOperation(component, *next++);
    if (next == children.end())
        return;
    component.argument = *next;
    if (component.operation != nullptr && component.operation->argument != nullptr)
        meanings_.tell(*next, {"", component.operation->argument});
}

// X.880 9.3 and 9.4: a result is in a SEQUENCE with its operation, and an error is followed by its parameter.
void Facility::readAnswer(Component& component, const std::vector<std::size_t>& children) {
    std::vector<std::size_t> parts = children;
    const bool isError = component.kind == Component::Kind::error;
    if (!isError && !children.empty() && tree_.values()[children.front()].tag == berSequence)
        parts = tree_.childrenOf(children.front());
    if (parts.empty())
        return;
    if (isError)
        readError(component, parts[0]);
    else
        readOperation(component, parts[0]);
    if (parts.size() < 2)
        return;
    component.argument = parts[1];
    if (component.operation != nullptr && component.operation->result != nullptr)
        meanings_.tell(parts[1], {"", component.operation->result});
}

// X.880 9.5: the problem's tag says whether it is about a component, an invoke, a result or an error.
void Facility::readReject(Component& component, const std::vector<std::size_t>& children) {
    if (children.empty())
        return;
    const BerTag tag = tree_.values()[children.front()].tag;
    if (tag.tagClass != BerClass::context)
        return;
    meanings_.tell(children.front(),
                   {"problem", &facility::number, BerMember::Tagging::implicit, tag.number});
    component.code.local = integerAt(children.front());
    if (component.code.local)
        component.error = facility::problemName(tag.number, *component.code.local);
    meanings_.say(children.front(), component.error);
}

void Facility::appendWords(std::string& line) const {
    bool first = true;
    for (const Component& component : components_) {
        if (!first)
            line += "; ";
        first = false;
        line += nameOf(component.kind);
        if (component.invokeId)
            line += " " + std::to_string(*component.invokeId);
        if (component.linkedId)
            line += " linked to " + std::to_string(*component.linkedId);
        const std::string_view name =
            component.operation != nullptr ? component.operation->name : component.error;
        if (!name.empty())
            line.append(" ").append(name);
        else if (const std::string code = toString(component.code); !code.empty())
            line += " " + code;
        if (component.argument != 0 && meanings_[component.argument].type != nullptr) {
            const std::size_t before = line.size();
            appendValueWords(line, component.argument);
            if (line.size() > before)
                line.insert(before, ":");
        }
    }
}

// Names and values of what the value at `index` holds, with a comma between its own members.
void Facility::appendValueWords(std::string& line, std::size_t index) const {
    const std::vector<BerValue>& values = tree_.values();
    const std::size_t start = line.size();
    bool newMember = false;
    for (std::size_t at = index; at < values[index].next; ++at) {
        const BerMeaning& meaning = meanings_[at];
        newMember = newMember || values[at].depth == values[index].depth + 1;
        std::string words;
        if (!meaning.name.empty() && meaning.words == BerMember::Words::named)
            words.append(" ").append(meaning.name);
        if (!meaning.alternative.empty() && meaning.alternativeWords == BerMember::Words::named)
            words.append(" ").append(meaning.alternative);
        if (meaning.type != nullptr)
            if (const std::string own = wordsOf(tree_, values[at], meaning.type); !own.empty())
                words.append(" ").append(own);
        if (words.empty())
            continue;
        if (newMember && line.size() > start)
            line += ",";
        newMember = false;
        line += words;
    }
}

Problem facilityFields(Octets contents, Variant variant, Fields& fields) {
    const Facility facility(contents, variant);
    facility.appendFields(fields);
    return facility.problem();
}

}  // namespace isdn
