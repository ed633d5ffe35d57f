#include "hostsvc/KSThreadEnd.h"

namespace {

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

void ks_atThreadEnd(void (*act)(void*), void* object) { lastAct.set(act, object); }
