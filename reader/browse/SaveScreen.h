// Asks for the file into which marked frames are saved, and whether they are redacted.
#ifndef READER_BROWSE_SAVESCREEN_H
#define READER_BROWSE_SAVESCREEN_H

#include <set>
#include <string>

#include "reader/browse/LineInput.h"
#include "reader/browse/Screen.h"

namespace reader::browse {

class SaveScreen : public Screen {
  public:
    // Saves what the user has marked; if nothing is marked, `otherwise`.
    SaveScreen(Desk& desk, const Marked& otherwise);

    std::string title() const override { return "Save"; }
    void draw(Canvas& canvas, const Area& area) override;
    bool press(const Key& key) override;
    std::span<const KeyHint> keys() const override;
    bool isTyping() const override { return true; }

  private:
    void save();

    Marked chosen_;
    std::set<std::uint64_t> frames_;
    LineInput path_;
    bool redacted_ = false;
    bool isOnPath_ = true;
    bool mayReplace_ = false;  // the user was told that there is such a file
    std::string complaint_;
};

}  // namespace reader::browse

#endif
