// The journal: every message between host and boards as a line of text, in the order in which the board saw
// them. docs/user/softboard.md gives the form.
//
// Any thread may call any function; the class has a lock of its own.
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
    // From whom to whom. "Nobody": no board or host queue has the target address.
    enum class Way { hostToBoard, boardToHost, hostToHost, hostToNobody, boardToNobody };

    Journal() = default;
    ~Journal();
    Journal(const Journal&) = delete;
    Journal& operator=(const Journal&) = delete;

    // From now on appends each new line to the file at once. Returns false, with errno set, when the file
    // cannot be opened.
    bool writeTo(const std::string& file);

    void add(Way way, const Message& message);
    // Adds a line that is not about a message.
    void note(const std::string& text);

    // All lines as they are in the file. Only the newest 65536 are kept in memory.
    std::string text() const;
    // Only the messages that the host has sent to boards, a line each: "8 {Parm 10 Val 1}\n".
    std::string heard() const;
    // Empties the memory, not the file.
    void clear();

    // Waits until `count` messages of the type have been added since clear(). Returns false when `limit` has
    // passed before.
    bool waitFor(uint32_t type, size_t count, std::chrono::milliseconds limit) const;

  private:
    struct Line {
        std::string text;
        std::string heard;  // empty when the host did not send the message
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
