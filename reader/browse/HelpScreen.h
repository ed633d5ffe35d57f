// Explains the keys of the screen from which it was opened, and the keys that work on every screen.
#ifndef READER_BROWSE_HELPSCREEN_H
#define READER_BROWSE_HELPSCREEN_H

#include <string>
#include <vector>

#include "reader/browse/Cursor.h"
#include "reader/browse/Screen.h"

namespace reader::browse {

class HelpScreen : public Screen {
  public:
    HelpScreen(Desk& desk, std::span<const KeyHint> ofScreen, std::span<const KeyHint> everywhere)
        : Screen(desk), ofScreen_(ofScreen), everywhere_(everywhere) {}

    std::string title() const override { return "Keys"; }
    void draw(Canvas& canvas, const Area& area) override;
    bool press(const Key& key) override { return cursor_.press(key); }
    std::span<const KeyHint> keys() const override { return {}; }

  private:
    std::span<const KeyHint> ofScreen_;
    std::span<const KeyHint> everywhere_;
    Cursor cursor_;
};

}  // namespace reader::browse

#endif
