// The interface of a screen, which shows a part of the trace and takes keys, and the interface through which
// a screen reaches the program.
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

// The numbers of the calls and frames that the user has marked.
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

// What a screen may ask of the program. Used on one thread.
class Desk {
  public:
    Desk() = default;
    Desk(const Desk&) = delete;
    Desk& operator=(const Desk&) = delete;
    virtual ~Desk() = default;

    virtual const Trace& trace() const = 0;
    virtual Marked& marked() = 0;
    virtual TimeText& times() = 0;
    // Whether lines may be drawn with characters of UTF-8.
    virtual bool hasUtf8() const = 0;
    // Shows a screen in front of the one that calls. The program owns it.
    virtual void open(std::unique_ptr<Screen> screen) = 0;
    // Destroys the screen that calls, once its function has returned.
    virtual void close() = 0;
    // Shows a line of text in place of the keys, until the user presses the next key.
    virtual void say(std::string words) = 0;
    // Begins to write the file and returns. say() later shows how that ended.
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

    // The line above the screen, which says what the screen shows.
    virtual std::string title() const = 0;
    virtual void draw(Canvas& canvas, const Area& area) = 0;
    // Returns false if the screen has no use for the key.
    virtual bool press(const Key& key) = 0;
    virtual std::span<const KeyHint> keys() const = 0;
    // Whether the user types text at present, so that letters are no commands.
    virtual bool isTyping() const { return false; }
    // The trace has changed. Called before the screen is drawn from it.
    virtual void changed(const Changes& /*changes*/) {}
    // Goes on with work that takes long, at most until this time. Returns true if there is more to do.
    virtual bool work(Clock::time_point /*until*/) { return false; }

  protected:
    Desk& desk() const { return desk_; }
    const Trace& trace() const { return desk_.trace(); }

  private:
    Desk& desk_;
};

}  // namespace reader::browse

#endif
