// The road of a frame through the program: the callback queues the record, the display thread shows it.
#ifndef APP_DISPLAY_H
#define APP_DISPLAY_H

#include "app/Queue.h"
#include "vela/CCS.h"
#include "vela/Mutex.h"
#include "vela/Thread.h"

namespace app {

inline constexpr int QueueCapacity = 100;

// There for the whole process.
extern vela::Queue event_queue;
extern vela::Mutex queueGuard;  // guards event_queue; held by the display thread for all of one record
extern vela::Semaphore sema;    // one count for each queued record
extern vela::Thread Process;    // the display thread
extern int trunkVariant;        // decoder::swit of the display thread; set before it starts

// The callback for layer-2 trace events, on the delivery thread of one event. Takes over rec.
void HANDLE_L2Trace_events(vela::CCS* ccs, unsigned int evtGroup, vela::CCS::EvtL2Trace_t* rec);

// The display thread's body.
void* Process_L2_Trace(vela::Thread::control* ctl, void* arg);

// Writes one record to the log. Under queueGuard. `octets` is room for the frame's, kept from record to
// record by whoever shows them.
void showRecord(vela::CCS::EvtL2Trace_t& rec, vela::staticList<unsigned char>& octets);

// Destroys what is still queued at the end, when no thread uses the queue any more.
void discardQueued();

}  // namespace app

#endif
