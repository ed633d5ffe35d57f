#include "calls/Carriers.h"

#include <algorithm>

namespace calls {

namespace {

namespace type = isdn::message;

bool isSegment(const Message& message) {
    const isdn::Layer3& layer3 = message.layer3;
    return layer3.discriminator == isdn::callControl && layer3.hasType && layer3.type == type::segment;
}

bool haveOneReference(const Message& a, const Message& b) {
    return a.from() == b.from() && a.layer2.tei == b.layer2.tei && a.layer3.hasCallReference &&
           b.layer3.hasCallReference && a.layer3.callReference.value == b.layer3.callReference.value &&
           a.layer3.callReference.flag == b.layer3.callReference.flag;
}

// Whether the frame carries the message `heard`, or a part of it.
bool carries(const Message& frame, const Message& heard) {
    return haveOneReference(frame, heard) &&
           (isSegment(frame) || std::ranges::equal(frame.layer3.octets, heard.layer3.octets));
}

}  // namespace

Carriers::Waiting::Waiting(const Message& from)
    : octets(from.frame->octets.begin(), from.frame->octets.end()),
      file(from.frame->place.file),
      frame(*from.frame),
      message(from) {
    if (from.frame->interface != nullptr)
        interface = *from.frame->interface;
    frame.octets = octets;
    frame.place.file = file;
    frame.interface = &interface;
    message.frame = &frame;
    message.layer2 = isdn::parseLayer2(octets);
    message.layer3 = isdn::parseLayer3(message.layer2.information);
}

void Carriers::take(const Message& message, const Marks& marks, const CallTable& table, const Tell& tell) {
    const bool mayBeHeard = !marks.accepted;
    const bool mayBegin = message.layer3.type == type::setup || message.layer3.type == type::resume ||
                          message.layer3.type == type::registration;
    if (!mayBeHeard && !isSegment(message) && (marks.retransmitted || !mayBegin)) {
        const Call* const call = table.callOf(message);
        if (call != nullptr || marks.retransmitted) {
            tell(message, call);
            return;
        }
    }
    const bool waitsAlready = std::ranges::any_of(
        waiting_, [&](const Waiting& frame) { return frame.message.number == message.number; });
    if (waitsAlready)
        return;
    if (waiting_.size() >= mostWaiting) {
        tell(waiting_.front().message, table.callOf(waiting_.front().message));
        waiting_.pop_front();
    }
    waiting_.emplace_back(message);
}

void Carriers::heard(const Message& message, const Call* call, const Tell& tell) {
    for (auto frame = waiting_.begin(); frame != waiting_.end();) {
        const bool isItself = frame->message.number == message.number;
        if (!isItself && !carries(frame->message, message)) {
            ++frame;
            continue;
        }
        if (!isItself)
            tell(frame->message, call);
        frame = waiting_.erase(frame);
    }
}

void Carriers::advance(std::int64_t at, const CallTable& table, const Tell& tell) {
    while (!waiting_.empty() && at - waiting_.front().message.at > patience) {
        tell(waiting_.front().message, table.callOf(waiting_.front().message));
        waiting_.pop_front();
    }
}

void Carriers::finish(const CallTable& table, const Tell& tell) {
    for (const Waiting& frame : waiting_)
        tell(frame.message, table.callOf(frame.message));
    waiting_.clear();
}

}  // namespace calls
