// The screens without a terminal: what was read of a file, keys, and the text of the screen.
#ifndef TESTS_READER_BROWSE_STAGE_H
#define TESTS_READER_BROWSE_STAGE_H

#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "reader/Options.h"
#include "reader/browse/Browser.h"
#include "reader/browse/Collector.h"
#include "reader/session.h"

namespace reader::browse::testing {

// Reads the whole file before it returns. Paths that are relative are those of the source tree.
class Stage {
  public:
    explicit Stage(const std::string& file, bool utf8 = false, Options options = {});

    // Words: names of keys ("Down", "Enter", "Esc", "Space"), or letters that are typed one by one.
    void press(std::string_view words);
    void press(const Key& key);
    // All lines, as they are on a terminal of this size.
    std::string screen(int width = 80, int height = 24);
    Canvas drawn(int width, int height);
    // One line of it.
    std::string line(int y) { return drawn(80, 24).line(y); }

    Browser& browser() { return *browser_; }
    const std::vector<SaveOrder>& saved() const { return saved_; }

  private:
    void settle();

    std::vector<SaveOrder> saved_;
    Options options_;
    Chatter quiet_{Loudness::quiet};
    std::unique_ptr<Browser> browser_;
    UpdateQueue queue_;
    std::unique_ptr<Collector> collector_;  // pages refer to names that it keeps
};

}  // namespace reader::browse::testing

#endif
