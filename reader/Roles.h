// Adds the role of our side to frames before they are written in a form that needs it.
#ifndef READER_ROLES_H
#define READER_ROLES_H

#include <string_view>

#include "capture/Batch.h"
#include "reader/Chatter.h"
#include "reader/Seen.h"

namespace reader {

// Frames that come before the role is known wait until a frame shows it. When a thousand items wait, and at
// the end (giveUp), they go on without a role, and a note on standard error says so.
class Roles {
  public:
    explicit Roles(Chatter& chatter) : chatter_(chatter) {}

    // Takes an item, and calls `give` with the items that are ready, in their order.
    template <class Give>
    void take(const Seen& seen, Give give) {
        capture::Item item = *seen.item;
        item.frame.role = seen.role;
        const bool isOpen = seen.isFrame() && seen.role == capture::Role::unknown && !gaveUp_;
        if (isOpen || (!waiting_.empty() && !seen.isFrame())) {
            waiting_.add(item);
            if (waiting_.items().size() >= mostWaiting)
                giveUp(give);
            return;
        }
        if (!waiting_.empty())
            release(seen.role, give);
        give(item);
    }

    template <class Give>
    void giveUp(Give give) {
        if (waiting_.empty())
            return;
        gaveUp_ = true;
        sayUnknown();
        release(capture::Role::unknown, give);
    }

  private:
    static constexpr std::size_t mostWaiting = 1000;

    // Frames of several D channels in one capture mostly have one role.
    template <class Give>
    void release(capture::Role role, Give give) {
        for (const capture::Item& waiting : waiting_.items()) {
            capture::Item item = waiting;
            if (item.frame.role == capture::Role::unknown)
                item.frame.role = role;
            give(item);
        }
        waiting_.clear();
    }

    void sayUnknown();

    Chatter& chatter_;
    capture::Batch waiting_;
    bool gaveUp_ = false;
};

}  // namespace reader

#endif
