#include "calls/CommandBits.h"

#include <utility>

namespace calls {

CommandBits::Lesson CommandBits::learn(const isdn::Layer2& frame, Side from, std::int64_t at,
                                       std::int64_t longest) {
    if (frame.type == isdn::FrameType::UNKNOWN || frame.header.size() < 3)
        return Lesson::nothing;
    if (isdn::alwaysCommand(frame.type))
        return learn(frame.cr, from);
    if (isdn::alwaysResponse(frame.type))
        return learn(!frame.cr, from);
    if (isCommand(frame.cr, from) || !frame.pf)
        return Lesson::nothing;
    const std::optional<Poll> before = std::exchange(poll_, Poll{frame.cr, from, at});
    if (!before || before->from == from || before->cr != frame.cr || at - before->at > longest)
        return Lesson::nothing;
    return learn(before->cr, before->from);
}

CommandBits::Lesson CommandBits::learn(bool commandBit, Side from) {
    std::optional<bool>& own = bits_[indexOf(from)];
    const std::optional<bool>& others = bits_[indexOf(other(from))];
    if (own)
        return *own == commandBit ? Lesson::nothing : Lesson::contradicted;
    own = commandBit;
    if (!others)
        return Lesson::learnt;
    return *others == commandBit ? Lesson::sameRole : Lesson::nothing;
}

std::optional<bool> CommandBits::isCommand(bool cr, Side from) const {
    if (const std::optional<bool>& own = bits_[indexOf(from)])
        return cr == *own;
    if (const std::optional<bool>& others = bits_[indexOf(other(from))])
        return cr != *others;
    return std::nullopt;
}

capture::Role CommandBits::role() const {
    const std::optional<bool> high = isCommand(true, Side::us);
    if (!high)
        return capture::Role::unknown;
    return *high ? capture::Role::network : capture::Role::user;
}

}  // namespace calls
