#include "hostsvc/KSAbandonedThread.h"

#include <sched.h>

#include <atomic>

#include "hostsvc/KSDetached.h"
#include "hostsvc/KSSleep.h"
#include "hostsvc/KSThread.h"

namespace {

// Stands on the creator's stack until the new thread has copied it.
struct StartBlock {
    std::atomic<const KSBody*> body;  // null: copied
    void* argument;
};

void* KSThread_abandonRun(void* started) {
    auto* const block = static_cast<StartBlock*>(started);
    void* const argument = block->argument;
    const KSBody body = *block->body.load();
    block->body.store(nullptr);
    body(nullptr, argument);
    return nullptr;
}

// A thread that starts at once is not made to cost a millisecond.
void waitUntilTaken(const StartBlock& block) {
    constexpr int looksBeforeSleeping = 50;
    for (int looks = 0; block.body.load() != nullptr; ++looks) {
        if (looks < looksBeforeSleeping)
            sched_yield();
        else
            ks_sleep_ms(1);
    }
}

void create(const KSBody& body, void* arg, unsigned stackSize) {
    StartBlock block{&body, arg};
    if (!ks_startDetached(KSThread_abandonRun, &block, stackSize))
        throw KSThread::CreationError();
    waitUntilTaken(block);
}

}  // namespace

void KSAbandonedThread_create(void* (*body)(void*, void*), void* arg, unsigned stackSize) {
    create(KSBody(body), arg, stackSize);
}

void KSAbandonedThread_create(void* object, void* (KSRunnable::*body)(void*, void*), void* arg,
                              unsigned stackSize) {
    create(KSBody(object, body), arg, stackSize);
}
