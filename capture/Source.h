// The octets of a file, a pipe or the standard input, in a window that slides over them.
#ifndef CAPTURE_SOURCE_H
#define CAPTURE_SOURCE_H

#include <chrono>
#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "capture/Reader.h"

namespace capture {

// Followed, a file has no end: it may grow, be emptied in place, or be replaced by another one of its name,
// which inode, size and the octets read last tell. A FIFO that is followed has no end either. Used by one
// thread at a time. Functions that read throw BadInput when the system refuses.
class Source {
  public:
    enum class State : std::uint8_t {
        ready,  // the window holds what was wanted
        pause,  // not yet
        end     // it holds all there is; of a followed file, see replaced()
    };

    // "-" is the standard input. Waits for the writer of a FIFO.
    explicit Source(std::string path, bool follow = false);
    ~Source();
    Source(const Source&) = delete;
    Source& operator=(const Source&) = delete;

    // Makes the window hold at least so many octets. What held() gave before is no longer valid.
    State want(std::size_t octets);
    std::string_view held() const { return {buffer_.get() + begin_, end_ - begin_}; }
    // Moves the window's beginning on; at most by what it holds.
    void consume(std::size_t octets) { begin_ += octets; }
    // From the window's beginning on, the carriage return in front of a line feed is left out: one, if there
    // are more. Until restart().
    void joinLineEnds();

    // Whether the end that want() told of is that of a content that is gone; restart() goes on with the new
    // one.
    bool replaced() const { return replaced_; }
    void restart();

    // As Reader's.
    void wait(std::chrono::milliseconds most);
    Reader::Progress progress() const;
    const std::string& name() const { return name_; }

  private:
    void makeRoom(std::size_t octets);
    void joinLineEndsFrom(std::size_t from);
    State readMore();
    State atEnd();
    bool isReadable() const;
    bool isReplaced() const;
    bool isAnotherContent() const;
    void keepLastOctets();

    std::string name_;
    int file_ = -1;
    int ownWriter_ = -1;  // of a followed FIFO, so that it never ends
    bool follow_;
    bool isRegular_ = false;
    bool replaced_ = false;
    bool ended_ = false;
    bool paused_ = false;
    bool joinsLineEnds_ = false;
    bool heldReturn_ = false;  // a carriage return stands behind the window: a line feed may follow
    std::uint64_t read_ = 0;   // of the content that is read now
    std::unique_ptr<char[]> buffer_;
    std::size_t capacity_ = 0;
    std::size_t begin_ = 0;
    std::size_t end_ = 0;
    std::string last_;  // the last octets read before a pause
};

}  // namespace capture

#endif
