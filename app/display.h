// How records become text in the log: the callback puts them into a queue, and the display thread takes them
// out and writes them.
#ifndef APP_DISPLAY_H
#define APP_DISPLAY_H

#include <cstdint>

#include "app/Arrivals.h"
#include "app/Queue.h"
#include "vela/CCS.h"
#include "vela/Mutex.h"
#include "vela/Thread.h"

namespace app {

// These objects exist as long as the process.
extern vela::Queue event_queue;
extern vela::Mutex queueGuard;  // guards event_queue; the display thread holds it while it writes a record
extern vela::Semaphore sema;    // counts the queued records
extern vela::Thread Process;    // the display thread
extern int trunkVariant;        // decoder::swit of the display thread; set before it starts

// The callback for layer-2 trace events. It runs on the delivery thread of one event and becomes the owner of
// rec.
void HANDLE_L2Trace_events(vela::CCS* ccs, unsigned int evtGroup, vela::CCS::EvtL2Trace_t* rec);

// The body of the display thread. It is woken for the first record after a pause. Records that follow within
// 10 ms are written together; it is woken before that when they fill half the queue. When it is cancelled
// after the arrivals were closed, it first writes every record that has arrived, unless the shutdown is
// hurried.
void* Process_L2_Trace(vela::Thread::control* ctl, void* arg);

// Writes one record to the log. Call it under queueGuard. `octets` is working memory that the caller keeps
// from one record to the next.
void showRecord(vela::CCS::EvtL2Trace_t& rec, vela::staticList<unsigned char>& octets);

// Destroys the records that are still queued at the end, when no thread uses the queue any more.
struct Discarded {
    std::uint64_t records = 0;
    std::uint64_t missing = 0;  // records that were lost before one of them
};
Discarded discardQueued();

}  // namespace app

#endif
