// What the scripted transport library knows, and what both of its sides do with it. For its own sources
// alone.
#ifndef TESTS_SUPPORT_FAKE_NORV_STATE_H
#define TESTS_SUPPORT_FAKE_NORV_STATE_H

#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <deque>
#include <functional>
#include <map>
#include <mutex>
#include <sstream>
#include <string>
#include <vector>

#include "tests/support/fake_norv.h"

namespace fake_norv {

inline constexpr std::uint32_t Done = NVSTATUS_OK;
inline constexpr std::uint32_t Failed = NVSTATUS_ERROR;
inline constexpr std::uint32_t FirstQueue = 100;
inline constexpr NvCompDesc FirstHost{0x1001, 9, 0, 8, 7, 6, 0};

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

State& state();

using Lock = std::unique_lock<std::mutex>;

bool same(NvCompDesc a, NvCompDesc b);

inline std::uint8_t* octets(NvMsg32Bit* msg) { return reinterpret_cast<std::uint8_t*>(msg); }

template <typename... Parts>
std::string text(const Parts&... parts) {
    std::ostringstream out;
    (out << ... << parts);
    return out.str();
}
std::string hex(std::uint32_t value);

// ---- With the state's lock held.

// Notes the call; its status.
std::uint32_t record(State& s, Call call);
void misuse(State& s, const std::string& what);
// Whether this call is one that was told to fail.
bool fails(State& s, Op op);

NvMsg32Bit* newBuffer(State& s, std::uint32_t size);
void release(State& s, NvMsg32Bit* msg);
// The caller's own buffer, or null and a note.
Buffer* callersBuffer(State& s, NvMsg32Bit* msg, const char* function);

Queue* openQueue(State& s, std::uint32_t handle, const char* function);
Queue* boundTo(State& s, NvCompDesc address);
void enqueue(State& s, Queue& queue, NvMsg32Bit* msg);

Message seen(NvMsg32Bit* msg);
void fill(NvMsg32Bit* msg, const Message& from);

}  // namespace fake_norv

#endif
