// The library's side of the scripted transport library.
#include <algorithm>
#include <cstdarg>
#include <cstring>
#include <functional>
#include <utility>

#include "tests/support/body_fields.h"
#include "tests/support/fake_norv_state.h"

using namespace fake_norv;  // NOLINT(google-build-using-namespace): the functions below are part of it
using body_fields::Field;
using body_fields::fieldsOf;

namespace {

// ---- Body fields.

// Moves fields until one is not wholly inside the body.
template <typename Move>
std::uint32_t moveFields(State& s, Op op, NvMsg32Bit* msg, std::uint32_t* offset,
                         const std::vector<Field>& fields, Move move) {
    const char* const name = op == Op::varFieldGet ? "nvMsgVarFieldGet" : "nvMsgVarFieldPut";
    Call call{op, name, done, static_cast<std::uint32_t>(fields.size()), {}, *offset};
    if (callersBuffer(s, msg, name) == nullptr || fails(s, op))
        call.status = failed;
    std::size_t at = *offset;
    for (const Field& field : fields) {
        call.descriptors.push_back(field.descriptor);
        if (call.status != done || at + field.size() > msg->size) {
            call.status = failed;
            continue;
        }
        std::invoke(move, field, octets(msg) + NVMSG_HEADER_SIZE + at);
        at += field.size();
    }
    if (s.offsetsStayZero)
        *offset = 0;
    else if (!(s.firstOffsetStaysZero && *offset == 0))
        *offset = static_cast<std::uint32_t>(at);
    return record(s, std::move(call));
}

}  // namespace

uint32_t nvDrvSetInterface(uint32_t a, uint32_t b) {
    State& s = state();
    const Lock lock(s.lock);
    const uint32_t status = fails(s, Op::setInterface) ? failed : done;
    return record(s, {Op::setInterface, text("nvDrvSetInterface(", a, ", ", b, ")"), status});
}

uint32_t nvMsgAllocate(uint32_t size, NvMsg32Bit** msg) {
    State& s = state();
    const Lock lock(s.lock);
    NvMsg32Bit* const fresh = fails(s, Op::allocate) ? nullptr : newBuffer(s, size);
    if (fresh != nullptr)
        *msg = fresh;
    const uint32_t status = fresh == nullptr ? failed : done;
    return record(s, {Op::allocate, text("nvMsgAllocate(", size, ")"), status});
}

uint32_t nvMsgReallocate(uint32_t size, NvMsg32Bit** msg) {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t status = failed;
    if (callersBuffer(s, *msg, "nvMsgReallocate") == nullptr) {
        // callersBuffer has recorded the misuse
    } else if (fails(s, Op::reallocate)) {
        *msg = nullptr;
    } else {
        NvMsg32Bit* const grown = newBuffer(s, size);
        std::memcpy(octets(grown), octets(*msg), NVMSG_HEADER_SIZE + std::min(size, (*msg)->size));
        grown->size = size;
        release(s, *msg);
        *msg = grown;
        status = done;
    }
    return record(s, {Op::reallocate, text("nvMsgReallocate(", size, ")"), status});
}

uint32_t nvMsgFree(NvMsg32Bit* msg) {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t status = failed;
    if (callersBuffer(s, msg, "nvMsgFree") != nullptr) {
        release(s, msg);
        status = fails(s, Op::free) ? failed : done;
    }
    return record(s, {Op::free, "nvMsgFree()", status});
}

// A fixed field is 32 bits under each index, 0 until it is put. It is kept apart from the body.
uint32_t nvMsgFieldGet(NvMsg32Bit* msg, uint32_t index, void* value) {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t status = failed;
    Buffer* const buffer = callersBuffer(s, msg, "nvMsgFieldGet");
    if (buffer != nullptr && !fails(s, Op::fieldGet)) {
        std::memcpy(value, &buffer->fixedFields[index], sizeof(uint32_t));
        status = done;
    }
    return record(s, {Op::fieldGet, text("nvMsgFieldGet(", index, ")"), status});
}

uint32_t nvMsgFieldPut(NvMsg32Bit* msg, uint32_t index, void* value) {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t status = failed;
    Buffer* const buffer = callersBuffer(s, msg, "nvMsgFieldPut");
    if (buffer != nullptr && !fails(s, Op::fieldPut)) {
        std::memcpy(&buffer->fixedFields[index], value, sizeof(uint32_t));
        status = done;
    }
    return record(s, {Op::fieldPut, text("nvMsgFieldPut(", index, ")"), status});
}

uint32_t nvMsgVarFieldGet(NvMsg32Bit* msg, uint32_t count, uint32_t* offset, ...) {
    va_list list;
    va_start(list, offset);
    const std::vector<Field> fields = fieldsOf(count, list);
    va_end(list);
    const Lock lock(state().lock);
    return moveFields(state(), Op::varFieldGet, msg, offset, fields, &Field::get);
}

uint32_t nvMsgVarFieldPut(NvMsg32Bit* msg, uint32_t count, uint32_t* offset, ...) {
    va_list list;
    va_start(list, offset);
    const std::vector<Field> fields = fieldsOf(count, list);
    va_end(list);
    const Lock lock(state().lock);
    return moveFields(state(), Op::varFieldPut, msg, offset, fields, &Field::put);
}

uint32_t nvQueueOpen() {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t handle = failed;
    if (!fails(s, Op::open)) {
        handle = s.nextQueue++;
        s.queues[handle] = Queue();
    }
    return record(s, {Op::open, "nvQueueOpen()", handle});
}

uint32_t nvQueueBind(uint32_t handle, NvCompDesc* host) {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t status = failed;
    Queue* const queue = openQueue(s, handle, "nvQueueBind");
    if (queue != nullptr && !fails(s, Op::bind)) {
        queue->bound = true;
        queue->address = *host = s.nextHost;
        ++s.nextHost.instance;
        status = done;
    }
    return record(s, {Op::bind, text("nvQueueBind(", handle, ")"), status});
}

uint32_t nvQueueUnbind(uint32_t handle, NvCompDesc host) {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t status = failed;
    Queue* const queue = openQueue(s, handle, "nvQueueUnbind");
    if (queue != nullptr && !(queue->bound && same(queue->address, host)))
        misuse(s, "nvQueueUnbind: not the address of the queue");
    else if (queue != nullptr && !fails(s, Op::unbind)) {
        queue->bound = false;
        status = done;
    }
    return record(s, {Op::unbind, text("nvQueueUnbind(", handle, ", ", hex(host.instance), ")"), status});
}

// Frees the messages that are left in the queue. A reader that is blocked in it returns.
uint32_t nvQueueClose(uint32_t handle) {
    State& s = state();
    const Lock lock(s.lock);
    uint32_t status = failed;
    Queue* const queue = openQueue(s, handle, "nvQueueClose");
    if (queue != nullptr && !fails(s, Op::close)) {
        for (NvMsg32Bit* const msg : queue->pending)
            release(s, msg);
        s.queues.erase(handle);
        status = done;
    }
    return record(s, {Op::close, text("nvQueueClose(", handle, ")"), status});
}

uint32_t nvMsgRead(uint32_t handle, uint32_t zero, NvMsg32Bit** msg) {
    State& s = state();
    Lock lock(s.lock);
    const auto read = [&](uint32_t status) {
        return record(s, {Op::read, text("nvMsgRead(", handle, ", ", zero, ")"), status});
    };
    if (openQueue(s, handle, "nvMsgRead") == nullptr || fails(s, Op::read))
        return read(failed);
    ++s.queues[handle].readers;
    s.changed.notify_all();
    s.changed.wait(lock, [&] {
        const auto found = s.queues.find(handle);
        return found == s.queues.end() || !found->second.pending.empty();
    });
    const auto found = s.queues.find(handle);
    if (found == s.queues.end())
        return read(failed);
    Queue& queue = found->second;
    --queue.readers;
    *msg = queue.pending.front();
    queue.pending.pop_front();
    s.buffers[*msg].withLibrary = false;
    return read(done);
}

uint32_t nvMsgWrite(uint32_t handle, NvMsg32Bit* msg, uint32_t /*zero*/) {
    State& s = state();
    Lock lock(s.lock);
    if (openQueue(s, handle, "nvMsgWrite") == nullptr || callersBuffer(s, msg, "nvMsgWrite") == nullptr)
        return record(s, {Op::write, "nvMsgWrite()", failed});
    const Message message = seen(msg);
    const bool lost = fails(s, Op::write);
    Queue* const queue = lost ? nullptr : boundTo(s, message.target);
    if (queue != nullptr)
        enqueue(s, *queue, msg);
    else
        release(s, msg);
    s.written.push_back(message);
    const std::uint32_t status = record(
        s, {Op::write, text("nvMsgWrite(", handle, ", type ", hex(message.type), ")"), lost ? failed : done});
    const std::function<void(const Message&)> script = s.script;
    lock.unlock();
    if (script && !lost)
        script(message);
    return status;
}
