// The text of the log that waits to be written, divided into entries.
#ifndef APP_LOGBLOCK_H
#define APP_LOGBLOCK_H

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include "app/LogFile.h"

namespace app {

struct LogEntry {
    std::size_t end;            // in the block's text
    bool isFrame = false;       // a frame; otherwise lines of the head, or the line of a gap
    bool isBegun = false;       // its beginning is in the file already
    unsigned long missing = 0;  // for the line of a gap: how many frames are missing
};

class LogBlock {
  public:
    const std::string& text() const { return text_; }
    const std::vector<LogEntry>& entries() const { return entries_; }

    void add(std::string_view entry, bool isFrame);
    // Adds the line of a gap. If the last entry is such a line, the two become one.
    void addGap(unsigned long frames);
    // Puts the line of a gap first, or after the rest of an entry whose beginning is in the file.
    void putGapFirst(unsigned long frames);

    bool holdsOnlyARest() const { return entries_.size() == 1 && entries_.front().isBegun; }
    void clear();
    // Drops everything but the octets from `begin` to `end`, the rest of an entry whose beginning is in the
    // file.
    void keepRest(std::size_t begin, std::size_t end, bool isFrame);

  private:
    std::size_t sizeOfRest() const;

    std::string text_;
    std::vector<LogEntry> entries_;
};

// What was lost when a write ended early.
struct LogLoss {
    unsigned long frames = 0;   // frames of the block that are not in the file
    unsigned long missing = 0;  // frames of which lost gap lines said that they are missing
};

// Repairs file and block after a write of the block that ended after `written` octets. Afterwards the file
// holds only whole entries, or the block holds the rest of the entry that is in the file in part. If the
// block begins with the line of a gap (`behindGap`) and the file can be shortened, the file keeps the whole
// block or nothing of it, so that a nearly full disk does not fill up with such lines.
LogLoss repair(const LogFile& file, LogBlock& block, std::size_t written, bool behindGap);

}  // namespace app

#endif
