// Finds the name that somebody may have meant who mistyped a word.
#ifndef READER_SUGGESTION_H
#define READER_SUGGESTION_H

#include <span>
#include <string_view>

namespace reader {

// The name that differs least from the word: one letter that is wrong, missing or too many, or two neighbours
// that have changed places; two of these in words of six letters and more. Empty if none is so near.
std::string_view nearest(std::string_view word, std::span<const std::string_view> names);

}  // namespace reader

#endif
