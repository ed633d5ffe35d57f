#include "reader/FigureTaker.h"

#include <optional>

namespace reader {

std::vector<FigureTable> FigureTaker::tables(calls::TrunkSize size) {
    occupancy_.finish(analysis().spans());
    return figureTables(figures_, occupancy_, size);
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
