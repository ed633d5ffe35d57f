// The software board from inside its process: what tests set up, watch and wait for.
//
// Every function may be called from any thread. Waits end with false after `limit`.
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

// Other boards, with nothing subscribed or switched on, and an empty journal. Queues and buffers stay.
void reset(const Scenario& scenario);

// Other faults from now on, on the boards as they are; what they count begins at 1.
void setFaults(const std::vector<Fault>& faults);

// Every message so far, a line each, and notes (docs/user/softboard.md gives the form).
std::string journal();
// What the host has sent to boards, "8 {Parm 10 Val 1}\n" each.
std::string heard();
void clearJournal();
// Until `count` messages of the type were recorded since the journal was cleared.
bool waitForMessages(uint32_t type, size_t count, std::chrono::milliseconds limit = longEnough);

// Message buffers not freed yet, those that wait in a queue included.
size_t outstanding();
bool waitForOutstanding(size_t count, std::chrono::milliseconds limit = longEnough);
size_t openQueues();
// "buffers outstanding N, queues open M".
std::string balance();

// Sends a message to the host queue bound to `target`, as if from `source`; false when there is none.
bool send(uint32_t type, const NvCompDesc& source, const NvCompDesc& target, const std::vector<uint8_t>& body,
          uint32_t transaction = 0);

}  // namespace softboard
#pragma GCC visibility pop

#endif
