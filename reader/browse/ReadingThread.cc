#include "reader/browse/ReadingThread.h"

#include <pthread.h>

#include <csignal>
#include <exception>
#include <string>

#include "reader/Chatter.h"

namespace reader::browse {

namespace {

// Hands over the reason if the input cannot be read.
void read(Session& session, Collector& collector) {
    Chatter quiet(Loudness::quiet);  // the screen belongs to the other thread
    std::string error;
    try {
        try {
            collector.run(session, quiet);
        } catch (const std::exception& thrown) {
            error = thrown.what();
        }
        collector.finish(error);
    } catch (const UpdateQueue::Closed&) {
        return;
    }
}

}  // namespace

// A new thread inherits the mask of signals.
ReadingThread::ReadingThread(Session& session, Collector& collector, UpdateQueue& queue) : queue_(queue) {
    sigset_t all, before;
    sigfillset(&all);
    sigdelset(&all, SIGUSR1);
    pthread_sigmask(SIG_SETMASK, &all, &before);
    thread_ = std::thread([&session, &collector] { read(session, collector); });
    pthread_sigmask(SIG_SETMASK, &before, nullptr);
}

ReadingThread::~ReadingThread() {
    queue_.close();
    pthread_kill(thread_.native_handle(), SIGUSR1);
    thread_.join();
}

}  // namespace reader::browse
