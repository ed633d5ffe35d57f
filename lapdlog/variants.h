// Translates between the switch variants of captures and those of the decoder.
#ifndef LAPDLOG_VARIANTS_H
#define LAPDLOG_VARIANTS_H

#include <array>
#include <string_view>

#include "capture/Frame.h"

namespace lapdlog {

inline constexpr std::array allVariants{capture::Variant::att4ess, capture::Variant::ess5,
                                        capture::Variant::dms100,  capture::Variant::ntt,
                                        capture::Variant::net5,    capture::Variant::ni2};

// The value of decoder::swit; 0 for unknown.
int switOf(capture::Variant variant);
// The variant that a line of a log's head names ("NET5 Switch ", without line end); unknown for any other
// line.
capture::Variant variantOfLine(std::string_view line);

}  // namespace lapdlog

#endif
