// The switch variants, as captures and as the decoder name them.
#ifndef LAPDLOG_VARIANTS_H
#define LAPDLOG_VARIANTS_H

#include <array>
#include <string_view>

#include "capture/Frame.h"

namespace lapdlog {

inline constexpr std::array allVariants{capture::Variant::att4ess, capture::Variant::ess5,
                                        capture::Variant::dms100,  capture::Variant::ntt,
                                        capture::Variant::net5,    capture::Variant::ni2};

// decoder::swit; 0 for unknown.
int switOf(capture::Variant variant);
// The line of a log's head, without its line end ("NET5 Switch "); unknown for any other line.
capture::Variant variantOfLine(std::string_view line);

}  // namespace lapdlog

#endif
