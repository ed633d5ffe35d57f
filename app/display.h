// The road of a frame through the program: the callback queues the record, the display thread shows it.
#ifndef APP_DISPLAY_H
#define APP_DISPLAY_H

#include <cstdint>

#include "app/Arrivals.h"
#include "app/Queue.h"
#include "vela/CCS.h"
#include "vela/Mutex.h"
#include "vela/Thread.h"

namespace app {

// There for the whole process.
extern vela::Queue event_queue;
extern vela::Mutex queueGuard;  // guards event_queue; held by the display thread for all of one record
extern vela::Semaphore sema;    // one count for each queued record
extern vela::Thread Process;    // the display thread
extern int trunkVariant;        // decoder::swit of the display thread; set before it starts

// The callback for layer-2 trace events, on the delivery thread of one event. Takes over rec.
void HANDLE_L2Trace_events(vela::CCS* ccs, unsigned int evtGroup, vela::CCS::EvtL2Trace_t* rec);

// The display thread's body. It is woken for the first frame after a pause; frames that follow within 10 ms
// are shown together, unless they fill half the queue before. When it is cancelled after the arrivals were
// closed, it shows what has arrived first, unless the shutdown is hurried.
void* Process_L2_Trace(vela::Thread::control* ctl, void* arg);

// Writes one record to the log. Under queueGuard. `octets` is room for the frame's, kept from record to
// record by whoever shows them.
void showRecord(vela::CCS::EvtL2Trace_t& rec, vela::staticList<unsigned char>& octets);

// Destroys what is still queued at the end, when no thread uses the queue any more.
struct Discarded {
    std::uint64_t records = 0;
    std::uint64_t missing = 0;  // that were lost before one of them
};
Discarded discardQueued();

}  // namespace app

#endif
