// Whether the stream may have lost frames that it has confirmed.
#ifndef FLEET_SHIP_DOUBT_H
#define FLEET_SHIP_DOUBT_H

#include <chrono>
#include <optional>
#include <string>

namespace fleet {

// A server that is killed, or whose disk is full, may lose what it has confirmed just before. So there is
// doubt when a server's process answers that did not answer before, when a server refuses parcels because it
// is in trouble, and when it numbers parcels as it has numbered others before. When all has been well for a
// while, whoever ships begins at an older place, and the doubt is over.
class Doubt {
  public:
    using Clock = std::chrono::steady_clock;

    // `path`: the file in which the server's process is noted about which there is no doubt.
    Doubt(std::string path, std::chrono::milliseconds calm);

    // There is a connection to this process of a server; an empty name says nothing. The first process ever
    // is not doubted.
    void connectedTo(const std::string& process, Clock::time_point now);
    // The server has shown that something is wrong.
    void raise(Clock::time_point now) { raised_ = now; }

    bool exists() const { return raised_.has_value(); }
    // Whether nothing went wrong for long enough.
    bool isCalm(Clock::time_point now) const { return raised_ && now - *raised_ >= calm_; }
    // Everything that was confirmed lately is shipped again.
    void end();

  private:
    std::string path_;
    std::chrono::milliseconds calm_;
    std::string trusted_;    // the process in the file
    std::string connected_;  // the process of the newest connection
    std::optional<Clock::time_point> raised_;
};

}  // namespace fleet

#endif
