// The line of a list that the cursor is on, and the part of the list that is shown.
#ifndef READER_BROWSE_CURSOR_H
#define READER_BROWSE_CURSOR_H

#include <cstddef>

#include "reader/browse/Key.h"

namespace reader::browse {

class Cursor {
  public:
    // Says how many lines the list has, and that `height` of them are shown. Moves the cursor into the list,
    // and the part that is shown to the cursor.
    void fit(std::size_t lines, int height);
    // Moves the cursor. Returns false if the key moves no cursor.
    bool press(const Key& key);
    void moveTo(std::size_t line) { line_ = line; }

    std::size_t line() const { return line_; }
    std::size_t top() const { return top_; }
    bool isAtEnd() const { return lines_ == 0 || line_ + 1 >= lines_; }

  private:
    std::size_t line_ = 0;
    std::size_t top_ = 0;
    std::size_t lines_ = 0;
    std::size_t height_ = 1;
};

}  // namespace reader::browse

#endif
