// The events of an input as a text, a word each.
#ifndef TESTS_FLEET_INPUTTEXT_H
#define TESTS_FLEET_INPUTTEXT_H

#include <string>

#include "capture/hex_digits.h"
#include "fleet/ship/TrunkInput.h"

namespace fleet_tests {

// "7/1:00010001" is frame 1 of run 7; "(7/1:...)" one that was shipped before; "frames-lost=3" what the
// recorder said; "gap=2-4" and "end@5" or "end@5+gap" the others.
inline std::string textOf(const fleet::InputEvent& event) {
    using Kind = fleet::InputEvent::Kind;
    if (event.kind == Kind::gap)
        return "gap=" + std::to_string(event.gap->first) + "-" + std::to_string(event.gap->last.value_or(0));
    if (event.kind == Kind::end)
        return "end@" + std::to_string(event.number) + (event.gap ? "+gap" : "");
    std::string text;
    if (fleet::isNumbered(event.item)) {
        text = std::to_string(event.run) + "/" + std::to_string(event.number) + ":";
        capture::appendDigits(event.item.frame.octets, text);
    } else {
        text = std::string(capture::kindName(event.item.kind)) + "=" + std::to_string(event.item.count);
    }
    return event.isOld ? "(" + text + ")" : text;
}

// All that is there now.
inline std::string restOf(fleet::TrunkInput& input) {
    std::string all;
    fleet::InputEvent event;
    while (input.next(event))
        all += (all.empty() ? "" : " ") + textOf(event);
    return all;
}

}  // namespace fleet_tests

#endif
