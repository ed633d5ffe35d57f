#include "hostsvc/KSAbandonedThread.h"

#include "hostsvc/KSDetached.h"
#include "hostsvc/KSSemaphore.h"
#include "hostsvc/KSThread.h"

namespace {

// What the new thread needs. It is on the creator's stack, and the creator waits until the new thread has
// copied it.
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
    // Sleeps a millisecond at a time; the new thread's post ends the sleep early. Yielding instead would cost
    // whole time slices on a busy machine, and the processor on an idle one.
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
