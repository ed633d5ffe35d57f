// The thread of `lapdread browse` that reads the input.
#ifndef READER_BROWSE_READINGTHREAD_H
#define READER_BROWSE_READINGTHREAD_H

#include <thread>

#include "reader/browse/Collector.h"
#include "reader/browse/Update.h"
#include "reader/session.h"

namespace reader::browse {

// Reads the input until it ends or the object is destroyed. The thread gets no signal but SIGUSR1, by which
// the destructor interrupts a system call; that signal must have a handler. All references must outlive the
// object.
class ReadingThread {
  public:
    ReadingThread(Session& session, Collector& collector, UpdateQueue& queue);
    // Closes the queue and waits for the thread.
    ~ReadingThread();
    ReadingThread(const ReadingThread&) = delete;
    ReadingThread& operator=(const ReadingThread&) = delete;

  private:
    UpdateQueue& queue_;
    std::thread thread_;
};

}  // namespace reader::browse

#endif
