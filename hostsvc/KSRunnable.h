// Thread bodies and clean-up routines: a plain function, or a member function of an object.
#ifndef HOSTSVC_KSRUNNABLE_H
#define HOSTSVC_KSRUNNABLE_H

// The member functions of thread bodies and clean-up routines are cast to members of this class. It is empty.
// A class whose members are run derives from it and passes a pointer to the KSRunnable part of its object.
class KSRunnable {};

// Refers to the function, or to the object and its member, and owns neither. The object must outlive the last
// call.
template <typename... Args>
class KSCallable {
  public:
    using Function = void* (*)(Args...);
    using Member = void* (KSRunnable::*)(Args...);

    explicit KSCallable(Function function) : function_(function) {}
    KSCallable(void* object, Member member) : object_(static_cast<KSRunnable*>(object)), member_(member) {}

    void* operator()(Args... args) const {
        return function_ != nullptr ? function_(args...) : (object_->*member_)(args...);
    }

  private:
    KSRunnable* object_ = nullptr;
    Member member_ = nullptr;
    Function function_ = nullptr;
};

// A thread's body, called with its control and the start argument; returns the thread's result.
using KSBody = KSCallable<void*, void*>;

// A clean-up routine, called with the argument it was pushed with; its result is ignored.
using KSCleanup = KSCallable<void*>;

#endif
