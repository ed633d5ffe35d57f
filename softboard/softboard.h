// Controls the software board from inside its process. Tests set it up, watch it and wait for it with these
// functions.
//
// Any thread may call any function. A function that waits returns false when `limit` has passed.
#ifndef SOFTBOARD_SOFTBOARD_H
#define SOFTBOARD_SOFTBOARD_H

#include <chrono>
#include <cstdint>
#include <string>
#include <vector>

#include "norv/norv.h"
#include "softboard/scenario.h"

#pragma GCC visibility push(default)
namespace softboard {

constexpr std::chrono::milliseconds longEnough{20000};

// Replaces the boards by those of the scenario, with no subscriptions and no trace switched on, and empties
// the journal. The host's queues and buffers stay.
void reset(const Scenario& scenario);

// Replaces the faults; the boards stay as they are. The counts of the new faults begin at 1.
void setFaults(const std::vector<Fault>& faults);

// The journal: every message so far, a line each (docs/user/softboard.md gives the form).
std::string journal();
// Only the messages that the host has sent to boards, a line each: "8 {Parm 10 Val 1}\n".
std::string heard();
void clearJournal();
// Waits until `count` messages of the type were sent since the journal was cleared.
bool waitForMessages(uint32_t type, size_t count, std::chrono::milliseconds limit = longEnough);

// How many message buffers are not freed yet, those that wait in a queue included.
size_t outstanding();
// Waits until outstanding() is `count`.
bool waitForOutstanding(size_t count, std::chrono::milliseconds limit = longEnough);
size_t openQueues();
// "buffers outstanding N, queues open M".
std::string balance();

// Delivers a message to the host queue with the address `target`, as if `source` had sent it. Returns false
// when there is no such queue.
bool send(uint32_t type, const NvCompDesc& source, const NvCompDesc& target, const std::vector<uint8_t>& body,
          uint32_t transaction = 0);

}  // namespace softboard
#pragma GCC visibility pop

#endif
