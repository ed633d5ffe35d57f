#include "isdn/words.h"

#include <algorithm>
#include <array>
#include <charconv>

#include "isdn/Table.h"
#include "isdn/facility.h"
#include "isdn/readers.h"
#include "isdn/tables/bearer.h"
#include "isdn/tables/channel.h"
#include "isdn/tables/numbers.h"
#include "isdn/tables/states.h"
#include "isdn/values.h"

namespace isdn {

namespace {

void add(std::string& line, unsigned number) {
    std::array<char, 12> digits;
    const auto end = std::to_chars(digits.data(), digits.data() + digits.size(), number).ptr;
    line.append(digits.data(), end);
}

void addHex(std::string& line, Octets octets) {
    constexpr char digits[] = "0123456789abcdef";
    for (const std::uint8_t octet : octets) {
        line.push_back(digits[octet >> 4]);
        line.push_back(digits[octet & 0x0FU]);
    }
}

// A value's name, or its number if it has none.
void addName(std::string& line, const Names& names, std::uint8_t value) {
    const std::string_view name = names(value);
    if (name.empty())
        add(line, value);
    else
        line.append(name);
}

struct Context {
    Variant variant;
    Sender sender;
};

using Wording = void (*)(std::string&, const Element&, const Context&);

// What follows a group of octets, of which all but the last have bit 8 clear.
Octets behindGroup(Octets octets) {
    const auto last = std::ranges::find_if(octets, [](std::uint8_t octet) { return (octet & 0x80U) != 0; });
    return last == octets.end() ? Octets()
                                : octets.subspan(static_cast<std::size_t>(last - octets.begin()) + 1);
}

// Octets 4 and following of a bearer, and what they say.
struct Transfer {
    explicit Transfer(Octets contents) : octet4(behindGroup(contents)) {
        if (octet4.empty())
            return;
        packet = bitsOf(octet4[0], 7, 6) == 2;
        rate = bitsOf(octet4[0], 5, 1);
        Octets rest = behindGroup(octet4);
        if (rate == multirate && !rest.empty()) {
            multiplier = bitsOf(rest[0], 7, 1);
            rest = rest.subspan(1);
        }
        if (!rest.empty() && bitsOf(rest[0], 7, 6) == 1)
            layer1 = bitsOf(rest[0], 5, 1);
    }

    static constexpr std::uint8_t multirate = 0x18;
    Octets octet4;
    bool packet = false;
    std::uint8_t rate = 0;
    std::uint8_t multiplier = 0;
    std::optional<std::uint8_t> layer1;  // its protocol
};

// "64k unrestricted", "6x64k unrestricted", "packet, unrestricted".
void addDigital(std::string& line, const Transfer& transfer, std::string_view what) {
    constexpr Name rates[] = {
        {0x10, "64k "}, {0x11, "2x64k "}, {0x13, "384k "}, {0x15, "1536k "}, {0x17, "1920k "}};
    if (transfer.packet) {
        line.append("packet, ");
    } else if (transfer.multiplier != 0) {
        add(line, transfer.multiplier);
        line.append("x64k ");
    } else {
        line.append(Names(rates)(transfer.rate));
    }
    line.append(what);
}

void addTransfer(std::string& line, const Element& element) {
    constexpr std::uint8_t speech = 0x00, unrestricted = 0x08, restricted = 0x09;
    if (element.contents.empty())
        return;
    const std::uint8_t octet3 = element.contents[0];
    if (bitsOf(octet3, 7, 6) != 0) {
        line.append("of coding standard ");
        addName(line, tables::codingStandards, bitsOf(octet3, 7, 6));
        return;
    }
    const std::uint8_t capability = octet3 & 0x1FU;
    const Transfer transfer(element.contents);
    if (capability == unrestricted)
        addDigital(line, transfer, "unrestricted");
    else if (capability == restricted)
        addDigital(line, transfer, "restricted");
    else
        addName(line, tables::transferCapabilities, capability);
    if (transfer.layer1 && capability != speech) {
        line.append(", ");
        addName(line, tables::layer1Protocols, *transfer.layer1);
    }
}

void bearerWords(std::string& line, const Element& element, const Context&) { addTransfer(line, element); }

void compatibilityWords(std::string& line, const Element& element, const Context&) {
    line.append("LLC ");
    addTransfer(line, element);
}

void highLayerWords(std::string& line, const Element& element, const Context&) {
    line.append("HLC");
    if (element.contents.size() < 2 || bitsOf(element.contents[0], 7, 6) != 0)
        return;
    line.push_back(' ');
    addName(line, tables::highLayers, element.contents[1] & 0x7FU);
}

// "1-5,7": channels in ranges.
void addChannels(std::string& line, const std::bitset<128>& channels) {
    const char* separator = "";
    for (unsigned first = 0; first < channels.size(); ++first) {
        if (!channels[first])
            continue;
        unsigned last = first;
        while (last + 1 < channels.size() && channels[last + 1])
            ++last;
        line.append(separator);
        separator = ",";
        add(line, first);
        if (last != first) {
            line.append(last == first + 1 ? "," : "-");
            add(line, last);
        }
        first = last;
    }
}

void channelWords(std::string& line, const Element& element, const Context&) {
    line.append("channel ");
    const auto channel = channelId(element);
    if (!channel) {
        line.append("missing");
        return;
    }
    if (channel->interface) {
        add(line, *channel->interface);
        line.push_back('/');
    }
    if (channel->dChannel)
        line.push_back('D');
    else if (channel->selection == ChannelId::Selection::none)
        line.append("none");
    else if (channel->selection == ChannelId::Selection::any)
        line.append("any");
    else if (!channel->primaryRate)
        line.append(channel->channels[1] ? "B1" : "B2");
    else if (channel->channels.none())
        line.append("missing");
    else
        addChannels(line, channel->channels);
    if (channel->selection == ChannelId::Selection::indicated || channel->dChannel)
        line.push_back(channel->exclusive ? '!' : '?');
}

void addNumber(std::string& line, std::string_view label, const Element& element) {
    constexpr std::uint8_t allowed = 0;
    constexpr std::string_view screenings[] = {"not screened", "verified", "failed verification",
                                               "from the network"};
    line.append(label);
    const auto number = partyNumber(element);
    if (!number) {
        line.append(" missing");
        return;
    }
    line.push_back(' ');
    if (!number->digits.empty())
        line.append(number->digits).push_back(' ');
    addName(line, tables::numberTypes, number->type);
    line.push_back('/');
    addName(line, tables::numberingPlans, number->plan);
    if (number->presentation && *number->presentation != allowed) {
        line.append(", ");
        addName(line, tables::presentations, *number->presentation);
    }
    if (number->screening)
        line.append(", ").append(screenings[*number->screening & 3U]);
    if (number->reason) {
        line.append(", ");
        addName(line, tables::redirectingReasons, *number->reason);
    }
}

template <const auto& label>
void numberWords(std::string& line, const Element& element, const Context&) {
    addNumber(line, label, element);
}

constexpr char called[] = "called", calling[] = "calling", connected[] = "connected",
               redirecting[] = "redirecting", redirected[] = "redirection", original[] = "originally called";

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

void statusWords(std::string& line, const Element& element, const Context&) {
    const auto found = changeStatus(element);
    if (!found)
        return;
    line.append(found->channel ? "channel " : "");
    addName(line, tables::serviceStates, found->status);
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

void keypadWords(std::string& line, const Element& element, const Context&) {
    line.append("keypad ").append(keypadDigits(element));
}

// The characters of a display, of several fields each in quotes.
void displayWords(std::string& line, const Element& element, const Context& context) {
    Fields fields;
    fieldsOf(element, context.variant, fields);
    line.append("display");
    for (const Field& field : fields) {
        if (field.kind == Field::Kind::text)
            line.append(" \"").append(field.meaning).append("\"");
    }
}

void userWords(std::string& line, const Element& element, const Context&) {
    line.append("user-user ");
    add(line, static_cast<unsigned>(element.contents.empty() ? 0 : element.contents.size() - 1));
    line.append(" octets");
}

void transitWords(std::string& line, const Element& element, const Context&) {
    line.append("via ");
    if (!element.contents.empty())
        line.append(asCharacters(element.contents.subspan(1)));
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

void facilityWords(std::string& line, const Element& element, const Context& context) {
    line.append("facility ");
    const std::size_t before = line.size();
    Facility(element.contents, context.variant).appendWords(line);
    if (line.size() == before)
        line.pop_back();
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

void nameWords(std::string& line, const Element& element, const Context& context) {
    line.append(elementName(element, context.variant));
}

struct WordingRow {
    std::uint8_t codeset;
    std::uint8_t id;
    Wording words;
    Variants variants = everywhere;
};

// clang-format off
constexpr WordingRow wordings[] = {
    {0, element::segmentedMessage, segmentWords},
    {0, element::changeStatus, statusWords, tables::withChangeStatus},
    {0, element::bearerCapability, bearerWords},
    {0, element::cause, causeWords},
    {0, 0x0C, numberWords<connected>},
    {0, element::extendedFacility, facilityWords},
    {0, element::callState, stateWords},
    {0, element::channelIdentification, channelWords},
    {0, element::facility, facilityWords},
    {0, element::progressIndicator, progressWords},
    {0, element::notificationIndicator, notificationWords},
    {0, element::display, displayWords},
    {0, element::dateTime, dateWords},
    {0, element::keypad, keypadWords},
    {0, element::signal, signalWords},
    {0, element::connectedNumber, numberWords<connected>},
    {0, element::callingNumber, numberWords<calling>},
    {0, element::calledNumber, numberWords<called>},
    {0, element::originalCalledNumber, numberWords<original>},
    {0, element::redirectingNumber, numberWords<redirecting>},
    {0, element::redirectionNumber, numberWords<redirected>},
    {0, element::transitNetwork, transitWords},
    {0, element::restartIndicator, restartWords},
    {0, element::lowLayerCompatibility, compatibilityWords},
    {0, element::highLayerCompatibility, highLayerWords},
    {0, element::userUser, userWords},
    {5, 0x2A, displayWords},
    {6, element::changeStatus, statusWords, everywhereBut(Variant::ni2)},
};
// clang-format on

}  // namespace

void appendWords(std::string& line, const Element& element, Variant variant, Sender sender) {
    if (element.octets.empty() || element.shift())
        return;
    const ElementTable* const table = elementTable(element.codeset, element.id, variant);
    if (table == nullptr) {
        line.append("element ");
        if (element.codeset != 0) {
            add(line, element.codeset);
            line.push_back('/');
        }
        addHex(line, element.octets.first(1));
        if (!element.contents.empty()) {
            line.push_back(' ');
            addHex(line, element.contents);
        }
    } else {
        Wording words = nameWords;
        for (const WordingRow& row : wordings) {
            if (row.codeset == element.codeset && row.id == element.id && row.variants.has(variant))
                words = row.words;
        }
        words(line, element, {variant, sender});
    }
    if (element.problem != Problem::none)
        line.append(" (").append(nameOf(element.problem)).append(")");
}

void appendWords(std::string& line, const Layer3& message, Variant variant, Sender sender) {
    const std::size_t before = line.size();
    for (const Element& element : message.elements) {
        const std::size_t start = line.size();
        if (start != before)
            line.append("  ");
        const std::size_t wordsStart = line.size();
        appendWords(line, element, variant, sender);
        if (line.size() == wordsStart)
            line.resize(start);
    }
}

void appendWords(std::string& line, const TeiMessage& message) {
    constexpr std::uint8_t any = 127;
    const std::string_view name = teiMessageName(message.type);
    line.append(name.empty() ? "unknown TEI message" : name).append(", Ri ");
    add(line, message.reference);
    line.append(", TEI ");
    if (message.actions.empty()) {
        line.append("missing");
        return;
    }
    const char* separator = "";
    for (const std::uint8_t octet : message.actions) {
        line.append(separator);
        separator = ",";
        if (octet >> 1 == any)
            line.append("any");
        else
            add(line, octet >> 1);
    }
}

void appendWords(std::string& line, const FrameReject& reject) {
    line.append("rejected control ");
    addHex(line, reject.rejectedControl);
    line.append(reject.response ? " of a response" : " of a command");
    line.append(", V(S) ");
    add(line, reject.vs);
    line.append(", V(R) ");
    add(line, reject.vr);
    const struct {
        bool set;
        std::string_view text;
    } reasons[] = {
        {reject.undefinedControl, ", control field undefined"},
        {reject.informationNotPermitted, ", information not permitted"},
        {reject.informationTooLong, ", information too long"},
        {reject.invalidNr, ", N(R) invalid"},
    };
    for (const auto& reason : reasons) {
        if (reason.set)
            line.append(reason.text);
    }
    if (reject.problem != Problem::none)
        line.append(" (").append(nameOf(reject.problem)).append(")");
}

}  // namespace isdn
