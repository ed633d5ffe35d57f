#include "vela/Mutex.h"

namespace vela {

namespace {

unsigned int checkedPoll(unsigned int pollMs) {
    if (pollMs == 0)
        throw Exception("the poll interval must not be 0");
    return pollMs;
}

}  // namespace

bool Mutex::tryLock(unsigned int totalMs, unsigned int pollMs) {
    return mutex_->tryLock(totalMs, checkedPoll(pollMs));
}

bool Semaphore::tryWait(unsigned int totalMs, unsigned int pollMs) {
    return semaphore_->tryWait(totalMs, checkedPoll(pollMs));
}

void Semaphore::post() {
    try {
        semaphore_->post();
    } catch (const KSSemaphore::PostError&) {
        throw PostError();
    }
}

}  // namespace vela
