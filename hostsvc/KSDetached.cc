#include "hostsvc/KSDetached.h"

#include <pthread.h>

#include <algorithm>
#include <cstddef>
#include <limits>

#include "hostsvc/KSSystem.h"

namespace {

class Attributes {
  public:
    Attributes() : good_(pthread_attr_init(&attributes_) == 0) {}
    Attributes(const Attributes&) = delete;
    Attributes& operator=(const Attributes&) = delete;
    ~Attributes() {
        if (good_)
            pthread_attr_destroy(&attributes_);
    }

    const pthread_attr_t* get() const { return &attributes_; }

    bool detach() { return good_ && pthread_attr_setdetachstate(&attributes_, PTHREAD_CREATE_DETACHED) == 0; }

    bool setStackSize(unsigned& size) {
        if (size == 0)
            return true;
        std::size_t least = 0;
        pthread_attr_getstacksize(&attributes_, &least);
        if (size > least)
            return pthread_attr_setstacksize(&attributes_, size) == 0;
        size = static_cast<unsigned>(std::min<std::size_t>(least, std::numeric_limits<unsigned>::max()));
        return true;
    }

  private:
    pthread_attr_t attributes_{};
    bool good_;
};

// A thread_local object, whose destructor runs after all frames of the thread. The destructor of an object in
// a frame would run too early, while other frames are still unwound, or never, where pthread_exit does not
// unwind.
class LastAct {
  public:
    LastAct() = default;
    LastAct(const LastAct&) = delete;
    LastAct& operator=(const LastAct&) = delete;
    ~LastAct() {
        if (act_ != nullptr)
            act_(object_);
    }

    void set(void (*act)(void*), void* object) {
        if (act_ == nullptr) {
            act_ = act;
            object_ = object;
        }
    }

  private:
    void (*act_)(void*) = nullptr;
    void* object_ = nullptr;
};

thread_local LastAct lastAct;

}  // namespace

bool ks_startDetached(void* (*entry)(void*), void* argument, unsigned& stackSize) {
    Attributes attributes;
    return attributes.detach() && attributes.setStackSize(stackSize) &&
           ks_system().createThread(attributes.get(), entry, argument) == 0;
}

void ks_atThreadEnd(void (*act)(void*), void* object) { lastAct.set(act, object); }
