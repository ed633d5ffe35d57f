#include "calls/LinkWitness.h"

namespace calls {

std::string_view doubtAbout(const LinkWitness* link, std::uint64_t frame, std::int64_t at, Side asker,
                            Side answering) {
    if (link == nullptr)
        return "nothing is known of the link";
    if (!link->wasUpSince(at))
        return "the link was down meanwhile";
    if (!link->hasArrived(frame, asker))
        return "the receiver's link layer did not acknowledge it";
    if (!link->isWholeSince(at, answering))
        return "a frame that may be the answer is missing in the trace";
    return {};
}

}  // namespace calls
