#include "fleet/ship/EventRedactor.h"

#include <algorithm>
#include <utility>

#include "calls/recording.h"
#include "calls/standardVariant.h"

namespace fleet {

namespace {

using Kind = capture::Item::Kind;

constexpr std::size_t mostWaiting = 4096;

}  // namespace

EventRedactor::EventRedactor(const redaction::Key& key, Next next) : key_(key), next_(std::move(next)) {}

void EventRedactor::take(const InputEvent& event) {
    if (!redactor_ || event.run != run_) {
        giveUp();
        redactor_.emplace(key_, redaction::Direction::redact);
        run_ = event.run;
    }
    newest_ = Clock::now();
    const bool isItem = event.kind == InputEvent::Kind::item;
    if (isItem && event.item.kind == Kind::comment)
        return;
    Waiting& waiting = waiting_.emplace_back();
    waiting.event = event;
    if (isItem)
        redact(waiting);
    else
        waiting.isReady = true;
    if (event.kind == InputEvent::Kind::end || waiting_.size() > mostWaiting)
        giveUp();
    release();
}

// Drops all texts of the input.
void EventRedactor::redact(Waiting& waiting) {
    capture::Item& item = waiting.event.item;
    waiting.interface = *item.frame.interface;
    const isdn::Variant variant = calls::standardVariant(waiting.interface.variant);
    waiting.token = ++frames_;
    if (item.isFrame()) {
        std::vector<redaction::Rebuilt> done;
        redactor_->take(item.frame, waiting.token, variant, done);
        settle(done);
        return;
    }
    if (item.kind == Kind::cut)
        waiting.octets = redactor_->cut(item.frame.octets, variant);
    calls::tell(*redactor_, item);
    if (!item.text.empty())
        item.text = calls::reasonOf(item.kind);
    waiting.isReady = true;
}

void EventRedactor::settle(const std::vector<redaction::Rebuilt>& done) {
    for (const redaction::Rebuilt& rebuilt : done) {
        const auto found = std::find_if(waiting_.rbegin(), waiting_.rend(),
                                        [&](const Waiting& each) { return each.token == rebuilt.number; });
        if (found == waiting_.rend())
            continue;
        found->octets = rebuilt.octets;
        found->isReady = true;
    }
}

void EventRedactor::release() {
    while (!waiting_.empty() && waiting_.front().isReady) {
        Waiting& ready = waiting_.front();
        ready.event.item.frame.octets = ready.octets;
        ready.event.item.frame.interface = &ready.interface;
        next_(ready.event);
        waiting_.pop_front();
    }
}

void EventRedactor::pause() {
    if (!waiting_.empty() &&
        Clock::now() - newest_ > std::chrono::nanoseconds(redaction::TraceRedactor::longestWait))
        giveUp();
}

void EventRedactor::giveUp() {
    if (redactor_) {
        std::vector<redaction::Rebuilt> done;
        redactor_->giveUp(done);
        settle(done);
    }
    release();
}

}  // namespace fleet
