// A scripted transport library for tests. It offers every nv* function, records each call, and answers as the
// test says. Link it in place of libnorv.
//
// Buffers and queues work as in the real library, and messages to a host queue arrive there. There is no
// board: a script of the test answers commands (onWrite). Misuse, for example a buffer that is freed twice or
// an unknown queue, does not end the process; misuses() lists it.
//
// Any thread may call any function.
#ifndef TESTS_SUPPORT_FAKE_NORV_H
#define TESTS_SUPPORT_FAKE_NORV_H

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "norv/norv.h"

namespace fake_norv {

// The names of the transport's functions in records and faults.
enum class Op {
    setInterface,
    allocate,
    reallocate,
    free,
    fieldGet,
    fieldPut,
    varFieldGet,
    varFieldPut,
    open,
    bind,
    unbind,
    close,
    read,
    write
};

// What a new buffer holds for the library's own use: the low octet of the transaction word, and each of the
// 24 octets after the body.
inline constexpr std::uint8_t lowOctet = 0x5A;
inline constexpr std::uint8_t tailOctet = 0xE7;

// A message as scripts see it.
struct Message {
    std::uint32_t transaction = 0;  // 24 bits
    std::uint32_t type = 0;
    NvCompDesc source{};
    NvCompDesc target{};
    std::vector<std::uint8_t> body;
};

// The reply to a command: source and target are exchanged, and the transaction is the same.
Message replyTo(const Message& command, std::uint32_t type, std::vector<std::uint8_t> body = {});

// The octets of a body that consists of these 32-bit words, little-endian.
std::vector<std::uint8_t> words(const std::vector<std::uint32_t>& values);

// One call of the library, as text with its arguments: "nvQueueBind(100)", "nvMsgAllocate(16)",
// "nvMsgWrite(100, type 0x8)".
struct Call {
    Op op{};
    std::string text;
    std::uint32_t status = 0;  // the status that it returned
    // Of VarField calls only: the number of fields, the descriptor of each, and the offset before the call.
    std::uint32_t count = 0;
    std::vector<std::uint32_t> descriptors{};
    std::uint32_t offset = 0;
};

// Forgets everything: records, faults, modes, scripts, queues and buffers. Call it first in each test, while
// no other thread uses the transport.
void reset();

// ---- What was called.
std::vector<Call> calls();
std::vector<Call> calls(Op op);
std::size_t count(Op op);
std::vector<std::string> texts();  // of calls(), without the VarField calls and reads
// The messages that were written, oldest first, including those that a host writes to its own queue.
std::vector<Message> written();

// ---- Faults. After `after` more calls of op that succeed, the next `times` calls fail. An Allocate that
// fails leaves the pointer null. A Reallocate that fails does so too, and the caller keeps the buffer. A
// Write that fails takes the buffer and loses the message.
void fail(Op op, unsigned times = 1, unsigned after = 0);
// From now on the first VarField call on a body moves the data but leaves the offset at 0.
void leaveFirstOffsetAtZero(bool on = true);
// From now on every VarField call moves the data and ends with an offset of 0.
void leaveOffsetsAtZero();
// From now on the bodies of messages that reach a queue are cut to this many octets.
void truncateBodies(std::size_t octets);

// ---- The board's side. Sets the function that is called for each nvMsgWrite that succeeds, on the writer's
// thread and before nvMsgWrite returns. It may call deliver().
void onWrite(std::function<void(const Message&)> script);
// Puts a message into the queue that is bound to its target. Returns false when there is none.
bool deliver(const Message& message);
// Sets the address that the next bound queue gets. Each later queue gets the next instance.
void nextHostAddress(NvCompDesc address);

// ---- Waiting. Each function returns false after half a minute.

// Waits until op has been called so many times.
bool waitForCalls(Op op, std::size_t calls);
// Waits until a thread is blocked in nvMsgRead and all queues are empty.
bool waitForIdleReader();

// ---- Buffers and queues.
std::size_t outstanding();  // buffers that callers own: not freed, and not handed over to the library
std::size_t openQueues();
std::vector<std::string> misuses();

}  // namespace fake_norv

#endif
