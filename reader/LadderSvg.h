// Ladders as one picture.
#ifndef READER_LADDERSVG_H
#define READER_LADDERSVG_H

#include <string>

#include "reader/CallLadder.h"

namespace reader {

// Scalable vector graphics 1.1 that need no other file: calls one below the other.
class LadderSvg {
  public:
    void add(const CallLadder& ladder, TimeText& times);
    // The whole picture, with its height.
    std::string picture() const;

  private:
    void putRung(const CallLadder& ladder, std::size_t number, TimeText& times);
    void putArrow(const Rung& rung, int y);

    std::string body_;
    int y_ = 0;  // the lower end of what was drawn, in pixels
};

}  // namespace reader

#endif
