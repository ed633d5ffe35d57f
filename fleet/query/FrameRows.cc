#include "fleet/query/FrameRows.h"

#include <algorithm>
#include <utility>

#include "capture/hex_digits.h"

namespace fleet {

namespace {

using Kind = capture::Item::Kind;

// The columns of frameColumns.
enum Column { run, number, time, sent, role, ticks, written, variant, octets, before };

template <class Number>
std::optional<Number> numberIf(const pqxx::row& row, Column column) {
    return row[column].is_null() ? std::nullopt : std::optional(row[column].as<Number>());
}

// The database writes a bytea as "\x" and two digits for each octet.
std::vector<std::uint8_t> octetsIn(const pqxx::field& field) {
    std::vector<std::uint8_t> octets;
    const std::string_view digits(field.c_str(), field.size());
    octets.reserve(digits.size() / 2);
    capture::appendOctets(digits.substr(2), octets);
    return octets;
}

ParcelItem frameIn(const pqxx::row& row) {
    ParcelItem item;
    item.kind = row[octets].is_null() ? Kind::oversized : Kind::frame;
    item.time = row[time].as<std::int64_t>();
    item.ticks = numberIf<std::uint32_t>(row, ticks);
    item.written = numberIf<std::int64_t>(row, written);
    item.transmitted = row[sent].as<bool>();
    item.role = static_cast<capture::Role>(row[role].as<int>());
    if (item.kind == Kind::frame)
        item.octets = octetsIn(row[octets]);
    return item;
}

// Whether the recorder itself has said that so many frames are lost, or more.
bool tellsOf(const std::vector<ParcelItem>& notes, std::uint64_t missing) {
    return std::ranges::any_of(
        notes, [&](const ParcelItem& note) { return note.kind == Kind::lost && note.count >= missing; });
}

}  // namespace

FrameRows::FrameRows(std::string name, std::string place)
    : name_(std::move(name)),
      place_(std::move(place)),
      interface_(interfaces_.of({name_, capture::Variant::unknown})) {}

void FrameRows::add(Kind kind, std::uint64_t count) {
    ParcelItem& item = items_.emplace_back();
    item.kind = kind;
    item.count = count;
}

void FrameRows::take(const pqxx::row& row) {
    items_.clear();
    given_ = 0;
    const auto itsRun = row[Column::run].as<std::uint64_t>();
    const auto itsNumber = row[Column::number].as<std::uint64_t>();
    if (itsRun == run_ && itsNumber <= number_)
        return;
    if (run_ != 0 && itsRun != run_)
        add(Kind::replaced);
    const std::uint64_t expected = itsRun == run_ ? number_ + 1 : run_ == 0 ? itsNumber : 1;
    std::vector<ParcelItem> notes;
    if (!row[before].is_null())
        notes = notesInText(row[before].c_str());
    if (itsNumber > expected && !tellsOf(notes, itsNumber - expected))
        add(Kind::lost, itsNumber - expected);
    run_ = itsRun;
    number_ = itsNumber;
    interface_ = interfaces_.of({name_, capture::variantNamed(row[variant].c_str())});
    items_.insert(items_.end(), std::move_iterator(notes.begin()), std::move_iterator(notes.end()));
    items_.push_back(frameIn(row));
}

void FrameRows::takeNotes(std::string_view json) {
    items_ = notesInText(json);
    given_ = 0;
}

bool FrameRows::next(capture::Item& item) {
    if (given_ == items_.size())
        return false;
    const ParcelItem& from = items_[given_++];
    item = {};
    item.kind = from.kind;
    item.count = from.count;
    item.text = from.text;
    item.frame.octets = from.octets;
    item.frame.transmitted = from.transmitted;
    item.frame.role = from.role;
    item.frame.ticks = from.ticks;
    item.frame.written = from.written;
    if (from.time) {
        item.frame.clock = capture::Clock::absolute;
        item.frame.time = *from.time;
    }
    item.frame.interface = from.kind == Kind::run ? interfaces_.of({name_, from.variant}) : interface_;
    item.frame.place = {place_, number_, capture::Place::Unit::packet};
    return true;
}

}  // namespace fleet
