// Sends messages to the service manager that started the program (systemd; sd_notify(3) describes the lines).
// Without a service manager nothing is sent.
#ifndef SERVICE_NOTIFY_H
#define SERVICE_NOTIFY_H

#include <chrono>
#include <optional>
#include <string>

namespace service {

// Sends a line such as "READY=1" or "STOPPING=1" to the socket that NOTIFY_SOCKET names.
// If the service manager's socket stays full for a second, the line is not sent.
void notify(const std::string& line);

// Tells the service manager that the main loop still runs; the manager restarts a program that does not say
// so. The loop must call beat() at least once in each interval. Used by one thread.
class Heartbeat {
  public:
    using Clock = std::chrono::steady_clock;

    // Reads WATCHDOG_USEC and WATCHDOG_PID. Beats three times in the time that the service manager allows.
    Heartbeat();

    // How long the loop may wait before it calls beat() again; nothing if the service manager expects no
    // beats.
    std::optional<std::chrono::milliseconds> interval() const { return interval_; }

    // Sends "WATCHDOG=1" if half of the interval has passed since it was last sent.
    // Never waits: if the service manager's socket is full, the next call tries again.
    void beat();

  private:
    std::optional<std::chrono::milliseconds> interval_;
    Clock::time_point last_ = Clock::time_point::min();
};

}  // namespace service

#endif
