#include "vela/Thread.h"

#include <utility>

#include "hostsvc/KSAbandonedThread.h"

namespace vela {

namespace {

// The body of every thread. Calls the errand with a control of this layer instead of the one of KSThread. A
// thread that is created abandoned has no control.
void* runErrand(void* primitiveControl, void* block) {
    const Thread::Errand errand = *std::unique_ptr<Thread::Errand>(static_cast<Thread::Errand*>(block));
    Thread::control own(static_cast<KSThread::control*>(primitiveControl));
    return errand.run(primitiveControl == nullptr ? nullptr : &own);
}

// The body of an abandoned thread whose errand is its creator's.
void* runErrandInPlace(void*, void* block) {
    const Thread::Errand errand = *static_cast<Thread::Errand*>(block);
    return errand.run(nullptr);
}

template <typename Create>
auto translated(Create create) {
    try {
        return create();
    } catch (const KSThread::AlreadyActive&) {
        throw Thread::AlreadyActive();
    } catch (const KSThread::CreationError&) {
        throw Thread::CreationError();
    }
}

// Starts a thread and gives it a copy of the errand, which the new thread frees.
template <typename Start>
void startWith(const Thread::Errand& errand, Start start) {
    auto block = std::make_unique<Thread::Errand>(errand);
    translated([&] { start(block.get()); });
    static_cast<void>(block.release());
}

}  // namespace

void* Thread::Errand::run(control* ctl) const {
    return function != nullptr ? function(ctl, arg) : (static_cast<Runnable*>(object)->*member)(ctl, arg);
}

void Thread::control::pushCleanup(void* object, void* (Runnable::*routine)(void*), void* arg) {
    primitive_->pushCleanup(static_cast<KSRunnable*>(static_cast<Runnable*>(object)),
                            static_cast<void* (KSRunnable::*)(void*)>(routine), arg);
}

Thread::Thread(Function body, unsigned int stackSize)
    : Thread(Errand{body, nullptr, nullptr, nullptr}, stackSize) {}

Thread::Thread(void* object, Member body, unsigned int stackSize)
    : Thread(Errand{nullptr, object, body, nullptr}, stackSize) {}

Thread::Thread(const Errand& errand, unsigned int stackSize)
    : errand_(errand),
      thread_(translated([&] { return std::make_unique<KSThread>(&runErrand, stackSize); })) {}

Thread::~Thread() = default;

void Thread::start(void* arg) {
    if (thread_ == nullptr)
        throw AlreadyActive();
    Errand errand = errand_;
    errand.arg = arg;
    startWith(errand, [&](Errand* block) { thread_->start(block); });
    started_ = true;
    if (abandoned_)
        letGo();
}

void Thread::cancel() {
    if (thread_ != nullptr)
        thread_->cancel();
}

void Thread::join() {
    if (thread_ == nullptr)
        return;
    thread_->join();
    started_ = false;
}

void* Thread::getResult() { return thread_ == nullptr ? nullptr : thread_->getResult(); }

void Thread::abandon() {
    abandoned_ = true;
    if (started_)
        letGo();
}

// Gives up thread_, which deletes itself when its body ends. Only the first call does something.
void Thread::letGo() {
    if (!letGo_.exchange(true))
        thread_.release()->abandon();
}

void AbandonedThread_create(Thread::Function body, void* arg, unsigned int stackSize) {
    startWith({body, nullptr, nullptr, arg},
              [&](Thread::Errand* errand) { KSAbandonedThread_create(&runErrand, errand, stackSize); });
}

void AbandonedThread_create(void* object, Thread::Member body, void* arg, unsigned int stackSize) {
    startWith({nullptr, object, body, arg},
              [&](Thread::Errand* errand) { KSAbandonedThread_create(&runErrand, errand, stackSize); });
}

void AbandonedThread_create(Thread::Errand& errand, unsigned int stackSize) {
    translated([&] { KSAbandonedThread_create(&runErrandInPlace, &errand, stackSize); });
}

}  // namespace vela
