// The list of calls: one line for each, as `lapdread calls` prints it.
#ifndef READER_BROWSE_CALLSSCREEN_H
#define READER_BROWSE_CALLSSCREEN_H

#include <cstdint>
#include <string>
#include <vector>

#include "reader/CallLine.h"
#include "reader/browse/CallList.h"
#include "reader/browse/Cursor.h"
#include "reader/browse/LineInput.h"
#include "reader/browse/Screen.h"

namespace reader::browse {

class CallsScreen : public Screen {
  public:
    explicit CallsScreen(Desk& desk) : Screen(desk), list_(desk) {}

    std::string title() const override;
    void draw(Canvas& canvas, const Area& area) override;
    bool press(const Key& key) override;
    std::span<const KeyHint> keys() const override;
    bool isTyping() const override { return isTyping_; }
    void changed(const Changes& changes) override;
    bool work(Clock::time_point until) override;

    // Puts the cursor on a call. Removes the filter if it hides the call.
    void goTo(std::uint64_t call);

  private:
    void drawLine(Canvas& canvas, const Area& area, int y, const calls::Call& call, Style style);
    void pressTyping(const Key& key);
    void setFilter(const std::string& words);
    std::uint64_t current() const;
    void keepPlace();
    void openLadder();
    void compare();

    CallList list_;
    Cursor cursor_;
    // The number of the call that the cursor is on. The cursor stays on it when other calls come or go. If
    // followsEnd_ is set, the cursor is on the last line and moves to each new last call.
    std::uint64_t current_ = 0;
    bool followsEnd_ = false;
    LineInput input_;
    bool isTyping_ = false;
    int listTop_ = 0;
    std::vector<const CallLineColumn*> columns_;  // of the screen's width
    bool hasDates_ = true;
};

}  // namespace reader::browse

#endif
