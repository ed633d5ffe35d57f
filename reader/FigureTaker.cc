#include "reader/FigureTaker.h"

#include <optional>

namespace reader {

namespace {

// What the recorder says of the link, or of frames that it may have missed.
std::optional<calls::LinkNews> newsOf(capture::Item::Kind kind) {
    using Kind = capture::Item::Kind;
    switch (kind) {
        case Kind::run:
        case Kind::restart:
        case Kind::replaced:
            return calls::LinkNews::started;
        case Kind::cut:
        case Kind::lost:
        case Kind::notQueued:
        case Kind::notTaken:
        case Kind::dropped:
        case Kind::mixed:
        case Kind::unproved:
        case Kind::damaged:
            return calls::LinkNews::lost;
        default:
            return std::nullopt;
    }
}

}  // namespace

void FigureTaker::see(const Seen& seen) {
    const capture::Frame& frame = seen.frame();
    const calls::Moment moment{
        .frame = seen.number, .at = seen.at, .clock = seen.when.clock, .time = seen.when.time};
    if (seen.isFrame())
        links_.take(frame.interface->name, seen.link, frame.transmitted ? calls::Side::us : calls::Side::peer,
                    seen.marks, moment);
    else if (const std::optional<calls::LinkNews> news = newsOf(seen.item->kind))
        links_.note(frame.interface->name, *news, moment);
}

void FigureTaker::heard(const calls::Message& message, const calls::Call* call) {
    Analysed::heard(message, call);
    if (const std::optional<bool> wanted = isWanted(message, call); !wanted)
        calls::Figures::count(undecided_[call->number], message);
    else if (*wanted)
        figures_.heard(message);
    if (call != nullptr)
        occupancy_.heard(message, *call);
}

void FigureTaker::gone(const calls::Call& call) {
    const auto messages = undecided_.extract(call.number);
    if (isWanted(call)) {
        figures_.gone(call);
        if (!messages.empty())
            figures_.heard(messages.mapped());
    }
    Analysed::gone(call);
}

void FigureTaker::found(const calls::Finding& finding) {
    Analysed::found(finding);
    occupancy_.found(finding);
}

}  // namespace reader
