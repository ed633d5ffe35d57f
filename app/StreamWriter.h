// Writes text to descriptors on a thread of its own, so that whoever has something to say never waits for a
// reader.
#ifndef APP_STREAMWRITER_H
#define APP_STREAMWRITER_H

#include <chrono>
#include <cstddef>
#include <memory>
#include <string_view>
#include <vector>

namespace app {

// Texts are written whole and in the order in which they came, as long as every stream takes them; a stream
// that takes nothing holds up no other. What waits for a stream is bounded. A text that finds no room is
// dropped, and so are all that follow until everything that waited has been written; then a line in the
// stream says how many lines are missing there. Lines whose write failed are told in the same way, before the
// next text.
//
// Any thread may use it. SIGPIPE has to be ignored.
class StreamWriter {
  public:
    static constexpr std::size_t Bound = 1 << 20;  // octets that wait for one stream

    // The descriptors stay the caller's. Throws std::system_error when there is no thread.
    explicit StreamWriter(const std::vector<int>& descriptors, std::size_t bound = Bound);
    // Ends the thread; what still waits is lost. Returns once no descriptor is used any more.
    ~StreamWriter();
    StreamWriter(const StreamWriter&) = delete;
    StreamWriter& operator=(const StreamWriter&) = delete;

    // Takes a whole text, some lines, for the descriptor with this place in the list. Never waits before
    // `end`.
    void write(std::size_t stream, std::string_view text);

    // Waits until all is written, but no longer than `limit` from now on; what is not written by then is
    // lost. After that there is no thread any more: `write` itself writes. It waits for a stream only while
    // the same limit allows it.
    void end(std::chrono::milliseconds limit);

    // Waits until all is written, but no longer than `limit`. For signal handlers.
    void awaitWritten(std::chrono::milliseconds limit) const;

    // Called around a fork. In the child nothing waits and there is no thread: its own texts are written as
    // after `end`, within `limit`.
    void beforeFork();
    void afterForkInParent();
    void afterForkInChild(std::chrono::milliseconds limit);

  private:
    class State;

    std::shared_ptr<State> state_;  // also held by the thread
};

}  // namespace app

#endif
