// The variant of a log that has no head.
#ifndef LAPDLOG_GUESSING_H
#define LAPDLOG_GUESSING_H

#include <string>
#include <string_view>
#include <vector>

#include "capture/Frame.h"
#include "lapdlog/Prover.h"

namespace lapdlog {

// The variants by which all frames that stand at the beginning of `text`, one behind another, are proved;
// those of the frames before the first that none of them proves. Empty when not even the first is proved;
// `mayCome` then says whether more text could still prove it. No title of a dump begins before `untitled`.
std::vector<capture::Variant> variantsThatFit(std::string_view text, Prover& prover, bool isAll,
                                              std::size_t untitled, bool& mayCome);

// NET5 if it is among them, or else the first.
capture::Variant likeliestOf(const std::vector<capture::Variant>& variants);

// "the log has no head; ..."
std::string saying(const std::vector<capture::Variant>& variants);

}  // namespace lapdlog

#endif
