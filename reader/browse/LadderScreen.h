// The ladder of a call, or of several: their messages as arrows between both sides.
#ifndef READER_BROWSE_LADDERSCREEN_H
#define READER_BROWSE_LADDERSCREEN_H

#include <cstdint>
#include <string>
#include <vector>

#include "reader/CallLadder.h"
#include "reader/LadderText.h"
#include "reader/browse/Cursor.h"
#include "reader/browse/Screen.h"

namespace reader::browse {

class LadderScreen : public Screen {
  public:
    LadderScreen(Desk& desk, std::vector<std::uint64_t> calls);

    std::string title() const override;
    void draw(Canvas& canvas, const Area& area) override;
    bool press(const Key& key) override;
    std::span<const KeyHint> keys() const override;
    void changed(const Changes& changes) override;

  private:
    void build(int width);
    void openMessage();
    void openComparison();
    const Rung* current() const;
    std::size_t rungAt(std::size_t line) const;

    std::vector<std::uint64_t> calls_;
    CallLadder ladder_;
    LadderLines lines_;
    int builtFor_ = 0;     // width; 0: it must be built anew
    Cursor cursor_;        // among the rungs
    std::size_t top_ = 0;  // the line of the text that is shown first
    int textTop_ = 0;
};

}  // namespace reader::browse

#endif
