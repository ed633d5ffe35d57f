// Reads octets by a table's rows.
#include <algorithm>
#include <charconv>
#include <string>

#include "isdn/Table.h"

namespace isdn {

namespace {

class Engine {
  public:
    Engine(const ElementTable& table, Octets octets, Variant variant, Fields& fields)
        : table_(table), rest_(octets), variant_(variant), fields_(fields) {}

    Problem run() {
        for (std::size_t first = 0; first < table_.rows.size();) {
            const std::span<const Row> group = groupAt(first);
            first += group.size();
            readGroup(group);
            if (!understood_ && table_.otherwise == ElementTable::Otherwise::raw)
                return takeRest(true);
        }
        if (!rest_.empty())
            note(Problem::tooLong);
        takeRest(true);
        return problem_;
    }

  private:
    // The row that begins octets, and those of further fields of the same octet.
    std::span<const Row> groupAt(std::size_t first) const {
        std::size_t end = first + 1;
        while (end < table_.rows.size() && table_.rows[end].octet.empty())
            ++end;
        return table_.rows.subspan(first, end - first);
    }

    void readGroup(std::span<const Row> group) {
        const Row& first = group.front();
        if (!applies(first.when))
            return;
        if (first.when.presence != When::Presence::extended)
            skipExtensions();
        if (first.when.next.given() && (rest_.empty() || !first.when.next.admits(rest_[0])))
            return;
        if (first.place.kind == Place::Kind::octets) {
            takeOctets(first);
            return;
        }
        std::size_t second = 0;  // the first field of the group's second octet
        do {
            if (rest_.empty()) {
                if (open_ && second != 0)
                    doubtFrom(second);
                if (first.when.presence != When::Presence::optional)
                    note(Problem::tooShort);
                return;
            }
            takeOctet(group);
            if (second == 0)
                second = fields_.size();
        } while ((first.place.repeat == Place::Repeat::whileExtended && open_) ||
                 (first.place.repeat == Place::Repeat::toEnd && !rest_.empty()));
    }

    // Marks fields as doubtful: if a group does not end, its octets may belong to what follows.
    void doubtFrom(std::size_t index) {
        for (auto field = fields_.begin() + static_cast<std::ptrdiff_t>(index); field != fields_.end();
             ++field)
            field->doubtful = true;
    }
    // The octet with this label announces more octets than there are. It is wrong, so the fields after it are
    // marked as doubtful.
    void doubtBehind(std::string_view label) {
        for (auto field = fields_.end(); field != fields_.begin() && (--field)->octet != label;)
            field->doubtful = true;
    }

    bool applies(const When& when) const {
        return when.variants.has(variant_) && seen_.passes(when.seen) &&
               (when.presence != When::Presence::extended || open_);
    }

    // Skips octets by which a later standard has extended a group: those up to the next one with bit 8 set.
    // If there is none near, the sender has cleared the bit by mistake, and the group has no further octets.
    void skipExtensions() {
        constexpr std::size_t most = 4;
        if (!open_)
            return;
        open_ = false;
        const Octets near = rest_.first(std::min(rest_.size(), most));
        const auto last = std::ranges::find_if(near, [](std::uint8_t octet) { return (octet & 0x80U) != 0; });
        if (last == near.end())
            return;
        const auto count = static_cast<std::size_t>(last - near.begin()) + 1;
        addRaw(rest_.first(count), "extension", true, fields_.keep(std::string(fields_.back().octet) + "*"));
        fields_.back().doubtful = true;
        rest_ = rest_.subspan(count);
    }

    void takeOctet(std::span<const Row> group) {
        const Octets at = rest_.first(1);
        rest_ = rest_.subspan(1);
        seen_.add(group.front().octet, at[0]);
        const Test& understood = table_.understood;
        if (understood.given() && understood.octet == group.front().octet && !understood.admits(at[0]))
            understood_ = false;
        open_ = false;
        unsigned bit = 8;  // the highest bit that has no field yet
        for (const Row& row : group) {
            const Place& place = row.place;
            const bool there = &row == &group.front() || applies(row.when);
            if (place.kind == Place::Kind::nothing || !there || place.high > bit)
                continue;
            addGap(group.front(), at, bit, place.high + 1U);
            addBits(group.front(), row, at);
            bit = place.low - 1U;
        }
        addGap(group.front(), at, bit, 1);
    }

    void addBits(const Row& first, const Row& row, Octets at) {
        Field& field = add(first, at, row.place.high, row.place.low);
        field.name = row.name;
        field.personal = row.isPersonal;
        if (!row.clause.empty())
            field.clause = row.clause;
        if (row.place.kind == Place::Kind::reserved)
            field.kind = Field::Kind::spare;
        else if (row.place.kind == Place::Kind::heading)
            field.kind = Field::Kind::header;
        const bool standard = table_.understood.given() && row.place.high == table_.understood.high &&
                              first.octet == table_.understood.octet;
        if (understood_ || standard)
            field.meaning = row.names(static_cast<std::uint8_t>(field.value));
    }

    // Bits that no row names: the extension bit, and what is spare.
    void addGap(const Row& first, Octets at, unsigned high, unsigned low) {
        if (high == 8 && low <= 8) {
            Field& field = add(first, at, 8, 8);
            field.name = "extension";
            field.kind = Field::Kind::extension;
            open_ = field.value == 0;
            field.meaning = open_ ? "the group goes on" : "last octet of the group";
            --high;
        }
        if (high < low || high == 0)
            return;
        Field& field = add(first, at, high, low);
        field.name = "spare";
        field.kind = Field::Kind::spare;
    }

    Field& add(const Row& first, Octets at, unsigned high, unsigned low) {
        Field field;
        field.octet = first.octet;
        field.clause = table_.clause;
        field.at = at;
        field.high = static_cast<std::uint8_t>(high);
        field.low = static_cast<std::uint8_t>(low);
        field.value = bitsOf(at[0], high, low);
        fields_.add(field);
        return fields_.back();
    }

    void takeOctets(const Row& row) {
        const Place& place = row.place;
        std::size_t wanted = rest_.size();
        if (!place.countedBy.empty()) {
            const std::uint8_t* const count = seen_.find(place.countedBy);
            const unsigned announced = count == nullptr ? 0U : *count;
            wanted = announced > place.alreadyCounted ? announced - place.alreadyCounted : 0U;
        } else if (place.count != 0) {
            wanted = place.count;
        }
        const std::size_t there = std::min(wanted, rest_.size());
        if (there < wanted)
            note(Problem::tooShort);
        const Octets taken = rest_.first(there);
        rest_ = rest_.subspan(there);
        if (!taken.empty())
            readOctets(row, taken);
        if (there < wanted && !place.countedBy.empty())
            doubtBehind(place.countedBy);
    }

    void readOctets(const Row& row, Octets taken) {
        if (!understood_ || row.place.reader == nullptr) {
            addRaw(taken, row.name, row.isPersonal || !understood_, row.octet, row.clause);
            fields_.back().doubtful = !understood_;
            return;
        }
        const std::string_view clause = row.clause.empty() ? table_.clause : row.clause;
        const Contents contents{taken, row.octet, row.name, clause, row.isPersonal, variant_, seen_};
        note(row.place.reader(contents, fields_));
    }

    // Appends the octets that are left after the rows, or all octets if the rows must not be used. Their
    // numbers continue that of the last octet.
    Problem takeRest(bool isPersonal) {
        if (rest_.empty())
            return problem_;
        int number = 2;
        if (!fields_.empty()) {
            const std::string_view last = fields_.back().octet;
            std::from_chars(last.data(), last.data() + last.size(), number);
        }
        addRaw(rest_, "contents", isPersonal, fields_.keep(std::to_string(number + 1)));
        fields_.back().doubtful = true;
        rest_ = {};
        return problem_;
    }

    void addRaw(Octets octets, std::string_view name, bool isPersonal, std::string_view label,
                std::string_view clause = {}) {
        Field field;
        field.octet = label;
        field.name = name;
        field.clause = clause.empty() ? table_.clause : clause;
        field.at = octets;
        field.kind = Field::Kind::raw;
        field.personal = isPersonal;
        for (const std::uint8_t octet : octets.last(std::min<std::size_t>(octets.size(), 8)))
            field.value = field.value << 8 | octet;
        fields_.add(field);
    }

    // The first problem counts.
    void note(Problem problem) {
        if (problem_ == Problem::none)
            problem_ = problem;
    }

    const ElementTable& table_;
    Octets rest_;
    Variant variant_;
    Fields& fields_;
    Seen seen_;
    Problem problem_ = Problem::none;
    bool open_ = false;       // the last octet said that its group goes on
    bool understood_ = true;  // the names belong to the coding standard of the element
};

}  // namespace

Problem readRows(const ElementTable& table, Octets octets, Variant variant, Fields& fields) {
    return Engine(table, octets, variant, fields).run();
}

}  // namespace isdn
