// Causes, states, progress and service in words.
#include <algorithm>
#include <iterator>

#include "isdn/readers.h"
#include "isdn/tables/channel.h"
#include "isdn/tables/states.h"
#include "isdn/values.h"
#include "isdn/wording.h"

namespace isdn::wording {

namespace {

// The user of location 0 is the one beyond the sender.
void addLocation(std::string& line, std::uint8_t location, Sender sender) {
    if (location == 0 && sender != Sender::unknown)
        line.append(sender == Sender::network ? "remote " : "local ");
    addName(line, locationName, location);
}

// The meanings of diagnostics, each after a comma.
void addDiagnostics(std::string& line, const Element& element, const Context& context) {
    Fields fields;
    fieldsOf(element, context.variant, fields);
    bool behind = false;
    for (const Field& field : fields) {
        if (behind && field.kind == Field::Kind::raw) {
            line.append(", diagnostic ");
            addHex(line, field.at);
        } else if (behind && (field.kind == Field::Kind::value || field.kind == Field::Kind::text)) {
            line.append(", ").append(field.name).push_back(' ');
            if (field.meaning.empty())
                add(line, static_cast<unsigned>(field.value));
            else
                line.append(field.meaning);
        }
        behind = behind || field.name == "cause value";
    }
}

void causeWords(std::string& line, const Element& element, const Context& context) {
    line.append("cause ");
    const auto found = cause(element);
    if (!found) {
        line.append("missing");
        return;
    }
    add(line, found->value);
    if (found->codingStandard != 0) {
        line.append(", coding standard ");
        addName(line, tables::codingStandards, found->codingStandard);
        line.append(", location ");
        add(line, found->location);
        return;
    }
    const std::string_view name = causeName(found->value);
    if (!name.empty())
        line.append(" ").append(name);
    line.append(", ");
    addLocation(line, found->location, context.sender);
    if (!found->diagnostics.empty())
        addDiagnostics(line, element, context);
}

void stateWords(std::string& line, const Element& element, const Context&) {
    const auto state = callState(element);
    line.append("state ");
    if (!state) {
        line.append("missing");
        return;
    }
    add(line, state->value);
    const std::string_view name =
        state->codingStandard == 0 ? callStateName(state->value) : std::string_view();
    if (!name.empty())
        line.append(" ").append(name);
}

void progressWords(std::string& line, const Element& element, const Context&) {
    const auto found = progress(element);
    line.append("progress ");
    if (!found) {
        line.append("missing");
        return;
    }
    add(line, found->value);
    const std::string_view name =
        found->codingStandard == 0 ? progressName(found->value) : std::string_view();
    if (!name.empty())
        line.append(" ").append(name);
}

void restartWords(std::string& line, const Element& element, const Context&) {
    line.append("restart ");
    if (const auto found = restartClass(element))
        addName(line, tables::restartClasses, *found);
}

void statusWords(std::string& line, const Element& element, const Context& /*context*/) {
    if (element.contents.empty()) {
        line.append("status missing");
        return;
    }
    const std::uint8_t octet3 = element.contents[0];
    line.append(bitsOf(octet3, 7, 7) != 0 ? "channel " : "status ");
    addName(line, tables::serviceStates, bitsOf(octet3, 3, 1));
}

void notificationWords(std::string& line, const Element& element, const Context&) {
    line.append("notification ");
    if (!element.contents.empty())
        addName(line, notificationName, element.contents[0] & 0x7FU);
}

void signalWords(std::string& line, const Element& element, const Context&) {
    line.append("signal ");
    if (!element.contents.empty())
        addName(line, tables::signals, element.contents[0]);
}

void segmentWords(std::string& line, const Element& element, const Context&) {
    const auto segment = segmentHeader(element);
    line.append("segment");
    if (!segment)
        return;
    line.append(" of ");
    addName(line, callControlMessageName, segment->messageType);
    line.append(segment->first ? ", the first, " : ", ");
    add(line, segment->remaining);
    line.append(segment->remaining == 1 ? " follows" : " follow");
}

void dateWords(std::string& line, const Element& element, const Context&) {
    constexpr std::string_view separators[] = {"", "-", "-", " ", ":", ":"};
    for (std::size_t i = 0; i < std::min(element.contents.size(), std::size(separators)); ++i) {
        line.append(separators[i]);
        if (element.contents[i] < 10)
            line.push_back('0');
        add(line, element.contents[i]);
    }
}

// clang-format off
constexpr WordingRow rows[] = {
    {0, element::segmentedMessage, segmentWords},
    {0, element::changeStatus, statusWords, "CHANGE STATUS"},
    {0, element::cause, causeWords},
    {0, element::callState, stateWords},
    {0, element::progressIndicator, progressWords},
    {0, element::notificationIndicator, notificationWords},
    {0, element::dateTime, dateWords},
    {0, element::signal, signalWords},
    {0, element::restartIndicator, restartWords},
    {6, element::changeStatus, statusWords, "CHANGE STATUS"},
};
// clang-format on

}  // namespace

std::span<const WordingRow> stateWordings() { return rows; }

}  // namespace isdn::wording
