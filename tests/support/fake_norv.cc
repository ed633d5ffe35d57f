#include "tests/support/fake_norv.h"

#include <algorithm>
#include <chrono>
#include <condition_variable>
#include <cstdarg>
#include <cstdlib>
#include <cstring>
#include <deque>
#include <map>
#include <mutex>
#include <sstream>
#include <utility>

namespace fake_norv {
namespace {

constexpr std::uint32_t Done = NVSTATUS_OK;
constexpr std::uint32_t Failed = NVSTATUS_ERROR;
constexpr std::uint32_t FirstQueue = 100;
constexpr NvCompDesc FirstHost{0x1001, 9, 0, 8, 7, 6, 0};

struct Fault {
    unsigned after = 0;
    unsigned times = 0;
};

struct Buffer {
    bool withLibrary = false;
    std::map<std::uint32_t, std::uint32_t> fixedFields;
};

struct Queue {
    bool bound = false;
    NvCompDesc address{};
    std::deque<NvMsg32Bit*> pending;
    unsigned readers = 0;  // blocked in nvMsgRead
};

struct State {
    std::mutex lock;
    std::condition_variable changed;
    std::vector<Call> calls;
    std::vector<Message> written;
    std::vector<std::string> misuses;
    std::map<Op, Fault> faults;
    std::map<NvMsg32Bit*, Buffer> buffers;
    std::map<std::uint32_t, Queue> queues;
    std::function<void(const Message&)> script;
    std::size_t mostOctets = SIZE_MAX;
    bool firstOffsetStaysZero = false;
    std::uint32_t nextQueue = FirstQueue;
    NvCompDesc nextHost = FirstHost;
};

State& state() {
    static State theState;
    return theState;
}

using Lock = std::unique_lock<std::mutex>;

bool same(NvCompDesc a, NvCompDesc b) {
    return a.instance == b.instance && a.board == b.board && a.processor == b.processor &&
           a.component == b.component && a.node == b.node;
}

std::uint8_t* octets(NvMsg32Bit* msg) { return reinterpret_cast<std::uint8_t*>(msg); }

// ---- With the state's lock held.

template <typename... Parts>
std::string text(const Parts&... parts) {
    std::ostringstream out;
    (out << ... << parts);
    return out.str();
}

std::string hex(std::uint32_t value) {
    std::ostringstream out;
    out << "0x" << std::hex << value;
    return out.str();
}

std::uint32_t record(State& s, Call call) {
    const std::uint32_t status = call.status;
    s.calls.push_back(std::move(call));
    s.changed.notify_all();
    return status;
}

void misuse(State& s, const std::string& what) { s.misuses.push_back(what); }

bool fails(State& s, Op op) {
    const auto found = s.faults.find(op);
    if (found == s.faults.end() || found->second.times == 0)
        return false;
    if (found->second.after > 0) {
        --found->second.after;
        return false;
    }
    --found->second.times;
    return true;
}

NvMsg32Bit* newBuffer(State& s, std::uint32_t size) {
    const std::size_t whole = std::size_t{size} + NVMSG_OVERHEAD;
    auto* const msg = static_cast<NvMsg32Bit*>(std::calloc(1, whole));
    if (msg == nullptr)
        return nullptr;
    msg->transaction = LowOctet;
    msg->size = size;
    std::fill(octets(msg) + NVMSG_HEADER_SIZE + size, octets(msg) + whole, TailOctet);
    s.buffers[msg] = Buffer();
    return msg;
}

void release(State& s, NvMsg32Bit* msg) {
    s.buffers.erase(msg);
    std::free(msg);
}

// The caller's own buffer, or null and a note.
Buffer* callersBuffer(State& s, NvMsg32Bit* msg, const char* function) {
    const auto found = s.buffers.find(msg);
    if (found == s.buffers.end())
        misuse(s, text(function, ": a buffer that is not allocated"));
    else if (found->second.withLibrary)
        misuse(s, text(function, ": a buffer that the library holds"));
    else
        return &found->second;
    return nullptr;
}

Queue* openQueue(State& s, std::uint32_t handle, const char* function) {
    const auto found = s.queues.find(handle);
    if (found == s.queues.end()) {
        misuse(s, text(function, ": no queue ", handle));
        return nullptr;
    }
    return &found->second;
}

Queue* boundTo(State& s, NvCompDesc address) {
    for (auto& [handle, queue] : s.queues) {
        if (queue.bound && same(queue.address, address))
            return &queue;
    }
    return nullptr;
}

Message seen(NvMsg32Bit* msg) {
    Message message;
    message.transaction = msg->transaction >> 8;
    message.type = msg->type;
    message.source = {msg->sourceInstance,  msg->sourceBoard, 0, msg->sourceProcessor,
                      msg->sourceComponent, msg->sourceNode,  0};
    message.target = {msg->targetInstance,  msg->targetBoard, 0, msg->targetProcessor,
                      msg->targetComponent, msg->targetNode,  0};
    const std::uint8_t* const body = octets(msg) + NVMSG_HEADER_SIZE;
    message.body.assign(body, body + msg->size);
    return message;
}

void fill(NvMsg32Bit* msg, const Message& from) {
    msg->transaction = (from.transaction << 8) | LowOctet;
    msg->type = from.type;
    msg->sourceInstance = from.source.instance;
    msg->sourceBoard = from.source.board;
    msg->sourceProcessor = from.source.processor;
    msg->sourceComponent = from.source.component;
    msg->sourceNode = from.source.node;
    msg->targetInstance = from.target.instance;
    msg->targetBoard = from.target.board;
    msg->targetProcessor = from.target.processor;
    msg->targetComponent = from.target.component;
    msg->targetNode = from.target.node;
    std::copy(from.body.begin(), from.body.end(), octets(msg) + NVMSG_HEADER_SIZE);
}

void enqueue(State& s, Queue& queue, NvMsg32Bit* msg) {
    s.buffers[msg].withLibrary = true;
    msg->size = static_cast<std::uint32_t>(std::min<std::size_t>(msg->size, s.mostOctets));
    queue.pending.push_back(msg);
    s.changed.notify_all();
}

// ---- Body fields.

std::size_t elementSize(std::uint32_t descriptor) {
    switch (descriptor >> 19 & 0x1F) {
        case 0:
        case 4:
        case 10:
            return 1;
        case 1:
        case 5:
            return 2;
        default:
            return 4;
    }
}

struct Field {
    std::uint32_t descriptor;
    void* storage;

    std::size_t size() const { return elementSize(descriptor) * ((descriptor >> 11 & 0xFF) + 1); }
};

std::vector<Field> fieldsOf(std::uint32_t count, va_list list) {
    std::vector<Field> fields;
    for (std::uint32_t i = 0; i < count; ++i) {
        // NOLINTNEXTLINE(clang-analyzer-valist.Uninitialized): the callers start it
        const std::uint32_t descriptor = va_arg(list, std::uint32_t);
        fields.push_back({descriptor, va_arg(list, void*)});
    }
    return fields;
}

// Moves the fields that lie in the body whole; the first one that does not ends it. The host and the wire are
// both little-endian.
template <typename Move>
std::uint32_t moveFields(State& s, Op op, NvMsg32Bit* msg, std::uint32_t* offset,
                         const std::vector<Field>& fields, Move move) {
    const char* const name = op == Op::VarFieldGet ? "nvMsgVarFieldGet" : "nvMsgVarFieldPut";
    Call call{op, name, Done, static_cast<std::uint32_t>(fields.size()), {}, *offset};
    if (callersBuffer(s, msg, name) == nullptr || fails(s, op))
        call.status = Failed;
    std::size_t at = *offset;
    for (const Field& field : fields) {
        call.descriptors.push_back(field.descriptor);
        if (call.status != Done || at + field.size() > msg->size) {
            call.status = Failed;
            continue;
        }
        move(octets(msg) + NVMSG_HEADER_SIZE + at, field);
        at += field.size();
    }
    if (!(s.firstOffsetStaysZero && *offset == 0))
        *offset = static_cast<std::uint32_t>(at);
    return record(s, std::move(call));
}

}  // namespace

// ---- The test's side.

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
    s.nextQueue = FirstQueue;
    s.nextHost = FirstHost;
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
        if (call.op != Op::VarFieldGet && call.op != Op::VarFieldPut && call.op != Op::Read)
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

// ---- The library's side.

using namespace fake_norv;  // NOLINT(google-build-using-namespace): the functions below are part of it

uint32_t nvDrvSetInterface(uint32_t a, uint32_t b) {
    State& s = state();
    const Lock lock(s.lock);
    const uint32_t status = fails(s, Op::SetInterface) ? Failed : Done;
    return record(s, {Op::SetInterface, text("nvDrvSetInterface(", a, ", ", b, ")"), status});
}

uint32_t nvMsgAllocate(uint32_t size, NvMsg32Bit** msg) {
    State& s = state();
    const Lock lock(s.lock);
    NvMsg32Bit* const fresh = fails(s, Op::Allocate) ? nullptr : newBuffer(s, size);
    if (fresh != nullptr)
        *msg = fresh;
    const uint32_t status = fresh == nullptr ? Failed : Done;
    return record(s, {Op::Allocate, text("nvMsgAllocate(", size, ")"), status});
}

uint32_t nvMsgReallocate(uint32_t size, NvMsg32Bit** msg) {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t status = Failed;
    if (callersBuffer(s, *msg, "nvMsgReallocate") != nullptr && !fails(s, Op::Reallocate)) {
        NvMsg32Bit* const grown = newBuffer(s, size);
        std::memcpy(octets(grown), octets(*msg), NVMSG_HEADER_SIZE + std::min(size, (*msg)->size));
        grown->size = size;
        release(s, *msg);
        *msg = grown;
        status = Done;
    }
    return record(s, {Op::Reallocate, text("nvMsgReallocate(", size, ")"), status});
}

uint32_t nvMsgFree(NvMsg32Bit* msg) {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t status = Failed;
    if (callersBuffer(s, msg, "nvMsgFree") != nullptr) {
        release(s, msg);
        status = fails(s, Op::Free) ? Failed : Done;
    }
    return record(s, {Op::Free, "nvMsgFree()", status});
}

// The library's fixed fields are its own affair: 32 bits under each index, 0 until put.
uint32_t nvMsgFieldGet(NvMsg32Bit* msg, uint32_t index, void* value) {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t status = Failed;
    Buffer* const buffer = callersBuffer(s, msg, "nvMsgFieldGet");
    if (buffer != nullptr && !fails(s, Op::FieldGet)) {
        std::memcpy(value, &buffer->fixedFields[index], sizeof(uint32_t));
        status = Done;
    }
    return record(s, {Op::FieldGet, text("nvMsgFieldGet(", index, ")"), status});
}

uint32_t nvMsgFieldPut(NvMsg32Bit* msg, uint32_t index, void* value) {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t status = Failed;
    Buffer* const buffer = callersBuffer(s, msg, "nvMsgFieldPut");
    if (buffer != nullptr && !fails(s, Op::FieldPut)) {
        std::memcpy(&buffer->fixedFields[index], value, sizeof(uint32_t));
        status = Done;
    }
    return record(s, {Op::FieldPut, text("nvMsgFieldPut(", index, ")"), status});
}

uint32_t nvMsgVarFieldGet(NvMsg32Bit* msg, uint32_t count, uint32_t* offset, ...) {
    va_list list;
    va_start(list, offset);
    const std::vector<Field> fields = fieldsOf(count, list);
    va_end(list);
    const Lock lock(state().lock);
    return moveFields(
        state(), Op::VarFieldGet, msg, offset, fields,
        [](const uint8_t* body, const Field& field) { std::memcpy(field.storage, body, field.size()); });
}

uint32_t nvMsgVarFieldPut(NvMsg32Bit* msg, uint32_t count, uint32_t* offset, ...) {
    va_list list;
    va_start(list, offset);
    const std::vector<Field> fields = fieldsOf(count, list);
    va_end(list);
    const Lock lock(state().lock);
    return moveFields(state(), Op::VarFieldPut, msg, offset, fields, [](uint8_t* body, const Field& field) {
        std::memcpy(body, field.storage, field.size());
    });
}

uint32_t nvQueueOpen() {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t handle = Failed;
    if (!fails(s, Op::Open)) {
        handle = s.nextQueue++;
        s.queues[handle] = Queue();
    }
    return record(s, {Op::Open, "nvQueueOpen()", handle});
}

uint32_t nvQueueBind(uint32_t handle, NvCompDesc* host) {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t status = Failed;
    Queue* const queue = openQueue(s, handle, "nvQueueBind");
    if (queue != nullptr && !fails(s, Op::Bind)) {
        queue->bound = true;
        queue->address = *host = s.nextHost;
        ++s.nextHost.instance;
        status = Done;
    }
    return record(s, {Op::Bind, text("nvQueueBind(", handle, ")"), status});
}

uint32_t nvQueueUnbind(uint32_t handle, NvCompDesc host) {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t status = Failed;
    Queue* const queue = openQueue(s, handle, "nvQueueUnbind");
    if (queue != nullptr && !(queue->bound && same(queue->address, host)))
        misuse(s, "nvQueueUnbind: not the address of the queue");
    else if (queue != nullptr && !fails(s, Op::Unbind)) {
        queue->bound = false;
        status = Done;
    }
    return record(s, {Op::Unbind, text("nvQueueUnbind(", handle, ", ", hex(host.instance), ")"), status});
}

// What is left in the queue goes with it; a reader blocked there returns.
uint32_t nvQueueClose(uint32_t handle) {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t status = Failed;
    Queue* const queue = openQueue(s, handle, "nvQueueClose");
    if (queue != nullptr && !fails(s, Op::Close)) {
        for (NvMsg32Bit* const msg : queue->pending)
            release(s, msg);
        s.queues.erase(handle);
        status = Done;
    }
    return record(s, {Op::Close, text("nvQueueClose(", handle, ")"), status});
}

uint32_t nvMsgRead(uint32_t handle, uint32_t zero, NvMsg32Bit** msg) {
    State& s = state();
    Lock lock(s.lock);
    const auto read = [&](uint32_t status) {
        return record(s, {Op::Read, text("nvMsgRead(", handle, ", ", zero, ")"), status});
    };
    if (openQueue(s, handle, "nvMsgRead") == nullptr || fails(s, Op::Read))
        return read(Failed);
    ++s.queues[handle].readers;
    s.changed.notify_all();
    s.changed.wait(lock, [&] {
        const auto found = s.queues.find(handle);
        return found == s.queues.end() || !found->second.pending.empty();
    });
    const auto found = s.queues.find(handle);
    if (found == s.queues.end())
        return read(Failed);
    Queue& queue = found->second;
    --queue.readers;
    *msg = queue.pending.front();
    queue.pending.pop_front();
    s.buffers[*msg].withLibrary = false;
    return read(Done);
}

uint32_t nvMsgWrite(uint32_t handle, NvMsg32Bit* msg, uint32_t /*zero*/) {
    State& s = state();
    Lock lock(s.lock);
    if (openQueue(s, handle, "nvMsgWrite") == nullptr || callersBuffer(s, msg, "nvMsgWrite") == nullptr)
        return record(s, {Op::Write, "nvMsgWrite()", Failed});
    const Message message = seen(msg);
    const bool lost = fails(s, Op::Write);
    Queue* const queue = lost ? nullptr : boundTo(s, message.target);
    if (queue != nullptr)
        enqueue(s, *queue, msg);
    else
        release(s, msg);
    s.written.push_back(message);
    const std::uint32_t status = record(
        s, {Op::Write, text("nvMsgWrite(", handle, ", type ", hex(message.type), ")"), lost ? Failed : Done});
    const std::function<void(const Message&)> script = s.script;
    lock.unlock();
    if (script && !lost)
        script(message);
    return status;
}
