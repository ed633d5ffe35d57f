// A transport library for tests: every nv* function, scripted and recorded. Link it in place of libnorv.
//
// Buffers, queues and loop-back work as the real thing does; a board is whatever the test's script answers.
// Misuse (a buffer freed twice or not the caller's, an unknown queue) is noted, not fatal: see misuses().
#ifndef TESTS_SUPPORT_FAKE_NORV_H
#define TESTS_SUPPORT_FAKE_NORV_H

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "norv/norv.h"

namespace fake_norv {

// The transport's functions, as the recorder and the faults name them.
enum class Op {
    SetInterface,
    Allocate,
    Reallocate,
    Free,
    FieldGet,
    FieldPut,
    VarFieldGet,
    VarFieldPut,
    Open,
    Bind,
    Unbind,
    Close,
    Read,
    Write
};

// Word 0's low octet in a new buffer, and what the 24 octets after the body hold: the library's own.
inline constexpr std::uint8_t LowOctet = 0x5A;
inline constexpr std::uint8_t TailOctet = 0xE7;

// A message as scripts see it.
struct Message {
    std::uint32_t transaction = 0;  // 24 bits
    std::uint32_t type = 0;
    NvCompDesc source{};
    NvCompDesc target{};
    std::vector<std::uint8_t> body;
};

// The answer to a command: back to its source, with its transaction.
Message replyTo(const Message& command, std::uint32_t type, std::vector<std::uint8_t> body = {});

// 32-bit words, little-endian, as body octets.
std::vector<std::uint8_t> words(const std::vector<std::uint32_t>& values);

// One call, with its arguments: "nvQueueBind(100)", "nvMsgAllocate(16)", "nvMsgWrite(100, type 0x8)".
struct Call {
    Op op{};
    std::string text;
    std::uint32_t status = 0;  // what it returned
    // VarField calls: the count, one descriptor a field, and the offset that the call was given.
    std::uint32_t count = 0;
    std::vector<std::uint32_t> descriptors{};
    std::uint32_t offset = 0;
};

// Forgets everything: records, faults, modes, scripts, queues and buffers. First thing in each test, while no
// other thread uses the transport.
void reset();

// ---- What was called.
std::vector<Call> calls();
std::vector<Call> calls(Op op);
std::size_t count(Op op);
std::vector<std::string> texts();  // of calls(), without the VarField calls and reads
// The messages written, oldest first; a wake-up or loop-back is among them.
std::vector<Message> written();

// ---- Faults.
// After `after` more calls of op that work, `times` calls fail. Allocate leaves the pointer null, as does
// Reallocate, whose buffer stays the caller's; Write takes the buffer over and loses it.
void fail(Op op, unsigned times = 1, unsigned after = 0);
// The first VarField call on a body leaves the offset at 0, while the data moves.
void leaveFirstOffsetAtZero(bool on = true);
// Messages that reach a queue have their bodies cut to this many octets.
void truncateBodies(std::size_t octets);

// ---- The board's side.
// Called on the writer's thread for each nvMsgWrite, before it returns; may deliver messages.
void onWrite(std::function<void(const Message&)> script);
// Puts a message into the queue bound to its target; false when there is none.
bool deliver(const Message& message);
// The address that the next queue bound gets; later ones count its instance up.
void nextHostAddress(NvCompDesc address);

// ---- Events to wait for. All return false after half a minute.
bool waitForCalls(Op op, std::size_t calls);
// A reader is blocked in nvMsgRead, and nothing is left in any queue.
bool waitForIdleReader();

// ---- Buffers and queues.
std::size_t outstanding();  // buffers that callers hold: neither freed nor with the library
std::size_t openQueues();
std::vector<std::string> misuses();

}  // namespace fake_norv

#endif
