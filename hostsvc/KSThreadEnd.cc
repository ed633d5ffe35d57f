#include "hostsvc/KSThreadEnd.h"

namespace {

// A destructor of the thread, not of a frame: frames may still be unwinding when theirs run, and where
// pthread_exit does not unwind they never do.
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
