// A screen: it shows a part of the trace, and takes keys.
#ifndef READER_BROWSE_SCREEN_H
#define READER_BROWSE_SCREEN_H

#include <chrono>
#include <cstdint>
#include <memory>
#include <set>
#include <span>
#include <string>
#include <string_view>

#include "reader/TimeText.h"
#include "reader/browse/Canvas.h"
#include "reader/browse/Key.h"
#include "reader/browse/Trace.h"

namespace reader::browse {

class Screen;

// What the user has marked, by number.
struct Marked {
    std::set<std::uint64_t> calls{};
    std::set<std::uint64_t> frames{};

    bool empty() const { return calls.empty() && frames.empty(); }
};

// Frames that are to be written into a file.
struct SaveOrder {
    std::string path;
    std::set<std::uint64_t> frames;
    bool redacted = false;
};

// What screens ask of the program that shows them.
class Desk {
  public:
    Desk() = default;
    Desk(const Desk&) = delete;
    Desk& operator=(const Desk&) = delete;
    virtual ~Desk() = default;

    virtual const Trace& trace() const = 0;
    virtual Marked& marked() = 0;
    virtual TimeText& times() = 0;
    // Lines may be drawn with UTF-8.
    virtual bool hasUtf8() const = 0;
    // Puts a screen in front of the one that asks.
    virtual void open(std::unique_ptr<Screen> screen) = 0;
    // Puts the one that asks away, as soon as it has returned.
    virtual void close() = 0;
    // A line for the user, in the place of the keys until the next one is pressed.
    virtual void say(std::string words) = 0;
    // Begins to write; what came of it is said later.
    virtual void save(SaveOrder order) = 0;
};

// A key as the last line and the help name it.
struct KeyHint {
    std::string_view key;
    std::string_view what;
    std::string_view help;  // a sentence
};

class Screen {
  public:
    using Clock = std::chrono::steady_clock;

    explicit Screen(Desk& desk) : desk_(desk) {}
    Screen(const Screen&) = delete;
    Screen& operator=(const Screen&) = delete;
    virtual ~Screen() = default;

    // What is shown, in a line of its own above the screen.
    virtual std::string title() const = 0;
    virtual void draw(Canvas& canvas, const Area& area) = 0;
    // False if it has no use for the key.
    virtual bool press(const Key& key) = 0;
    virtual std::span<const KeyHint> keys() const = 0;
    // Letters are text, and not keys.
    virtual bool isTyping() const { return false; }
    // News have come. Called in any case before `draw`.
    virtual void changed(const Changes& /*changes*/) {}
    // Goes on with long work for as long as there is time. True if there is more to do.
    virtual bool work(Clock::time_point /*until*/) { return false; }

  protected:
    Desk& desk() const { return desk_; }
    const Trace& trace() const { return desk_.trace(); }

  private:
    Desk& desk_;
};

}  // namespace reader::browse

#endif
