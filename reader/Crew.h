// Works on chunks with several threads.
#ifndef READER_CREW_H
#define READER_CREW_H

#include <condition_variable>
#include <deque>
#include <exception>
#include <functional>
#include <memory>
#include <mutex>
#include <thread>
#include <vector>

#include "reader/Chunk.h"

namespace reader {

// The threads work on chunks in any order; takeBack() returns them in the order in which they were handed in.
// All functions are called on one thread, the owner's, which does a job itself when it would have to wait.
class Crew {
  public:
    using Job = std::function<void(Chunk&)>;

    // The owner's thread does the first job, and a new thread each of the others. There must be at least one.
    explicit Crew(std::vector<Job> jobs);
    // Waits until no thread works on a chunk any more.
    ~Crew();

    Crew(const Crew&) = delete;
    Crew& operator=(const Crew&) = delete;

    void handIn(std::unique_ptr<Chunk> chunk);
    // Returns the oldest chunk that was handed in, once it is finished; null if there is none. Throws what
    // its job threw.
    std::unique_ptr<Chunk> takeBack();
    std::size_t held() const { return entries_.size(); }

  private:
    enum class State { waiting, working, done };
    struct Entry {
        std::unique_ptr<Chunk> chunk;
        State state = State::waiting;
        std::exception_ptr thrown;
    };

    void serve(const Job& job);
    Entry* claim();
    void workOn(Entry& entry, const Job& job, std::unique_lock<std::mutex>& lock);

    Job own_;
    std::mutex
        mutex_;  // guards the states of the entries and stopping_; a deque leaves entries where they are
    std::condition_variable handedIn_;
    std::condition_variable finished_;
    std::deque<Entry> entries_;
    bool stopping_ = false;
    std::vector<std::thread> threads_;
};

}  // namespace reader

#endif
