#include "fleet/ship/Packer.h"

#include <algorithm>
#include <utility>

#include "fleet/utf8.h"

namespace fleet {

namespace {

using Kind = capture::Item::Kind;

constexpr std::int64_t latest = Parcel::latest;
constexpr std::uint64_t latestRun = latest / 1000;

std::int64_t timeOf(const capture::Frame& frame, std::uint64_t run, std::uint64_t number) {
    const auto begun = static_cast<std::int64_t>(std::min(run, latestRun)) * 1000;
    std::int64_t time = frame.time;
    if (frame.clock == capture::Clock::relative)
        time = begun + std::clamp<std::int64_t>(frame.time, 0, latest - begun);
    else if (frame.clock == capture::Clock::none)
        time = begun + static_cast<std::int64_t>(std::min<std::uint64_t>(number, 1'000'000'000));
    return std::clamp<std::int64_t>(time, 0, latest);
}

}  // namespace

ParcelItem parcelItem(const capture::Item& item, std::uint64_t run, std::uint64_t number) {
    const capture::Frame& frame = item.frame;
    ParcelItem to;
    to.kind = item.kind;
    if (isNumbered(item) || frame.clock == capture::Clock::absolute)
        to.time = timeOf(frame, run, number);
    to.ticks = frame.ticks;
    if (frame.written && *frame.written >= 0 && *frame.written <= latest)
        to.written = frame.written;
    to.transmitted = frame.transmitted;
    to.role = frame.role;
    if (item.kind == Kind::frame || item.kind == Kind::cut)
        to.octets.assign(frame.octets.begin(), frame.octets.end());
    if (to.octets.size() > Parcel::mostOctets) {
        to.octets.clear();
        to.kind = item.kind == Kind::frame ? Kind::oversized : item.kind;
    }
    if (isNumbered(item))
        return to;
    to.count = std::min(item.count, Parcel::mostNumber);
    to.text = cleanUtf8(item.text, Parcel::longestText);
    if (item.kind == Kind::run)
        to.variant = frame.interface->variant;
    return to;
}

void Packer::take(const InputEvent& event) {
    if (event.kind == InputEvent::Kind::item) {
        if (!event.isOld)
            takeItem(event);
        return;
    }
    close();
    open(event.run, event.number, capture::Variant::unknown);
    if (event.gap) {
        open_.gaps.push_back(*event.gap);
        open_.first = event.gap->last ? *event.gap->last + 1 : event.gap->first;
    }
    if (event.kind == InputEvent::Kind::end) {
        open_.end = std::exchange(notes_, {});
        noteText_ = 0;
    }
    closed_.push_back(std::exchange(open_, {}));
}

void Packer::takeItem(const InputEvent& event) {
    ParcelItem item = parcelItem(event.item, event.run, event.number);
    if (!isNumbered(event.item)) {
        takeNote(std::move(item));
        return;
    }
    const capture::Variant variant = event.item.frame.interface->variant;
    const bool fits = !open_.frames.empty() && open_.run == event.run && open_.variant == variant &&
                      event.number == open_.first + open_.frames.size();
    if (!fits) {
        close();
        open(event.run, event.number, variant);
    }
    // An estimate of the JSON: keys, two digits for an octet, and up to six octets for a character of text.
    size_ += 200 + 2 * item.octets.size() + 150 * notes_.size() + 6 * noteText_;
    open_.frames.push_back({std::move(item), std::exchange(notes_, {})});
    noteText_ = 0;
    if (size_ >= full || open_.frames.size() >= mostFrames)
        close();
}

// There may be any number of lines between two frames of a damaged log.
void Packer::takeNote(ParcelItem item) {
    if (notes_.size() >= Parcel::mostNotes)
        return;
    if (noteText_ + item.text.size() + 2 * item.octets.size() > mostNoteText) {
        item.text.clear();
        item.octets.clear();
    }
    noteText_ += item.text.size() + 2 * item.octets.size();
    notes_.push_back(std::move(item));
}

void Packer::open(std::uint64_t run, std::uint64_t first, capture::Variant variant) {
    open_ = {};
    open_.address = head_.address;
    open_.trunk = head_.trunk;
    open_.group = head_.group;
    open_.isRedacted = head_.isRedacted;
    open_.variant = variant;
    open_.run = run;
    open_.first = first;
    size_ = 0;
}

void Packer::close() {
    if (!open_.frames.empty())
        closed_.push_back(std::exchange(open_, {}));
}

}  // namespace fleet
