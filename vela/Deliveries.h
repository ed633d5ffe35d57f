// Counts the deliveries of one dispatcher that have not ended, so that what they use can be kept until then.
#ifndef VELA_DELIVERIES_H
#define VELA_DELIVERIES_H

#include <condition_variable>
#include <cstddef>
#include <map>
#include <mutex>

namespace vela {

// Any thread may call any function. The dispatcher and its deliveries share the object, because a callback on
// a thread of its own may destroy the dispatcher, and its delivery ends after that. A callback on the
// dispatching thread must not do so: the dispatcher continues there when the callback returns.
class Deliveries {
  public:
    // Counts a delivery from now on, also while it waits for a thread. `object` is the object of its
    // callback; null for a plain function. Called on the dispatching thread.
    void begin(const void* object);
    void end(const void* object);

    // Notes for its lifetime that a delivery runs on this thread. A thread does not wait for its own
    // delivery.
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

    void awaitAll();                    // waits until every delivery has ended
    void awaitFor(const void* object);  // waits until those of one object have ended

  private:
    template <typename Count, typename Concerns>
    void awaitNone(Count count, Concerns concerns);

    std::mutex mutex_;
    std::condition_variable ended_;
    // Deliveries by object; no entry is 0. Those of plain functions count in all_ alone.
    std::map<const void*, std::size_t> begun_;
    std::size_t all_ = 0;
};

}  // namespace vela

#endif
