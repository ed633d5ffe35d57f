// A keyed list that several threads use.
#ifndef VELA_SHAREDKEYEDLIST_H
#define VELA_SHAREDKEYEDLIST_H

#include "vela/Mutex.h"
#include "vela/linkedList.h"

namespace vela {

// The list is also a lock. Hold a std::lock_guard of it for each use, or for several uses that belong
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
