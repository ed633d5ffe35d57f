#include "app/LogBlock.h"

#include <algorithm>
#include <iterator>

#include "decoder/log_lines.h"

namespace app {

namespace {

std::string gapLine(unsigned long frames) { return decoder::framesLost + std::to_string(frames) + " \n"; }

}  // namespace

void LogBlock::add(std::string_view entry, bool isFrame) {
    text_ += entry;
    entries_.push_back({.end = text_.size(), .isFrame = isFrame});
}

void LogBlock::addGap(unsigned long frames) {
    if (!entries_.empty() && entries_.back().missing != 0) {
        frames += entries_.back().missing;
        entries_.pop_back();
        text_.resize(entries_.empty() ? 0 : entries_.back().end);
    }
    text_ += gapLine(frames);
    entries_.push_back({.end = text_.size(), .missing = frames});
}

void LogBlock::putGapFirst(unsigned long frames) {
    const std::string line = gapLine(frames);
    const std::size_t at = sizeOfRest();
    for (LogEntry& entry : entries_)
        entry.end += entry.isBegun ? 0 : line.size();
    text_.insert(at, line);
    entries_.insert(entries_.begin() + (at == 0 ? 0 : 1), {.end = at + line.size(), .missing = frames});
}

std::size_t LogBlock::sizeOfRest() const {
    return !entries_.empty() && entries_.front().isBegun ? entries_.front().end : 0;
}

void LogBlock::clear() {
    text_.clear();
    entries_.clear();
}

void LogBlock::keepRest(std::size_t begin, std::size_t end, bool isFrame) {
    text_ = text_.substr(begin, end - begin);
    entries_ = {{.end = text_.size(), .isFrame = isFrame, .isBegun = true}};
}

LogLoss repair(const LogFile& file, LogBlock& block, std::size_t written, bool behindGap) {
    // 1. After a gap, remove from the file what was written of the block, if the file can be shortened.
    if (behindGap && file.takeBack(written))
        written = 0;

    // 2. Find the entry in which the write ended; those before it are whole.
    const std::vector<LogEntry>& entries = block.entries();
    const auto cut = std::find_if(entries.begin(), entries.end(),
                                  [written](const LogEntry& entry) { return written < entry.end; });
    const std::size_t begin = cut == entries.begin() ? 0 : std::prev(cut)->end;

    // 3. Remove from the file what was written of that entry. If that is not possible, its rest is written
    // first later.
    const bool nothingOfIt = !cut->isBegun && (written == begin || file.takeBack(written - begin));
    const auto firstLost = nothingOfIt ? cut : std::next(cut);

    // 4. All entries after it are lost.
    LogLoss loss;
    for (auto lost = firstLost; lost != entries.end(); ++lost) {
        loss.frames += lost->isFrame ? 1 : 0;
        loss.missing += lost->missing;
    }
    if (nothingOfIt)
        block.clear();
    else
        block.keepRest(written, cut->end, cut->isFrame);
    return loss;
}

}  // namespace app
