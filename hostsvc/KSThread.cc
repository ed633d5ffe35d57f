#include "hostsvc/KSThread.h"

#include "hostsvc/KSDetached.h"
#include "hostsvc/KSThreadEnd.h"

namespace {

// The body ends by returning, by an exception or by the unwinding of a cancelled thread.
class StoppedAtEnd {
  public:
    explicit StoppedAtEnd(std::atomic<KSThreadStatus>& status) : status_(status) {}
    StoppedAtEnd(const StoppedAtEnd&) = delete;
    StoppedAtEnd& operator=(const StoppedAtEnd&) = delete;
    ~StoppedAtEnd() { status_.store(KSThreadStatus::Stopped); }

  private:
    std::atomic<KSThreadStatus>& status_;
};

}  // namespace

KSThread::KSThread(void* (*body)(void*, void*), unsigned stackSize) : KSThread(KSBody(body), stackSize) {}

KSThread::KSThread(void* object, void* (KSRunnable::*body)(void*, void*), unsigned stackSize)
    : KSThread(KSBody(object, body), stackSize) {}

KSThread::KSThread(const KSBody& body, unsigned stackSize)
    : body_(body), stackSize_(stackSize), control_(status_, lock_), handedControl_(&control_) {
    lock_.unlock();
}

KSThread::~KSThread() {
    life_.fetch_and(~unsigned{Abandoned});
    if (status_.load() == ThreadStatus::Running)
        cancel();
    join();  // also where it was cancelled before: it may not have noticed yet
}

void KSThread::start(void* arg) {
    if (status_.load() != ThreadStatus::Stopped)
        throw AlreadyActive();
    lock_.lock();  // before the status says running, or a body that is to stop would go on
    argument_ = arg;
    result_.store(nullptr);
    life_.fetch_and(~unsigned{Ended});
    status_.store(ThreadStatus::Running);
    if (ks_startDetached(KSThread_run, this, stackSize_))
        return;  // an abandoned object may be gone by now
    status_.store(ThreadStatus::Stopped);
    lock_.unlock();
    throw CreationError();
}

void KSThread::run() {
    const StoppedAtEnd stopped(status_);
    result_.store(body_(handedControl_, argument_));
}

void KSThread::cancel() { status_.store(ThreadStatus::Stopped); }

void KSThread::join() {
    lock_.lock();
    lock_.unlock();
    life_.fetch_and(~unsigned{Ended});
}

bool KSThread::tryJoin(unsigned timeoutMs, unsigned intervalMs) {
    if (!lock_.tryLock(timeoutMs, intervalMs))
        return false;
    lock_.unlock();
    life_.fetch_and(~unsigned{Ended});
    return true;
}

void* KSThread::getResult() const { return result_.load(); }

void KSThread::abandon() {
    if ((life_.fetch_or(Abandoned) & Ended) == 0)
        return;
    join();
    delete this;
}

void* KSThread_run(void* thread) {
    ks_atThreadEnd(KSThread::finish, thread);
    static_cast<KSThread*>(thread)->run();
    return nullptr;
}

// The thread's last act. Unless the object is abandoned, somebody who joins may destroy it after the unlock.
void KSThread::finish(void* thread) {
    auto* const self = static_cast<KSThread*>(thread);
    const bool abandoned = (self->life_.fetch_or(Ended) & Abandoned) != 0;
    self->lock_.unlock();
    if (abandoned)
        delete self;
}
