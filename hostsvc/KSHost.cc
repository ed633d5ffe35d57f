#include "hostsvc/KSHost.h"

#include "norv/norv.h"

std::uint32_t KSHostInit() { return nvDrvSetInterface(0, 0); }

void KSHostCleanup() {}
