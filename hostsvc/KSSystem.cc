#include "hostsvc/KSSystem.h"

#include <sys/select.h>
#include <unistd.h>

#include <atomic>
#include <memory>

namespace {

std::atomic<KSSystem*> standIn{nullptr};

}  // namespace

unsigned KSSystem::sleep(unsigned seconds) { return ::sleep(seconds); }

int KSSystem::waitFor(timeval timeout) { return ::select(0, nullptr, nullptr, nullptr, &timeout); }

int KSSystem::createThread(const pthread_attr_t* attributes, void* (*entry)(void*), void* argument) {
    pthread_t unused = 0;
    return ::pthread_create(&unused, attributes, entry, argument);
}

int KSSystem::post(sem_t* semaphore) { return ::sem_post(semaphore); }

KSSystem& ks_system() {
    // Never destroyed: while the process exits there are threads that still sleep.
    static KSSystem* const real = std::make_unique<KSSystem>().release();
    KSSystem* const other = standIn.load();
    return other != nullptr ? *other : *real;
}

void ks_useSystem(KSSystem* other) { standIn.store(other); }
