// The functions of norv/norv.h. Each checks its arguments, reports misuse, and calls the network.
#include <cstdarg>
#include <cstdint>
#include <cstring>

#include "softboard/abi.h"
#include "softboard/fields.h"
#include "softboard/misuse.h"
#include "softboard/process.h"

namespace {

using softboard::misuse;
using softboard::network;

// No message is this long, so an offset beyond it is misuse.
constexpr uint32_t wildOffset = softboard::Buffers::largestBody;

std::span<uint8_t> bodyOf(const char* function, NvMsg32Bit* msg) {
    const uint32_t size = network().buffers().bodySize(function, msg);
    return {reinterpret_cast<uint8_t*>(msg) + NVMSG_HEADER_SIZE, size};
}

void checkOffset(const char* function, const uint32_t* offset, size_t limit) {
    if (offset == nullptr) {
        misuse(function, "a null pointer instead of an offset");
    }
    if (*offset > limit) {
        misuse(function, "offset " + std::to_string(*offset) + " is past the message");
    }
}

void checkStorage(const char* function, const void* storage) {
    if (storage == nullptr) {
        misuse(function, "a null pointer instead of a field's storage");
    }
}

// Goes over the pairs of descriptor and storage in `fields`. `move` moves one field and returns whether the
// body holds it. Returns NVSTATUS_ERROR when a field was missing.
template <class Move>
uint32_t moveFields(const char* function, uint32_t count, va_list fields, Move move) {
    uint32_t status = NVSTATUS_OK;
    for (; count > 0; --count) {
        const uint32_t descriptor = va_arg(fields, uint32_t);
        void* storage = va_arg(fields, void*);
        checkStorage(function, storage);
        if (!move(descriptor, storage)) {
            status = NVSTATUS_ERROR;
        }
    }
    return status;
}

void advance(uint32_t& offset, uint32_t to) {
    if (offset != 0 || !network().leavesOffset()) {
        offset = to;
    }
}

}  // namespace

uint32_t nvDrvSetInterface(uint32_t /*unused*/, uint32_t /*unused*/) {
    network();
    return NVSTATUS_OK;
}

uint32_t nvMsgAllocate(uint32_t size, NvMsg32Bit** msg) {
    checkStorage("nvMsgAllocate", msg);
    NvMsg32Bit* made = network().allocate(size);
    if (made == nullptr) {
        return NVSTATUS_ERROR;
    }
    *msg = made;
    return NVSTATUS_OK;
}

uint32_t nvMsgReallocate(uint32_t size, NvMsg32Bit** msg) {
    checkStorage("nvMsgReallocate", msg);
    NvMsg32Bit* made = network().buffers().reallocate("nvMsgReallocate", *msg, size);
    if (made == nullptr) {
        return NVSTATUS_ERROR;
    }
    *msg = made;
    return NVSTATUS_OK;
}

uint32_t nvMsgFree(NvMsg32Bit* msg) {
    network().buffers().free("nvMsgFree", msg);
    return NVSTATUS_OK;
}

// A fixed field is a 32-bit word of the body; `index` counts words.
uint32_t nvMsgFieldGet(NvMsg32Bit* msg, uint32_t index, void* value) {
    const auto body = bodyOf("nvMsgFieldGet", msg);
    checkStorage("nvMsgFieldGet", value);
    if (index >= body.size() / sizeof(uint32_t)) {
        return NVSTATUS_ERROR;
    }
    std::memcpy(value, body.data() + index * sizeof(uint32_t), sizeof(uint32_t));
    return NVSTATUS_OK;
}

uint32_t nvMsgFieldPut(NvMsg32Bit* msg, uint32_t index, void* value) {
    const auto body = bodyOf("nvMsgFieldPut", msg);
    checkStorage("nvMsgFieldPut", value);
    if (index >= body.size() / sizeof(uint32_t)) {
        return NVSTATUS_ERROR;
    }
    std::memcpy(body.data() + index * sizeof(uint32_t), value, sizeof(uint32_t));
    return NVSTATUS_OK;
}

// A body may end before the fields that are asked for. The storage of such a field is left unchanged.
uint32_t nvMsgVarFieldGet(NvMsg32Bit* msg, uint32_t count, uint32_t* offset, ...) {
    const auto body = bodyOf("nvMsgVarFieldGet", msg);
    checkOffset("nvMsgVarFieldGet", offset, wildOffset);
    uint32_t at = *offset;
    va_list fields;
    va_start(fields, offset);
    const uint32_t status = moveFields("nvMsgVarFieldGet", count, fields, [&](uint32_t descriptor, void* to) {
        return softboard::getField(body, at, descriptor, to);
    });
    va_end(fields);
    advance(*offset, at);
    return status;
}

uint32_t nvMsgVarFieldPut(NvMsg32Bit* msg, uint32_t count, uint32_t* offset, ...) {
    const auto body = bodyOf("nvMsgVarFieldPut", msg);
    checkOffset("nvMsgVarFieldPut", offset, body.size());
    uint32_t at = *offset;
    va_list fields;
    va_start(fields, offset);
    const uint32_t status = moveFields(
        "nvMsgVarFieldPut", count, fields,
        [&](uint32_t descriptor, void* from) { return softboard::putField(body, at, descriptor, from); });
    va_end(fields);
    advance(*offset, at);
    return status;
}

uint32_t nvQueueOpen(void) {
    softboard::sayThatBoardsAreSimulated();
    return network().openQueue();
}

uint32_t nvQueueBind(uint32_t queue, NvCompDesc* host) {
    checkStorage("nvQueueBind", host);
    return network().bindQueue(queue, *host);
}

uint32_t nvQueueUnbind(uint32_t queue, NvCompDesc host) {
    network().unbindQueue(queue, host);
    return NVSTATUS_OK;
}

uint32_t nvQueueClose(uint32_t queue) {
    network().closeQueue(queue);
    return NVSTATUS_OK;
}

uint32_t nvMsgRead(uint32_t queue, uint32_t /*zero*/, NvMsg32Bit** msg) {
    checkStorage("nvMsgRead", msg);
    NvMsg32Bit* arrived = network().read(queue);
    if (arrived == nullptr) {
        return NVSTATUS_ERROR;
    }
    *msg = arrived;
    return NVSTATUS_OK;
}

uint32_t nvMsgWrite(uint32_t queue, NvMsg32Bit* msg, uint32_t /*zero*/) {
    network().write(queue, msg);
    return NVSTATUS_OK;
}
