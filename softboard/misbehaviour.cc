#include "softboard/misbehaviour.h"

#include <algorithm>
#include <iterator>
#include <utility>

#include "softboard/codes.h"
#include "softboard/wire.h"

namespace softboard {

namespace {

using enum FaultKind;

constexpr uint32_t generalReply = 0x800001;
constexpr uint32_t otherTransaction = 0x80000000;  // the top bit of the header's word
constexpr uint16_t otherInstance = 0x4000;
constexpr size_t labelAt = 0;
constexpr size_t lengthAt = 12;

// Changes the 32-bit word at this offset of the body; does nothing if the body ends before the word does.
void setWord(Octets& body, size_t at, uint32_t value) {
    const Octets word = BodyWriter().u32(value).take();
    if (at + word.size() <= body.size()) {
        std::copy(word.begin(), word.end(), body.begin() + static_cast<std::ptrdiff_t>(at));
    }
}

void makeError(const Message& command, Message& reply) {
    reply.type = msgError;
    reply.body = BodyWriter().u32(command.type).u32(static_cast<uint32_t>(ErrorCode::valueRefused)).take();
}

struct ReplyChange {
    FaultKind kind;
    void (*change)(const Message& command, Message& reply);
};

constexpr ReplyChange replyChanges[] = {
    {replyType0, [](const Message&, Message& reply) { reply.type = msgError; }},
    {replyGeneral, [](const Message&, Message& reply) { reply.type = generalReply; }},
    {replyError, makeError},
    {replyOtherSource, [](const Message&, Message& reply) { reply.source.instance ^= otherInstance; }},
    {replyWrongTransaction, [](const Message&, Message& reply) { reply.transaction ^= otherTransaction; }},
};

struct EventChange {
    FaultKind kind;
    void (*change)(Message& event, uint32_t argument);
};

constexpr EventChange eventChanges[] = {
    {eventTruncated,
     [](Message& event, uint32_t n) { event.body.resize(std::min<size_t>(n, event.body.size())); }},
    {eventOverlong, [](Message& event, uint32_t n) { event.body.resize(event.body.size() + n, 0x55); }},
    {eventLength, [](Message& event, uint32_t n) { setWord(event.body, lengthAt, n); }},
    {eventLabel, [](Message& event, uint32_t n) { setWord(event.body, labelAt, n); }},
    {eventType, [](Message& event, uint32_t n) { event.type = n; }},
    {eventSource, [](Message& event, uint32_t n) { event.source.instance = static_cast<uint16_t>(n); }},
};

// Whether the command is one of the two with which a host ends a trace.
bool endsTrace(const Message& command) {
    BodyReader body(command.body);
    const uint32_t first = body.u32();
    return (command.type == msgCancelEvt && first == layer2TraceEvents) ||
           (command.type == msgSetParm && first == traceParameter && body.u32() == 0);
}

}  // namespace

Misbehaviour::Misbehaviour(std::vector<Fault> faults) : faults_(std::move(faults)) {}

std::optional<uint32_t> Misbehaviour::argument(FaultKind kind) const {
    const auto found = std::find_if(faults_.begin(), faults_.end(),
                                    [kind](const Fault& fault) { return fault.kind == kind; });
    return found == faults_.end() ? std::nullopt : std::optional(found->argument);
}

bool Misbehaviour::isTheNth(FaultKind kind, uint64_t count) const {
    return std::any_of(faults_.begin(), faults_.end(),
                       [&](const Fault& fault) { return fault.kind == kind && fault.argument == count; });
}

bool Misbehaviour::fails(FaultKind kind) { return !faults_.empty() && isTheNth(kind, ++calls_[kind]); }

Messages Misbehaviour::repliesFor(const Message& command, const Message& reply) {
    ++replies_;
    Message changed = reply;
    for (const ReplyChange& row : replyChanges) {
        if (isTheNth(row.kind, replies_)) {
            row.change(command, changed);
        }
    }
    Messages sent = std::exchange(late_, {});
    if (isTheNth(replyLate, replies_)) {
        late_.push_back(changed);
    } else if (!isTheNth(replyLost, replies_)) {
        sent.insert(sent.end(), isTheNth(replyTwice, replies_) ? 2 : 1, changed);
    }
    return sent;
}

Messages Misbehaviour::aheadOf(const Message& event) {
    if (faults_.empty()) {
        return {};
    }
    lastEvent_ = event;
    Messages wrong;
    if (events_++ % framesBetween != 0) {
        return wrong;
    }
    for (const EventChange& row : eventChanges) {
        if (const auto number = argument(row.kind); number) {
            wrong.push_back(event);
            row.change(wrong.back(), *number);
        }
    }
    return wrong;
}

Messages Misbehaviour::beside(const Message& command) const {
    const auto number = argument(eventsWhileStopping);
    return number && lastEvent_ && endsTrace(command) ? Messages(*number, *lastEvent_) : Messages{};
}

bool Misbehaviour::bursting() const { return events_ < argument(burst).value_or(0); }

bool Misbehaviour::silent() const {
    const auto after = argument(FaultKind::silent);
    return after && events_ >= *after;
}

}  // namespace softboard
