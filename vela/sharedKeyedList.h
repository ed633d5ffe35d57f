// A keyed list that threads share.
#ifndef VELA_SHAREDKEYEDLIST_H
#define VELA_SHAREDKEYEDLIST_H

#include "vela/Mutex.h"
#include "vela/linkedList.h"

namespace vela {

// The list is its own lock: a std::lock_guard of it is held around each use, and around those that belong
// together.
template <typename K, typename V>
class sharedKeyedList : public keyedList<K, V> {
  public:
    void lock() { mutex_.lock(); }
    void unlock() { mutex_.unlock(); }

  private:
    Mutex mutex_;
};

}  // namespace vela

#endif
