#include "calls/recording.h"

namespace calls {

std::string_view reasonOf(capture::Item::Kind kind) {
    using enum capture::Item::Kind;
    switch (kind) {
        case lost:
            return "Frames Lost";
        case notQueued:
            return "Enqueue Failed";
        case notTaken:
            return "Get iemsg failed";
        case dropped:
            return "packets dropped by the capture";
        case cut:
            return "a frame that is cut off";
        case mixed:
            return "two traces in one file";
        case unproved:
            return "lines that are no recorder's";
        case damaged:
            return "damage of the file";
        default:
            return {};
    }
}

void feed(Analysis& analysis, const capture::Item& item, std::uint64_t number) {
    if (item.isFrame())
        analysis.take(item.frame, number);
    else
        tell(analysis, item);
}

}  // namespace calls
