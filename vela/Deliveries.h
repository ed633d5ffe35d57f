// The deliveries of one dispatcher that have not ended, so that what they use can outlive them.
#ifndef VELA_DELIVERIES_H
#define VELA_DELIVERIES_H

#include <condition_variable>
#include <cstddef>
#include <map>
#include <mutex>

namespace vela {

// From any thread. Shared by the dispatcher and its deliveries: a callback on a thread of its own may destroy
// the dispatcher, and its delivery ends after that. One on the dispatching thread may not: the dispatcher
// goes on there when it returns.
class Deliveries {
  public:
    // On the dispatching thread, for a callback of the object; null for a plain function. The delivery counts
    // from now on, also while it waits for a thread.
    void begin(const void* object);
    void end(const void* object);

    // Names the delivery that runs on this thread, which never waits for itself.
    class OnThisThread {
      public:
        OnThisThread(const Deliveries& all, const void* object);
        ~OnThisThread();
        OnThisThread(const OnThisThread&) = delete;
        OnThisThread& operator=(const OnThisThread&) = delete;

      private:
        friend class Deliveries;
        const Deliveries& all_;
        const void* object_;
        const OnThisThread* outer_;
    };

    void awaitAll();
    void awaitFor(const void* object);

  private:
    template <typename Count, typename Concerns>
    void awaitNone(Count count, Concerns concerns);

    std::mutex mutex_;
    std::condition_variable ended_;
    std::map<const void*, std::size_t> begun_;  // by object; none is 0
    std::size_t all_ = 0;
};

}  // namespace vela

#endif
