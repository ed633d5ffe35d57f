// Start-up of the object layer, and its counters.
#ifndef VELA_VELA_H
#define VELA_VELA_H

namespace vela {

// Prepares the layer. Call it once, before anything else of the layer. Returns the transport library's
// status.
unsigned int velaInit();
void velaCleanup();

void sleep(unsigned int seconds);
void sleep_ms(unsigned int ms);

// Counters for the whole process; any thread may call them. Object identities start at 1000, transactions at
// 10000.
unsigned int getUniqueObjId();
unsigned int getUniqueTransId();

}  // namespace vela

#endif
