// `lapdread browse` without its terminal: the screens, of which one is in front, and what they share.
#ifndef READER_BROWSE_BROWSER_H
#define READER_BROWSE_BROWSER_H

#include <array>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "reader/browse/Screen.h"

namespace reader::browse {

// Used on one thread.
class Browser : public Desk {
  public:
    struct Settings {
        std::string source;  // the input's name, for the first line
        bool utf8 = false;
        std::size_t mostItems = FrameStore::usualMost;
        // Begins to write frames of the store to a file. Whoever sets this calls say() with the result.
        std::function<void(const FrameStore&, SaveOrder)> save = [](const FrameStore&, const SaveOrder&) {};
    };

    explicit Browser(Settings settings);

    // Takes over what the reading thread has found, and tells the screens what has changed.
    void apply(Update update);
    void press(Key key);
    // Goes on with work that takes long, such as filtering, at most until this time. Returns true if there is
    // more to do.
    bool work(Screen::Clock::time_point until);
    void draw(Canvas& canvas);
    bool isDone() const { return isDone_; }

    const Trace& trace() const override { return trace_; }
    Marked& marked() override { return marked_; }
    TimeText& times() override { return times_; }
    bool hasUtf8() const override { return settings_.utf8; }
    void open(std::unique_ptr<Screen> screen) override;
    void close() override { mustClose_ = true; }
    void say(std::string words) override { said_ = std::move(words); }
    void save(SaveOrder order) override;

  private:
    static constexpr std::size_t tabCount = 3;

    Screen& front() const { return opened_.empty() ? *tabs_[tab_] : *opened_.back(); }
    bool pressEverywhere(const Key& key);
    void showTab(std::size_t tab);
    void leave();
    void drawTop(Canvas& canvas);
    void drawFoot(Canvas& canvas) const;
    std::string state() const;

    Settings settings_;
    Trace trace_;
    Marked marked_;
    TimeText times_;
    std::array<std::unique_ptr<Screen>, tabCount> tabs_;
    std::array<int, tabCount + 1> tabAt_{};  // columns of the first line where the tabs' names begin
    std::size_t tab_ = 1;
    std::vector<std::unique_ptr<Screen>> opened_;  // the last one is in front
    std::string said_;
    bool mustClose_ = false;
    bool isDone_ = false;
};

}  // namespace reader::browse

#endif
