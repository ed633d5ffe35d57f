#include "reader/Tracker.h"

#include "calls/standardVariant.h"

namespace reader {

namespace {

using Kind = capture::Item::Kind;

calls::Side sideOf(const capture::Frame& frame) {
    return frame.transmitted ? calls::Side::us : calls::Side::peer;
}

}  // namespace

void Tracker::see(const capture::Item& item, Seen& seen) {
    seen.item = &item;
    if (item.kind == Kind::frame || item.kind == Kind::oversized || item.kind == Kind::cut)
        seen.number = ++frames_;
    seen.variant = calls::standardVariant(variantOf(item));
    Channel& channel = channelOf(item.frame);
    tellTime(channel, seen);
    if (followsLinks_)
        follow(channel, seen);
}

void Tracker::tellTime(Channel& channel, Seen& seen) {
    const capture::Frame& frame = seen.frame();
    seen.when = {frame.clock, frame.time};
    if (!seen.isFrame() && frame.clock == capture::Clock::none && !frame.ticks)
        return;
    seen.at = channel.clock.at(frame);
    if (frame.clock == capture::Clock::none && frame.ticks)
        seen.when = {capture::Clock::relative, seen.at};
    if (seen.when.clock == capture::Clock::none)
        return;
    if (!first_)
        first_ = seen.at;
    seen.sinceFirst = seen.at - *first_;
    seen.timeGoesBack = seen.when.clock == channel.last.clock && seen.when.time < channel.last.time;
    // Each part on its own: a copy of both would wait until the processor has stored seen.when.
    channel.last.clock = seen.when.clock;
    channel.last.time = seen.when.time;
}

capture::Variant Tracker::variantOf(const capture::Item& item) {
    if (variant_ != capture::Variant::unknown)
        return variant_;
    const capture::Interface* const interface = item.frame.interface;
    if (interface != nullptr && interface->variant != capture::Variant::unknown)
        return interface->variant;
    if (item.isFrame() && chatter_ != nullptr) {
        chatter_->note(std::string(done_) +
                       " as net5, since the input does not name its variant (--variant does)");
        chatter_ = nullptr;
    }
    return capture::Variant::unknown;
}

// Channels are identified by name, because an address may belong to another interface after its reader has
// gone.
Tracker::Channel& Tracker::channelOf(const capture::Frame& frame) {
    const std::string_view name =
        frame.interface == nullptr ? std::string_view() : std::string_view(frame.interface->name);
    if (last_ == nullptr || last_->first != name) {
        const capture::Role role = role_ == capture::Role::unknown ? frame.role : role_;
        last_ = &*channels_.try_emplace(std::string(name), calls::Timers(), role).first;
    }
    return last_->second;
}

void Tracker::follow(Channel& channel, Seen& seen) {
    const capture::Item& item = *seen.item;
    switch (item.kind) {
        case Kind::frame:
            seen.marks = channel.links.take(item.frame, seen.number, seen.at);
            seen.command = seen.marks.command;
            seen.role = seen.marks.role;
            break;
        case Kind::oversized:
        case Kind::cut:
            channel.links.mayLack(sideOf(item.frame));
            break;
        case Kind::lost:
            channel.links.mayMiss("Frames Lost");
            break;
        case Kind::notQueued:
            channel.links.mayMiss("Enqueue Failed");
            break;
        case Kind::notTaken:
        case Kind::dropped:
        case Kind::unproved:
        case Kind::damaged:
            channel.links.mayMiss("the recorder lost frames");
            break;
        case Kind::run:
        case Kind::restart:
        case Kind::replaced:
            channel.links.restarted();
            break;
        case Kind::mixed:
        case Kind::comment:
            break;
    }
}

void readHeaders(Seen& seen) {
    seen.link = isdn::parseLayer2(seen.frame().octets);
    seen.hasMessage = seen.link.carriesMessage();
    if (seen.hasMessage)
        seen.message = isdn::parseLayer3(seen.link.information);
}

}  // namespace reader
