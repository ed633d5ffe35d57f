// The state of the scripted transport library, and what both of its sources do with it. Only they include
// this header.
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

inline constexpr std::uint32_t done = NVSTATUS_OK;
inline constexpr std::uint32_t failed = NVSTATUS_ERROR;
inline constexpr std::uint32_t firstQueue = 100;
inline constexpr NvCompDesc firstHost{0x1001, 9, 0, 8, 7, 6, 0};

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
    bool offsetsStayZero = false;
    std::uint32_t nextQueue = firstQueue;
    NvCompDesc nextHost = firstHost;
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

// ---- Call these functions with the state's lock held.

// Records the call and returns its status.
std::uint32_t record(State& s, Call call);
void misuse(State& s, const std::string& what);
// Whether this call of op is to fail. Counts the call.
bool fails(State& s, Op op);

NvMsg32Bit* newBuffer(State& s, std::uint32_t size);
void release(State& s, NvMsg32Bit* msg);
// The buffer, which must belong to the caller. Otherwise records a misuse and returns null.
Buffer* callersBuffer(State& s, NvMsg32Bit* msg, const char* function);

Queue* openQueue(State& s, std::uint32_t handle, const char* function);
Queue* boundTo(State& s, NvCompDesc address);
void enqueue(State& s, Queue& queue, NvMsg32Bit* msg);

Message seen(NvMsg32Bit* msg);
void fill(NvMsg32Bit* msg, const Message& from);

}  // namespace fake_norv

#endif
