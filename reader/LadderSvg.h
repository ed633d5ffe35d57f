// Draws ladders as one picture.
#ifndef READER_LADDERSVG_H
#define READER_LADDERSVG_H

#include <string>
#include <string_view>

#include "reader/CallLadder.h"

namespace reader {

// Scalable vector graphics 1.1 that need no other file: calls one below the other.
class LadderSvg {
  public:
    void add(const CallLadder& ladder, TimeText& times);
    // The whole picture, with its height.
    std::string picture() const;
    // The picture as a part of a page, with `label` as its text for people who cannot see it. The page's
    // stylesheet must have the rules for its classes, and the page must contain definitions() once.
    std::string part(std::string_view label) const;
    // The heads of arrows, to be put into an <svg> of the page.
    static std::string definitions();

  private:
    void putRung(const CallLadder& ladder, std::size_t number, TimeText& times);
    void putArrow(const Rung& rung, int y);

    std::string body_;
    int y_ = 0;  // the lower end of what was drawn, in pixels
};

}  // namespace reader

#endif
