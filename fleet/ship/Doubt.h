// Whether the stream may have lost frames that it has confirmed.
#ifndef FLEET_SHIP_DOUBT_H
#define FLEET_SHIP_DOUBT_H

#include <chrono>
#include <optional>
#include <string>

namespace fleet {

// A server that is killed, or whose disk is full, may lose what it has confirmed just before. So a doubt
// begins when another process of a server answers than the one before, when a server refuses parcels because
// it is in trouble, and when it gives a number to a parcel that it had given to another one. When nothing has
// gone wrong for a while, the shipper goes back to an older place and ends the doubt.
class Doubt {
  public:
    using Clock = std::chrono::steady_clock;

    // `path`: the file that names the server's process about which there is no doubt. `calm`: how long
    // nothing may go wrong before isCalm() is true.
    Doubt(std::string path, std::chrono::milliseconds calm);

    // Call it when there is a connection to this process of a server; an empty name changes nothing. The
    // first process ever is not doubted.
    void connectedTo(const std::string& process, Clock::time_point now);
    // The server has shown that something is wrong.
    void raise(Clock::time_point now) { raised_ = now; }

    bool exists() const { return raised_.has_value(); }
    // Whether nothing went wrong for long enough.
    bool isCalm(Clock::time_point now) const { return raised_ && now - *raised_ >= calm_; }
    // Ends the doubt and notes the connected process in the file. Call it when the places are back, so that
    // everything that was confirmed lately is shipped again.
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
