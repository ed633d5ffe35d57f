// Reads what stands in a log between frames: heads, and the recorder's own lines.
#ifndef LAPDLOG_BETWEEN_H
#define LAPDLOG_BETWEEN_H

#include "capture/Item.h"
#include "lapdlog/headers.h"

namespace lapdlog {

struct Between {
    capture::Item::Kind kind = capture::Item::Kind::run;
    std::uint64_t count = 0;
    capture::Variant variant = capture::Variant::unknown;  // the variant that a head names, if it names one
    std::size_t size = 0;
};

// Reads the head or the line that `text` begins with. A head is `good` only once it is clear whether the line
// with the variant belongs to it. `isAll`: nothing follows.
Reading readBetween(std::string_view text, bool isAll, Between& between);

}  // namespace lapdlog

#endif
