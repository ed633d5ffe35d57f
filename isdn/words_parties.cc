// Numbers, texts, user data and facilities in words.
#include "isdn/facility.h"
#include "isdn/tables/numbers.h"
#include "isdn/values.h"
#include "isdn/wording.h"

namespace isdn::wording {

namespace {

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

// "called subaddress 123", of characters, or of octets in hex.
template <const auto& label>
void subaddressWords(std::string& line, const Element& element, const Context& context) {
    Fields fields;
    fieldsOf(element, context.variant, fields);
    line.append(label).append(" subaddress");
    for (const Field& field : fields) {
        if (field.name != "subaddress")
            continue;
        line.push_back(' ');
        if (field.kind == Field::Kind::text)
            line.append(field.meaning);
        else
            addHex(line, field.at);
    }
}

// "network service toll-free 800", "network facility 5".
void networkFacilityWords(std::string& line, const Element& element, const Context& context) {
    Fields fields;
    fieldsOf(element, context.variant, fields);
    line.append("network");
    const char* separator = " ";
    for (const Field& field : fields) {
        if (field.name == "network") {
            line.append(" ").append(field.meaning);
            separator = ", ";
        }
        if (field.name != "service" && field.name != "feature" && field.name != "facility")
            continue;
        line.append(separator).append(field.name).append(" ");
        if (field.meaning.empty())
            add(line, static_cast<unsigned>(field.value));
        else
            line.append(field.meaning);
    }
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

void facilityWords(std::string& line, const Element& element, const Context& context) {
    line.append("facility ");
    const std::size_t before = line.size();
    Facility(element.contents, context.variant).appendWords(line);
    if (line.size() == before)
        line.pop_back();
}

// clang-format off
constexpr WordingRow rows[] = {
    {0, 0x0C, numberWords<connected>},
    {0, element::extendedFacility, facilityWords},
    {0, element::facility, facilityWords},
    {0, element::display, displayWords},
    {0, element::keypad, keypadWords},
    {0, element::connectedNumber, numberWords<connected>},
    {0, element::callingNumber, numberWords<calling>},
    {0, element::calledNumber, numberWords<called>},
    {0, element::originalCalledNumber, numberWords<original>},
    {0, element::redirectingNumber, numberWords<redirecting>},
    {0, element::redirectionNumber, numberWords<redirected>},
    {0, element::calledSubaddress, subaddressWords<called>},
    {0, element::callingSubaddress, subaddressWords<calling>},
    {0, element::connectedSubaddress, subaddressWords<connected>},
    {0, element::networkFacilities, networkFacilityWords},
    {0, element::transitNetwork, transitWords},
    {0, element::userUser, userWords},
    {5, 0x2A, displayWords},
};
// clang-format on

}  // namespace

std::span<const WordingRow> partyWordings() { return rows; }

}  // namespace isdn::wording
