// A record of every message between host and board, in order. Safe from any thread.
#ifndef SOFTBOARD_JOURNAL_H
#define SOFTBOARD_JOURNAL_H

#include <chrono>
#include <condition_variable>
#include <deque>
#include <map>
#include <mutex>
#include <string>

#include "softboard/message.h"

namespace softboard {

class Journal {
  public:
    enum class Way { hostToBoard, boardToHost, hostToHost, hostToNobody, boardToNobody };

    Journal() = default;
    ~Journal();
    Journal(const Journal&) = delete;
    Journal& operator=(const Journal&) = delete;

    // From now on each line also goes to the end of the file at once. False, with errno, when it cannot.
    bool writeTo(const std::string& file);

    void add(Way way, const Message& message);
    // A line that is no message.
    void note(const std::string& text);

    // The lines as they stand in the file; the newest 65536 of them.
    std::string text() const;
    // What the host has sent, as "8 {Parm 10 Val 1}\n" each.
    std::string heard() const;
    void clear();

    // Waits until `count` messages of the type have been recorded since clear(); false when `limit` passed
    // first.
    bool waitFor(uint32_t type, size_t count, std::chrono::milliseconds limit) const;

  private:
    struct Line {
        std::string text;
        std::string heard;  // empty for what the host did not send
    };

    void append(Line line);

    mutable std::mutex lock_;
    mutable std::condition_variable grown_;
    std::deque<Line> lines_;
    std::map<uint32_t, size_t> counts_;
    int file_ = -1;
};

}  // namespace softboard

#endif
