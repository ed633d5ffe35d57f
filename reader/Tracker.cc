#include "reader/Tracker.h"

namespace reader {

Seen Tracker::see(const capture::Item& item) {
    using Kind = capture::Item::Kind;
    Seen seen;
    seen.item = &item;
    if (item.kind == Kind::frame || item.kind == Kind::oversized || item.kind == Kind::cut)
        seen.number = ++frames_;
    if (first_.clock == capture::Clock::none)
        first_ = seen.instant();
    if (first_.clock == item.frame.clock)
        seen.sinceFirst = item.frame.time - first_.time;
    seen.variant = standardVariant(variantOf(item));
    seen.role = role_ == capture::Role::unknown ? item.frame.role : role_;
    return seen;
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

void readHeaders(Seen& seen) {
    seen.link = isdn::parseLayer2(seen.frame().octets);
    seen.hasMessage = seen.link.carriesMessage();
    if (seen.hasMessage)
        seen.message = isdn::parseLayer3(seen.link.information);
    if (seen.role != capture::Role::unknown) {
        const bool sentByNetwork = seen.frame().transmitted == (seen.role == capture::Role::network);
        seen.command = isdn::isCommand(seen.link.cr, sentByNetwork);
    }
}

}  // namespace reader
