// The test's side of the scripted transport library.
#include "tests/support/fake_norv.h"

#include <algorithm>
#include <chrono>
#include <utility>

#include "tests/support/fake_norv_state.h"

namespace fake_norv {

Message replyTo(const Message& command, std::uint32_t type, std::vector<std::uint8_t> body) {
    return {command.transaction, type, command.target, command.source, std::move(body)};
}

std::vector<std::uint8_t> words(const std::vector<std::uint32_t>& values) {
    std::vector<std::uint8_t> body;
    for (const std::uint32_t value : values) {
        for (unsigned shift = 0; shift < 32; shift += 8)
            body.push_back(static_cast<std::uint8_t>(value >> shift));
    }
    return body;
}

void reset() {
    State& s = state();
    const Lock lock(s.lock);
    while (!s.buffers.empty())
        release(s, s.buffers.begin()->first);
    s.calls.clear();
    s.written.clear();
    s.misuses.clear();
    s.faults.clear();
    s.queues.clear();
    s.script = nullptr;
    s.mostOctets = SIZE_MAX;
    s.firstOffsetStaysZero = false;
    s.offsetsStayZero = false;
    s.nextQueue = firstQueue;
    s.nextHost = firstHost;
}

std::vector<Call> calls() {
    const Lock lock(state().lock);
    return state().calls;
}

std::vector<Call> calls(Op op) {
    std::vector<Call> some = calls();
    std::erase_if(some, [op](const Call& call) { return call.op != op; });
    return some;
}

std::size_t count(Op op) { return calls(op).size(); }

std::vector<std::string> texts() {
    std::vector<std::string> all;
    for (const Call& call : calls()) {
        if (call.op != Op::varFieldGet && call.op != Op::varFieldPut && call.op != Op::read)
            all.push_back(call.text);
    }
    return all;
}

std::vector<Message> written() {
    const Lock lock(state().lock);
    return state().written;
}

void fail(Op op, unsigned times, unsigned after) {
    const Lock lock(state().lock);
    state().faults[op] = {after, times};
}

void leaveOffsetsAtZero() {
    State& s = state();
    const Lock lock(s.lock);
    s.offsetsStayZero = true;
}

void leaveFirstOffsetAtZero(bool on) {
    const Lock lock(state().lock);
    state().firstOffsetStaysZero = on;
}

void truncateBodies(std::size_t octets) {
    const Lock lock(state().lock);
    state().mostOctets = octets;
}

void onWrite(std::function<void(const Message&)> script) {
    const Lock lock(state().lock);
    state().script = std::move(script);
}

bool deliver(const Message& message) {
    State& s = state();
    const Lock lock(s.lock);
    Queue* const queue = boundTo(s, message.target);
    if (queue == nullptr)
        return false;
    NvMsg32Bit* const msg = newBuffer(s, static_cast<std::uint32_t>(message.body.size()));
    fill(msg, message);
    enqueue(s, *queue, msg);
    return true;
}

void nextHostAddress(NvCompDesc address) {
    const Lock lock(state().lock);
    state().nextHost = address;
}

namespace {

template <typename Condition>
bool waitFor(Condition condition) {
    State& s = state();
    Lock lock(s.lock);
    return s.changed.wait_for(lock, std::chrono::seconds(30), [&] { return condition(s); });
}

}  // namespace

bool waitForCalls(Op op, std::size_t calls) {
    return waitFor([=](State& s) {
        return static_cast<std::size_t>(std::count_if(s.calls.begin(), s.calls.end(), [op](const Call& call) {
                   return call.op == op;
               })) >= calls;
    });
}

bool waitForIdleReader() {
    return waitFor([](State& s) {
        unsigned readers = 0;
        for (const auto& [handle, queue] : s.queues) {
            if (!queue.pending.empty())
                return false;
            readers += queue.readers;
        }
        return readers > 0;
    });
}

std::size_t outstanding() {
    const Lock lock(state().lock);
    const auto& buffers = state().buffers;
    return static_cast<std::size_t>(std::count_if(
        buffers.begin(), buffers.end(), [](const auto& entry) { return !entry.second.withLibrary; }));
}

std::size_t openQueues() {
    const Lock lock(state().lock);
    return state().queues.size();
}

std::vector<std::string> misuses() {
    const Lock lock(state().lock);
    return state().misuses;
}

}  // namespace fake_norv
