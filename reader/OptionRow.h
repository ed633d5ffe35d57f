// An option of the command line as data. --help, the parser, manual pages and completion all read these rows.
#ifndef READER_OPTION_ROW_H
#define READER_OPTION_ROW_H

#include <initializer_list>
#include <span>
#include <string>
#include <string_view>
#include <utility>

#include "reader/Options.h"
#include "reader/errors.h"
#include "reader/text.h"

namespace reader {

struct OptionRow {
    std::string_view names;  // "-o,-w,--output"
    std::string_view form;   // the form of its value: "FILE", "auto|always|never"; empty if it takes none
    std::string_view help;
    // Is called each time the option is given, with "" if it takes no value. Throws UsageError without the
    // option's name, which the caller adds.
    void (*set)(Options& options, const std::string& value);
    // If several options of a command have the same word here, only one of them may be given. Empty: no such
    // limit.
    std::string_view oneOf{};
};

struct OptionGroup {
    std::string_view title;  // above the rows in --help; may be empty
    std::span<const OptionRow> rows;
};

// The value that a word stands for. Throws UsageError if the word is not among the choices.
template <class Value>
Value chosen(const std::string& word, std::initializer_list<std::pair<std::string_view, Value>> choices) {
    std::string known;
    for (const auto& [name, value] : choices) {
        if (name == word)
            return value;
        (known += known.empty() ? "" : "|") += name;
    }
    throw UsageError(word + " is none of " + known);
}

// Reads a number from 1 to `most`. Throws UsageError for anything else.
template <class Number>
Number countIn(const std::string& word, Number most) {
    Number number = 0;
    if (!readNumber(std::string_view(word), number) || number < 1 || number > most)
        throw UsageError(word + " is no number from 1 to " + std::to_string(most));
    return number;
}

}  // namespace reader

#endif
