#include "hostsvc/KSThread.h"

#include "hostsvc/KSDetached.h"

namespace {

// Sets the status to stopped however the body ends: by returning, by an exception or by being cancelled.
class StoppedAtEnd {
  public:
    explicit StoppedAtEnd(std::atomic<KSThreadStatus>& status) : status_(status) {}
    StoppedAtEnd(const StoppedAtEnd&) = delete;
    StoppedAtEnd& operator=(const StoppedAtEnd&) = delete;
    ~StoppedAtEnd() { status_.store(KSThreadStatus::stopped); }

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
    life_.fetch_and(~unsigned{abandoned});
    if (status_.load() == ThreadStatus::running)
        cancel();
    join();  // also if the status says stopped: a cancelled body may still be running
}

void KSThread::start(void* arg) {
    if (status_.load() != ThreadStatus::stopped)
        throw AlreadyActive();
    lock_.lock();  // first wait for a cancelled body: setting the status now would make it run on
    argument_ = arg;
    result_.store(nullptr);
    life_.fetch_and(~unsigned{ended});
    status_.store(ThreadStatus::running);
    if (ks_startDetached(KSThread_run, this, stackSize_))
        return;  // do not touch the object any more: an abandoned one may have deleted itself
    status_.store(ThreadStatus::stopped);
    lock_.unlock();
    throw CreationError();
}

void KSThread::run() {
    const StoppedAtEnd stopped(status_);
    result_.store(body_(handedControl_, argument_));
}

void KSThread::cancel() { status_.store(ThreadStatus::stopped); }

void KSThread::join() {
    lock_.lock();
    lock_.unlock();
    life_.fetch_and(~unsigned{ended});
}

bool KSThread::tryJoin(unsigned timeoutMs, unsigned intervalMs) {
    if (!lock_.tryLock(timeoutMs, intervalMs))
        return false;
    lock_.unlock();
    life_.fetch_and(~unsigned{ended});
    return true;
}

void* KSThread::getResult() const { return result_.load(); }

void KSThread::abandon() {
    if ((life_.fetch_or(abandoned) & ended) == 0)
        return;
    join();
    delete this;
}

void* KSThread_run(void* thread) {
    ks_atThreadEnd(KSThread::finish, thread);
    static_cast<KSThread*>(thread)->run();
    return nullptr;
}

// The last thing that the thread does. After the unlock the object must not be touched, because a thread that
// joins may destroy it. If the object is abandoned, nobody joins, and it is deleted here.
void KSThread::finish(void* thread) {
    auto* const self = static_cast<KSThread*>(thread);
    const bool wasAbandoned = (self->life_.fetch_or(ended) & abandoned) != 0;
    self->lock_.unlock();
    if (wasAbandoned)
        delete self;
}
