// The deliveries of one dispatcher that have begun and not ended, so that what they use can outlive them.
#ifndef VELA_DELIVERIES_H
#define VELA_DELIVERIES_H

#include <condition_variable>
#include <list>
#include <mutex>

namespace vela {

// From any thread. Shared by the dispatcher and its deliveries: a callback on a thread of its own may destroy
// the dispatcher, and its delivery ends after that. One on the dispatching thread may not: the dispatcher
// goes on there when it returns.
class Deliveries {
  public:
    struct Entry {
        const void* object;  // whose member is called; null for a plain function
    };
    using Ticket = std::list<Entry>::iterator;

    // On the dispatching thread, before the delivery can run.
    Ticket begin(const void* object);
    void end(Ticket ticket);

    // Names the delivery that runs on this thread, which never waits for itself.
    class OnThisThread {
      public:
        explicit OnThisThread(Ticket ticket);
        ~OnThisThread();
        OnThisThread(const OnThisThread&) = delete;
        OnThisThread& operator=(const OnThisThread&) = delete;

      private:
        const Entry* outer_;
    };

    void awaitAll();
    void awaitFor(const void* object);

  private:
    template <typename Predicate>
    void awaitNone(Predicate concerns);

    std::mutex mutex_;
    std::condition_variable ended_;
    std::list<Entry> running_;
};

}  // namespace vela

#endif
