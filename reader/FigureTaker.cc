#include "reader/FigureTaker.h"

#include <optional>

#include "calls/recording.h"
#include "reader/Feed.h"

namespace reader {

namespace {

// What an item that is no frame says about the links: that the recorder or the board was started, or that
// frames may be missing.
std::optional<calls::LinkNews> newsOf(capture::Item::Kind kind) {
    using Kind = capture::Item::Kind;
    if (kind == Kind::run || kind == Kind::restart || kind == Kind::replaced)
        return calls::LinkNews::started;
    return calls::reasonOf(kind).empty() ? std::nullopt : std::optional(calls::LinkNews::lost);
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
