// Where one looks in a list, and which part of it is shown.
#ifndef READER_BROWSE_CURSOR_H
#define READER_BROWSE_CURSOR_H

#include <cstddef>

#include "reader/browse/Key.h"

namespace reader::browse {

class Cursor {
  public:
    // The list has so many lines, of which `height` are shown. Keeps the cursor in it, and in sight.
    void fit(std::size_t lines, int height);
    // True if the key moves a cursor.
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
