// Writes text to descriptors on a thread of its own, so that a thread that writes never waits for a reader.
#ifndef APP_STREAMWRITER_H
#define APP_STREAMWRITER_H

#include <chrono>
#include <cstddef>
#include <memory>
#include <string_view>
#include <vector>

namespace app {

// Texts are written whole, and in the order in which they came as long as every stream takes them. A stream
// that takes nothing does not delay the others. The amount of text that waits for a stream is limited. A text
// for which there is no room is dropped, and so are all later ones until everything that waited has been
// written. Then a line in the stream says how many lines are missing. Lines whose write failed are counted in
// the same way, and told before the next text.
//
// Any thread may use it. SIGPIPE must be ignored.
class StreamWriter {
  public:
    static constexpr std::size_t usualBound = 1 << 20;  // most octets that wait for one stream

    // The caller keeps the descriptors. Throws std::system_error when the system refuses the thread.
    explicit StreamWriter(const std::vector<int>& descriptors, std::size_t bound = usualBound);
    // Ends the thread; text that still waits is lost. Returns when no descriptor is used any more.
    ~StreamWriter();
    StreamWriter(const StreamWriter&) = delete;
    StreamWriter& operator=(const StreamWriter&) = delete;

    // Takes a text of whole lines for the descriptor at this place of the list. Before `end` it never waits.
    void write(std::size_t stream, std::string_view text);

    // Waits until all text is written, but not longer than `limit`; text that is not written by then is lost.
    // Ends the thread. After that `write` itself writes, and waits for a stream only until the same limit.
    void end(std::chrono::milliseconds limit);

    // Waits until all text is written, but not longer than `limit`. A signal handler may call it.
    void awaitWritten(std::chrono::milliseconds limit) const;

    // Called before and after a fork. In the child no text waits and there is no thread; texts are written as
    // after `end`, within `limit`.
    void beforeFork();
    void afterForkInParent();
    void afterForkInChild(std::chrono::milliseconds limit);

  private:
    class State;

    std::shared_ptr<State> state_;  // the thread shares it
};

}  // namespace app

#endif
