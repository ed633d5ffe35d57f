#include "reader/Surroundings.h"

#include <algorithm>

namespace reader {

namespace {

bool hasTime(const capture::Item& item) { return item.frame.clock != capture::Clock::none; }

}  // namespace

Surroundings::Surroundings(const SurroundingsRules& rules, const std::string& trunk, Chatter& chatter)
    : rules_(rules), trunk_(trunk), chatter_(chatter), file_(rules.files, trunk, chatter) {}

void Surroundings::take(const capture::Item& item) {
    if (isOpen_ && hasTime(item) && item.frame.time > until_)
        finish();
    if (isOpen_)
        file_.write(item);
    hold(item);
}

void Surroundings::hold(const capture::Item& item) {
    held_.emplace_back(item);
    octets_ += held_.back().octets.size() + held_.back().text.size();
    if (hasTime(item))
        newest_ = item.frame.time;
    while (beginsTooEarly())
        dropOldest();
    while (held_.size() > mostItems || octets_ > mostOctets) {
        dropOldest();
        if (!isCut_)
            chatter_.note(trunk_ +
                          ": more frames than can be held until a trigger; its beginning may be missing");
        isCut_ = true;
    }
}

// An item without a time belongs to the item after it.
bool Surroundings::beginsTooEarly() const {
    const auto first =
        std::find_if(held_.begin(), held_.end(), [](const HeldItem& held) { return hasTime(held.bare); });
    return first != held_.end() && newest_ - first->bare.frame.time > rules_.before;
}

void Surroundings::dropOldest() {
    octets_ -= held_.front().octets.size() + held_.front().text.size();
    held_.pop_front();
}

void Surroundings::trigger(const std::string& why) {
    if (held_.empty())
        return;  // no item has come from this trunk yet
    chatter_.note(trunk_ + ": trigger, what surrounds it is kept: " + why);
    until_ = newest_ + rules_.after;
    hostUntil_ = HostClock::now() + std::chrono::nanoseconds(rules_.after);
    if (isOpen_) {
        comment(why, held_.back().bare);
        return;
    }
    isOpen_ = true;
    comment(why, held_.front().bare);
    for (const HeldItem& held : held_)
        file_.write(held.item());
}

// Writes a comment before the first frame of a file, or after the frame that prolongs it.
void Surroundings::comment(const std::string& why, const capture::Item& at) {
    const std::string text = "lapdread: kept because of " + why;
    capture::Item item = at;
    item.kind = capture::Item::Kind::comment;
    item.text = text;
    file_.write(item);
}

void Surroundings::flush() { file_.flush(); }

void Surroundings::idle() {
    if (isOpen_ && HostClock::now() > hostUntil_)
        finish();
}

void Surroundings::finish() {
    file_.finish();
    isOpen_ = false;
}

}  // namespace reader
