// What the object layer offers the process as a whole.
#ifndef VELA_VELA_H
#define VELA_VELA_H

namespace vela {

// Prepares the layer; called once, before anything else of it. The transport's status.
unsigned int velaInit();
void velaCleanup();

void sleep(unsigned int seconds);
void sleep_ms(unsigned int ms);

// Process-wide counters, from any thread: object identities start at 1000, transactions at 10000.
unsigned int getUniqueObjId();
unsigned int getUniqueTransId();

}  // namespace vela

#endif
