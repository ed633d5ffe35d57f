// The tables that isdn/words.cc puts together. Internal to isdn/words*.cc.
#ifndef ISDN_WORDING_H
#define ISDN_WORDING_H

#include <cstdint>
#include <span>
#include <string>
#include <string_view>

#include "isdn/Table.h"
#include "isdn/words.h"

namespace isdn::wording {

struct Context {
    Variant variant;
    Sender sender;
};

// Appends the words for an element with the identifier of the row. The element may have any contents.
using Wording = void (*)(std::string& line, const Element& element, const Context& context);

struct WordingRow {
    std::uint8_t codeset;
    std::uint8_t id;
    Wording words;
    std::string_view name = {};  // the element's name, where one identifier stands for several elements
};

std::span<const WordingRow> bearerWordings();  // bearers, compatibility, channels
std::span<const WordingRow> partyWordings();   // numbers, texts, user data
std::span<const WordingRow> stateWordings();   // causes, states, progress, service

void add(std::string& line, unsigned number);
void addHex(std::string& line, Octets octets);
// A value's name, or its number if it has none.
void addName(std::string& line, const Names& names, std::uint8_t value);

}  // namespace isdn::wording

#endif
