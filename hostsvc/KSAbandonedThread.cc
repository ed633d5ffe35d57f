#include "hostsvc/KSAbandonedThread.h"

#include "hostsvc/KSDetached.h"
#include "hostsvc/KSSemaphore.h"
#include "hostsvc/KSThread.h"

namespace {

// Stands on the creator's stack until the new thread has copied it.
struct StartBlock {
    const KSBody& body;
    void* argument;
    KSSemaphore copied{1, 0};
};

void* KSThread_abandonRun(void* started) {
    auto* const block = static_cast<StartBlock*>(started);
    void* const argument = block->argument;
    const KSBody body = block->body;
    block->copied.post();
    body(nullptr, argument);
    return nullptr;
}

void create(const KSBody& body, void* arg, unsigned stackSize) {
    StartBlock block{body, arg};
    if (!ks_startDetached(KSThread_abandonRun, &block, stackSize))
        throw KSThread::CreationError();
    // Sleeps a millisecond at a time, less when the thread is quicker. Yielding instead would cost a busy
    // machine's whole time slices, and an idle one's processor.
    while (!block.copied.tryWait(1, 1)) {
    }
}

}  // namespace

void KSAbandonedThread_create(void* (*body)(void*, void*), void* arg, unsigned stackSize) {
    create(KSBody(body), arg, stackSize);
}

void KSAbandonedThread_create(void* object, void* (KSRunnable::*body)(void*, void*), void* arg,
                              unsigned stackSize) {
    create(KSBody(object, body), arg, stackSize);
}
