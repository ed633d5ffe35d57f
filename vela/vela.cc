#include "vela/vela.h"

#include <atomic>

#include "hostsvc/KSMsgRef.h"
#include "hostsvc/KSSleep.h"

namespace vela {

unsigned int velaInit() { return KSHostInit(); }
void velaCleanup() { KSHostCleanup(); }

void sleep(unsigned int seconds) { ks_sleep(seconds); }
void sleep_ms(unsigned int ms) { ks_sleep_ms(ms); }

unsigned int getUniqueObjId() {
    static std::atomic<unsigned int> next{1000};
    return next++;
}

unsigned int getUniqueTransId() {
    static std::atomic<unsigned int> next{10000};
    return next++;
}

}  // namespace vela
