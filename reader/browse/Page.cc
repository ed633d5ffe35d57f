#include "reader/browse/Page.h"

#include "isdn/octets.h"
#include "reader/Tracker.h"

namespace reader::browse {

namespace {

bool mayTellOfLink(const Seen& seen) {
    using enum isdn::FrameType;
    const isdn::FrameType type = seen.link.type;
    return !seen.isFrame() || (type != I && type != RR && type != UI);
}

}  // namespace

void Page::add(const Seen& seen, const capture::Interface* interface, std::string_view file) {
    const capture::Item& item = *seen.item;
    const capture::Frame& frame = item.frame;
    if (seen.number != 0)
        last_ = seen.number;
    Kept kept;
    kept.number = last_;
    kept.time = seen.when.time;
    kept.clock = seen.when.clock;
    kept.at = seen.at;
    kept.sinceFirst = seen.sinceFirst;
    kept.written = frame.written;
    kept.count = item.count;
    kept.place = frame.place.number;
    kept.unit = frame.place.unit;
    kept.file = file;
    kept.interface = interface;
    kept.ticks = frame.ticks;
    kept.begin = static_cast<std::uint32_t>(octets_.size());
    kept.octets = static_cast<std::uint32_t>(frame.octets.size());
    kept.text = static_cast<std::uint32_t>(item.text.size());
    kept.marks = seen.marks;
    kept.kind = item.kind;
    kept.frameClock = frame.clock;
    kept.frameTime = frame.time;
    kept.frameRole = frame.role;
    kept.role = seen.role;
    kept.variant = seen.variant;
    kept.command = seen.command;
    kept.transmitted = frame.transmitted;
    kept.timeGoesBack = seen.timeGoesBack;
    kept.keepAlive = seen.keepAlive;
    kept.isNumbered = seen.number != 0;
    kept.tellsOfLink = mayTellOfLink(seen);
    octets_.insert(octets_.end(), frame.octets.begin(), frame.octets.end());
    octets_.insert(octets_.end(), item.text.begin(), item.text.end());
    kept_.push_back(kept);
}

void Page::append(const Page& other) {
    const auto begin = static_cast<std::uint32_t>(octets_.size());
    octets_.insert(octets_.end(), other.octets_.begin(), other.octets_.end());
    for (Kept kept : other.kept_) {
        kept.begin += begin;
        kept_.push_back(kept);
    }
    last_ = other.last_;
}

void Page::load(const std::shared_ptr<const Page>& page, std::size_t item, Shown& to) {
    const Kept& kept = page->kept_[item];
    const std::span<const std::uint8_t> octets(page->octets_);
    to.page_ = page;
    to.item_ = {};
    to.item_.kind = kept.kind;
    to.item_.count = kept.count;
    to.item_.text = isdn::asCharacters(octets.subspan(kept.begin + kept.octets, kept.text));
    capture::Frame& frame = to.item_.frame;
    frame.octets = octets.subspan(kept.begin, kept.octets);
    frame.transmitted = kept.transmitted;
    frame.role = kept.frameRole;
    frame.clock = kept.frameClock;
    frame.time = kept.frameTime;
    frame.ticks = kept.ticks;
    frame.written = kept.written;
    frame.interface = kept.interface;
    frame.place = {kept.file, kept.place, kept.unit};
    to.seen_ = {};
    to.seen_.item = &to.item_;
    to.seen_.when = {kept.clock, kept.time};
    to.seen_.at = kept.at;
    to.seen_.sinceFirst = kept.sinceFirst;
    to.seen_.timeGoesBack = kept.timeGoesBack;
    to.seen_.number = kept.isNumbered ? kept.number : 0;
    to.seen_.variant = kept.variant;
    to.seen_.role = kept.role;
    to.seen_.command = kept.command;
    to.seen_.marks = kept.marks;
    to.seen_.keepAlive = kept.keepAlive;
    readHeaders(to.seen_);
}

}  // namespace reader::browse
