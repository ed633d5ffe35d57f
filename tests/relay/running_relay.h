// A relay in the test's own process, on the transport library that the test is linked to.
#ifndef TESTS_RELAY_RUNNING_RELAY_H
#define TESTS_RELAY_RUNNING_RELAY_H

#include <sys/eventfd.h>

#include <chrono>
#include <condition_variable>
#include <mutex>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "relay/server.h"

class RunningRelay {
  public:
    explicit RunningRelay(relay::Options options = {})
        : server_(ephemeral(std::move(options)), [this](const std::string& line) { note(line); }),
          port_(server_.endpoint().port),
          thread_([this] { server_.run(stop_.get()); }) {}
    ~RunningRelay() { stop(); }

    std::uint16_t port() const { return port_; }
    std::string host() const { return "127.0.0.1:" + std::to_string(port_); }

    // Once: drains, and returns when every connection is gone.
    void stop() {
        sayStop();
        if (thread_.joinable())
            thread_.join();
    }
    void sayStop() const { eventfd_write(stop_.get(), 1); }

    // Returns once so many lines of the log hold the text; false after half a minute.
    bool logs(const std::string& text, std::size_t times = 1) {
        std::unique_lock lock(lock_);
        return changed_.wait_for(lock, std::chrono::seconds(30), [&] { return count(text) >= times; });
    }
    std::size_t logged(const std::string& text) {
        const std::lock_guard lock(lock_);
        return count(text);
    }

  private:
    static relay::Options ephemeral(relay::Options options) {
        options.listen.port = 0;
        return options;
    }

    void note(const std::string& line) {
        const std::lock_guard lock(lock_);
        lines_.push_back(line);
        changed_.notify_all();
    }

    std::size_t count(const std::string& text) const {
        std::size_t found = 0;
        for (const std::string& line : lines_)
            found += line.find(text) != std::string::npos ? 1 : 0;
        return found;
    }

    std::mutex lock_;
    std::condition_variable changed_;
    std::vector<std::string> lines_;
    relay::Descriptor stop_{eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)};
    relay::Server server_;
    std::uint16_t port_;
    std::thread thread_;
};

#endif
