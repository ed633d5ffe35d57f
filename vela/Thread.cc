#include "vela/Thread.h"

#include <utility>

#include "hostsvc/KSAbandonedThread.h"

namespace vela {

namespace {

// What an abandoned thread runs, on its way to that thread.
struct Errand {
    Thread::Function function;
    void* object;
    Thread::Member member;
    void* arg;
};

void* runErrand(void*, void* block) {
    const Errand errand = *std::unique_ptr<Errand>(static_cast<Errand*>(block));
    if (errand.function != nullptr)
        return errand.function(nullptr, errand.arg);
    return (static_cast<Thread::Runnable*>(errand.object)->*errand.member)(nullptr, errand.arg);
}

void abandon(std::unique_ptr<Errand> errand, unsigned int stackSize) {
    try {
        KSAbandonedThread_create(runErrand, errand.get(), stackSize);
        static_cast<void>(errand.release());  // the thread's now
    } catch (const KSThread::CreationError&) {
        throw Thread::CreationError();
    }
}

template <typename... Args>
std::unique_ptr<KSThread> makeThread(Args... args) {
    try {
        return std::make_unique<KSThread>(args...);
    } catch (const KSThread::CreationError&) {
        throw Thread::CreationError();
    }
}

}  // namespace

void Thread::control::pushCleanup(void* object, void* (Runnable::*routine)(void*), void* arg) {
    primitive_->pushCleanup(object, reinterpret_cast<void* (KSRunnable::*)(void*)>(routine), arg);
}

Thread::Thread(Function body, unsigned int stackSize)
    : function_(body), thread_(makeThread(&Thread::run, stackSize)) {}

Thread::Thread(void* object, Member body, unsigned int stackSize)
    : object_(object), member_(body), thread_(makeThread(&Thread::run, stackSize)) {}

Thread::~Thread() = default;

// Runs on the new thread: gives the body the layer's control in place of the primitive's.
void* Thread::run(void* primitiveControl, void* self) {
    const Thread& thread = *static_cast<Thread*>(self);
    control own(static_cast<KSThread::control*>(primitiveControl));
    if (thread.function_ != nullptr)
        return thread.function_(&own, thread.arg_);
    return (static_cast<Runnable*>(thread.object_)->*thread.member_)(&own, thread.arg_);
}

void Thread::start(void* arg) {
    try {
        void* const earlier = std::exchange(arg_, arg);
        try {
            thread_->start(this);
        } catch (...) {
            arg_ = earlier;
            throw;
        }
    } catch (const KSThread::AlreadyActive&) {
        throw AlreadyActive();
    } catch (const KSThread::CreationError&) {
        throw CreationError();
    }
}

void Thread::cancel() { thread_->cancel(); }
void Thread::join() { thread_->join(); }
void* Thread::getResult() { return thread_->getResult(); }
void Thread::abandon() { thread_->abandon(); }

void AbandonedThread_create(Thread::Function body, void* arg, unsigned int stackSize) {
    abandon(std::make_unique<Errand>(Errand{body, nullptr, nullptr, arg}), stackSize);
}

void AbandonedThread_create(void* object, Thread::Member body, void* arg, unsigned int stackSize) {
    abandon(std::make_unique<Errand>(Errand{nullptr, object, body, arg}), stackSize);
}

}  // namespace vela
