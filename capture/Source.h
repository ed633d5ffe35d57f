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

// A file that is followed has no end. It may grow, be emptied in place, or be replaced by another file of its
// name; the source notices this by inode, size and the octets read last. A FIFO that is followed has no end
// either. Used by one thread at a time. Functions that read throw BadInput when the system refuses.
class Source {
  public:
    enum class State : std::uint8_t {
        ready,  // the window holds what was wanted
        pause,  // the input has not got it yet
        end     // the input has ended, and the window holds all that is left; see also replaced()
    };

    // "-" is the standard input. Waits for the writer of a FIFO.
    explicit Source(std::string path, bool follow = false);
    ~Source();
    Source(const Source&) = delete;
    Source& operator=(const Source&) = delete;

    // Tries to make the window hold at least so many octets. Views that held() returned before are not valid
    // any more.
    State want(std::size_t octets);
    std::string_view held() const { return {buffer_.get() + begin_, end_ - begin_}; }
    // Moves the beginning of the window forward, at most by the octets that it holds.
    void consume(std::size_t octets) { begin_ += octets; }
    // From the window's beginning on, the carriage return in front of a line feed is left out: one, if there
    // are more. Until restart().
    void joinLineEnds();

    // After want() has returned `end`: whether the file was emptied or replaced, so that there is a new
    // content. restart() begins to read it.
    bool replaced() const { return replaced_; }
    void restart();

    // These do what the functions of Reader do.
    void wait(std::chrono::milliseconds most);
    Reader::Progress progress() const;
    const std::string& name() const { return name_; }

  private:
    void makeRoom(std::size_t octets);
    void joinLineEndsFrom(std::size_t from);
    State readMore();
    State atEnd();
    State foundReplaced();
    bool isReadable() const;
    bool isReplaced() const;
    bool isAnotherContent() const;
    void keepLastOctets();

    std::string name_;
    int file_ = -1;
    int ownWriter_ = -1;  // open for a FIFO that is followed, so that it never ends
    bool follow_;
    bool isRegular_ = false;
    bool replaced_ = false;
    bool everReplaced_ = false;  // since it was opened
    bool ended_ = false;
    bool paused_ = false;
    bool joinsLineEnds_ = false;
    bool heldReturn_ = false;  // a carriage return was read last; a line feed may follow it
    std::uint64_t read_ = 0;   // octets read of the present content
    std::unique_ptr<char[]> buffer_;
    std::size_t capacity_ = 0;
    std::size_t begin_ = 0;
    std::size_t end_ = 0;
    std::string last_;  // the last octets read before a pause
};

}  // namespace capture

#endif
