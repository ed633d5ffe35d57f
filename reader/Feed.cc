#include "reader/Feed.h"

#include "calls/standardVariant.h"
#include "redaction/TraceRedactor.h"

namespace reader {

std::string_view reasonOf(capture::Item::Kind kind) {
    using Kind = capture::Item::Kind;
    switch (kind) {
        case Kind::lost:
            return "Frames Lost";
        case Kind::notQueued:
            return "Enqueue Failed";
        case Kind::notTaken:
            return "Get iemsg failed";
        case Kind::dropped:
            return "packets dropped by the capture";
        case Kind::cut:
            return "a frame that is cut off";
        case Kind::mixed:
            return "two traces in one file";
        case Kind::unproved:
            return "lines that are no recorder's";
        case Kind::damaged:
            return "damage of the file";
        default:
            return {};
    }
}

calls::Options analysisOptions(const Options& options) {
    calls::Options to;
    to.timers = options.calls.timers;
    to.role = options.input.role;
    to.groups = options.calls.groups;
    if (options.input.variant != capture::Variant::unknown)
        to.variant = calls::standardVariant(options.input.variant);
    return to;
}

template <typename Hearer>
void tell(Hearer& hearer, const capture::Item& item) {
    const capture::Interface& interface = *item.frame.interface;
    if (item.kind == capture::Item::Kind::oversized)
        hearer.mayLack(interface, item.frame.transmitted ? calls::Side::us : calls::Side::peer);
    else if (item.kind == capture::Item::Kind::restart || item.kind == capture::Item::Kind::run ||
             item.kind == capture::Item::Kind::replaced)
        hearer.restarted(interface);
    else if (const std::string_view reason = reasonOf(item.kind); !reason.empty())
        hearer.mayMiss(interface, reason);
}

template void tell(calls::Analysis& hearer, const capture::Item& item);
template void tell(redaction::TraceRedactor& hearer, const capture::Item& item);

void feed(calls::Analysis& analysis, const Seen& seen) {
    if (seen.isFrame())
        analysis.take(seen.frame(), seen.number);
    else
        tell(analysis, *seen.item);
}

}  // namespace reader
