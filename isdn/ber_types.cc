#include "isdn/ber_types.h"

#include <algorithm>

namespace isdn {
namespace {

using Kind = BerType::Kind;
using Tagging = BerMember::Tagging;

// The universal tag of a type. A choice has none of its own.
BerTag tagOf(Kind kind) {
    switch (kind) {
        case Kind::boolean:
            return berBoolean;
        case Kind::integer:
            return berInteger;
        case Kind::enumerated:
            return berEnumerated;
        case Kind::null:
        case Kind::choice:
            return berNull;
        case Kind::digits:
            return berNumericString;
        case Kind::text:
            return berIa5String;
        case Kind::name:
        case Kind::octets:
            return berOctetString;
        case Kind::sequence:
        case Kind::sequenceOf:
            return berSequence;
    }
    return berNull;
}

bool canBe(BerTag tag, const BerMember& member) {
    if (member.tagging != Tagging::none)
        return tag == contextTag(member.tag);
    if (member.type->kind == Kind::choice)
        return std::ranges::any_of(member.type->members,
                                   [tag](const BerMember& alternative) { return canBe(tag, alternative); });
    return tag == tagOf(member.type->kind);
}

std::string_view nameOf(std::span<const BerName> names, std::int64_t number) {
    const auto found = std::ranges::find(names, number, &BerName::number);
    return found == names.end() ? std::string_view() : found->name;
}

std::string numberWords(Octets contents, std::span<const BerName> names) {
    const std::optional<std::int64_t> number = berIntegerOf(contents);
    if (!number)
        return {};
    const std::string_view name = nameOf(names, *number);
    return name.empty() ? std::to_string(*number) : std::string(name);
}

std::string characters(Octets contents) { return {contents.begin(), contents.end()}; }

// Whether the octets look like characters. Without a type the meaning of a value is not known, but a name can
// be recognised.
bool spell(Octets contents) {
    return contents.size() >= 3 &&
           std::ranges::all_of(contents, [](std::uint8_t octet) { return octet >= 0x20 && octet < 0x7F; });
}

// The kind of type that a universal tag names. It is used if nothing else is known about the value.
std::optional<Kind> kindOf(BerTag tag) {
    if (tag.tagClass != BerClass::universal)
        return std::nullopt;
    if (tag == berBoolean)
        return Kind::boolean;
    if (tag == berInteger || tag == berEnumerated)
        return Kind::integer;
    if (tag == berNull)
        return Kind::null;
    // UTF8String, and the character strings of X.680 table 1.
    if (tag.number == 12 || (tag.number >= 18 && tag.number <= 27))
        return Kind::text;
    return std::nullopt;
}

}  // namespace

bool BerMeanings::tell(std::size_t index, const BerMember& member) {
    const BerValue& value = tree_->values()[index];
    if (!canBe(value.tag, member))
        return false;
    if (member.tagging == Tagging::explicitly) {
        meanings_[index] = {member.name, nullptr, member.words};
        const std::size_t inner = index + 1;
        if (inner < value.next)
            tell(inner, {.name = "", .type = member.type});
        return true;
    }
    if (member.tagging == Tagging::none && member.type->kind == Kind::choice) {
        for (const BerMember& alternative : member.type->members) {
            if (!tell(index, alternative))
                continue;
            BerMeaning& meaning = meanings_[index];
            if (member.name.empty())
                return true;
            if (!meaning.name.empty()) {
                meaning.alternative = meaning.name;
                meaning.alternativeWords = meaning.words;
            }
            meaning.name = member.name;
            meaning.words = member.words;
            return true;
        }
        return false;
    }
    meanings_[index] = {member.name, member.type, member.words};
    tellContents(index, *member.type);
    return true;
}

void BerMeanings::tellContents(std::size_t index, const BerType& type) {
    switch (type.kind) {
        case Kind::sequence:
            tellSequence(index, type.members);
            break;
        case Kind::sequenceOf:
            for (const std::size_t child : tree_->childrenOf(index))
                tell(child, type.members.front());
            break;
        case Kind::choice:
            // A choice behind an implicit tag keeps its own tags inside (X.680 31.2.7).
            for (const std::size_t child : tree_->childrenOf(index))
                tell(child, {.name = "", .type = &type});
            break;
        default:
            break;
    }
}

// Assigns each value to the next member that it can be. The members before that one are absent.
void BerMeanings::tellSequence(std::size_t index, std::span<const BerMember> members) {
    auto next = members.begin();
    for (const std::size_t child : tree_->childrenOf(index)) {
        const auto found =
            std::find_if(next, members.end(), [&](const BerMember& member) { return tell(child, member); });
        if (found != members.end())
            next = found + 1;
    }
}

std::string wordsOf(const BerTree& tree, const BerValue& value, const BerType* type) {
    const Octets contents = tree.contentsOf(value);
    if (value.constructed || value.problem != BerProblem::none)
        return {};
    if (value.tag == berObjectIdentifier)
        return berObjectIdentifierOf(contents).value_or("");
    const std::optional<Kind> kind = type != nullptr ? type->kind : kindOf(value.tag);
    if (!kind)
        return spell(contents) ? characters(contents) : std::string();
    switch (*kind) {
        case Kind::boolean:
            if (const std::optional<bool> set = berBooleanOf(contents))
                return *set ? "yes" : "no";
            return {};
        case Kind::integer:
        case Kind::enumerated:
            return numberWords(contents, type != nullptr ? type->names : std::span<const BerName>());
        case Kind::digits:
        case Kind::text:
        case Kind::name:
            return characters(contents);
        default:
            return {};
    }
}

bool isText(const BerTree& tree, const BerValue& value, const BerType* type) {
    const std::optional<Kind> kind = type != nullptr ? type->kind : kindOf(value.tag);
    if (!kind && value.tag != berObjectIdentifier)
        return spell(tree.contentsOf(value));
    return kind == Kind::digits || kind == Kind::text || kind == Kind::name;
}

bool isPersonal(const BerValue& value, const BerType* type) {
    if (value.constructed && value.problem == BerProblem::none)
        return false;
    if (type != nullptr)
        return type->personal || value.problem != BerProblem::none;
    return value.tag != berBoolean && value.tag != berNull && value.tag != berObjectIdentifier;
}

}  // namespace isdn
