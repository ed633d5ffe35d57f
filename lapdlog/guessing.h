// Finds the variant of a log that has no head.
#ifndef LAPDLOG_GUESSING_H
#define LAPDLOG_GUESSING_H

#include <string>
#include <string_view>
#include <vector>

#include "capture/Frame.h"
#include "lapdlog/Prover.h"

namespace lapdlog {

// Returns the variants that prove every frame at the beginning of `text`, up to the first frame that none of
// them proves. The result is empty if not even the first frame is proved; `mayCome` then says whether more
// text could still prove it. The caller knows that no title of a dump begins before `untitled`.
std::vector<capture::Variant> variantsThatFit(std::string_view text, Prover& prover, bool isAll,
                                              std::size_t untitled, bool& mayCome);

// NET5 if it is among the variants, or else the first of them.
capture::Variant likeliestOf(const std::vector<capture::Variant>& variants);

// The comment for the user: "the log has no head; ...".
std::string saying(const std::vector<capture::Variant>& variants);

}  // namespace lapdlog

#endif
