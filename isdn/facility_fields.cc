// The fields of a facility: each bit of its contents, in order.
#include "isdn/facility.h"

namespace isdn {
namespace {

constexpr std::string_view ofElement = "Q.932 8.2.3";
constexpr std::string_view ofComponents = "X.880 9";
constexpr std::string_view ofExtensions = "ECMA-165";

// "redirection, presentation restricted" for a member that is a choice.
std::string nameOf(const BerMeaning& meaning, BerTag tag) {
    if (meaning.name.empty())
        return toString(tag);
    std::string name(meaning.name);
    if (!meaning.alternative.empty())
        name.append(", ").append(meaning.alternative);
    return name;
}

}  // namespace

struct Facility::Fielder {
    const Facility& facility;
    Fields& fields;
    std::string_view clause = ofComponents;  // the clause for the value that is being appended

    // Octets of the contents from `from` to `to`; octet 3 of the element is the first of them.
    Field field(std::size_t from, std::size_t to, std::string_view name, Field::Kind kind) {
        Field made;
        made.octet = fields.keep(std::to_string(3 + from));
        made.name = name;
        made.clause = clause;
        made.at = facility.contents_.subspan(from, to - from);
        made.kind = kind;
        for (const std::uint8_t octet : made.at)
            made.value = made.value << 8 | octet;
        return made;
    }
    void profile();
    void bits(std::size_t octet, std::uint8_t high, std::uint8_t low, std::string_view name, Field::Kind kind,
              std::string_view meaning = {});
    void value(const BerValue& value, const BerMeaning& meaning);
    void header(const BerValue& value, const BerMeaning& meaning);
    void contents(const BerValue& value, const BerMeaning& meaning);
    std::string_view clauseOf(std::size_t index) const;
};

void Facility::Fielder::bits(std::size_t octet, std::uint8_t high, std::uint8_t low, std::string_view name,
                             Field::Kind kind, std::string_view meaning) {
    Field made = field(octet, octet + 1, name, kind);
    made.high = high;
    made.low = low;
    made.value = (made.value >> (low - 1)) & ((1U << (high - low + 1)) - 1);
    made.meaning = meaning;
    fields.add(made);
}

// Octet 3; octets 3a and so on would follow one whose bit 8 is clear.
void Facility::Fielder::profile() {
    clause = ofElement;
    for (std::size_t octet = 0; octet < facility.valuesAt_; ++octet) {
        bits(octet, 8, 8, "extension", Field::Kind::extension);
        if (octet > 0) {
            bits(octet, 7, 1, "protocol profile, continued", Field::Kind::value);
            continue;
        }
        bits(octet, 7, 6, "spare", Field::Kind::spare);
        bits(octet, 5, 1, "protocol profile", Field::Kind::value, facility::profileName(facility.profile_));
    }
}

void Facility::Fielder::header(const BerValue& value, const BerMeaning& meaning) {
    const std::size_t start = facility.valuesAt_ + value.offset;
    Field made = field(start, facility.valuesAt_ + value.contents, fields.keep(nameOf(meaning, value.tag)),
                       Field::Kind::header);
    made.value = value.tag.number;
    made.depth = static_cast<std::uint8_t>(value.depth);
    const std::string tag = toString(value.tag);
    std::string about = tag;
    if (value.indefinite)
        about += ", indefinite length";
    if (value.problem != BerProblem::none)
        about.append(", ").append(toString(value.problem));
    made.meaning = fields.keep(about);
    fields.add(made);
}

void Facility::Fielder::contents(const BerValue& value, const BerMeaning& meaning) {
    const std::size_t start = facility.valuesAt_ + value.contents;
    const bool damaged = value.problem != BerProblem::none;
    const std::string name = damaged ? "what cannot be told apart" : nameOf(meaning, value.tag);
    Field made = field(start, start + value.length, fields.keep(name), Field::Kind::value);
    made.depth = static_cast<std::uint8_t>(value.depth);
    made.personal = isPersonal(value, meaning.type);
    if (!damaged)
        made.meaning =
            meaning.says.empty() ? fields.keep(wordsOf(facility.tree_, value, meaning.type)) : meaning.says;
    if (!damaged && isText(facility.tree_, value, meaning.type))
        made.kind = Field::Kind::text;
    else if (made.meaning.empty())
        made.kind = Field::Kind::raw;
    fields.add(made);
}

void Facility::Fielder::value(const BerValue& value, const BerMeaning& meaning) {
    if (value.contents > value.offset)
        header(value, meaning);
    // The contents of a constructed value are values themselves, unless they could not be read.
    const bool lookedInto =
        value.constructed && (value.problem == BerProblem::none || value.problem == BerProblem::noEnd);
    if (!lookedInto && value.length > 0)
        contents(value, meaning);
}

std::string_view Facility::Fielder::clauseOf(std::size_t index) const {
    for (const Component& component : facility.components_) {
        if (index < component.index || index >= facility.tree_.values()[component.index].next)
            continue;
        const bool argument = component.argument != 0 && index >= component.argument;
        return argument && component.operation != nullptr ? component.operation->clause : ofComponents;
    }
    return ofExtensions;
}

void Facility::appendFields(Fields& fields) const {
    Fielder fielder{*this, fields};
    fielder.profile();
    const std::vector<BerValue>& values = tree_.values();
    std::size_t done = 0;  // octets of the tree that have fields
    // What lies between two values ends values of indefinite length.
    const auto endsUpTo = [&](std::size_t offset) {
        for (; done < offset; done += 2) {
            Field end =
                fielder.field(valuesAt_ + done, valuesAt_ + done + 2, "end of contents", Field::Kind::header);
            end.clause = "X.690 8.1.5";
            fields.add(end);
        }
    };
    for (std::size_t index = 0; index < values.size(); ++index) {
        const BerValue& value = values[index];
        endsUpTo(value.offset);
        fielder.clause = fielder.clauseOf(index);
        fielder.value(value, meanings_[index]);
        const bool holdsValues = value.constructed && index + 1 < value.next;
        done = holdsValues ? value.contents : value.contents + value.length;
    }
    endsUpTo(tree_.octets().size());
    if (tree_.octets().empty() && valuesAt_ < contents_.size()) {
        fielder.clause = ofElement;
        Field rest = fielder.field(valuesAt_, contents_.size(), "contents", Field::Kind::raw);
        rest.personal = true;
        rest.doubtful = true;
        fields.add(rest);
    }
}

}  // namespace isdn
