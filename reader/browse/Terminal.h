// The terminal: shows a canvas, and gives the keys that are pressed. Its modes are restored however the
// program ends.
#ifndef READER_BROWSE_TERMINAL_H
#define READER_BROWSE_TERMINAL_H

#include <memory>
#include <optional>

#include "reader/browse/Canvas.h"
#include "reader/browse/Key.h"

namespace reader::browse {

// There is one at a time. Used on one thread.
class Terminal {
  public:
    struct Settings {
        bool colors = true;
        bool mouse = true;
        bool keysFromTty = false;  // the frames come from standard input, so keys come from /dev/tty
    };

    // Takes over the terminal of standard input and output, or /dev/tty if these are no terminal. Throws
    // FileError if there is no terminal that can show screens.
    explicit Terminal(const Settings& settings);
    ~Terminal();
    Terminal(const Terminal&) = delete;
    Terminal& operator=(const Terminal&) = delete;

    // For poll().
    int descriptor() const;
    // The next key that was pressed. Does not wait; returns nothing if there is none.
    std::optional<Key> key();
    // An empty canvas of the terminal's present size.
    Canvas canvas() const;
    void show(const Canvas& canvas);
    // The next show() draws everything anew.
    void forget();
    // Whether the terminal is gone, because its window or connection was closed.
    bool isGone() const;
    // Restores the terminal, stops the program as Ctrl-Z does, and takes the terminal over again when the
    // program is continued.
    void suspend();

  private:
    struct Held;
    std::unique_ptr<Held> held_;
};

}  // namespace reader::browse

#endif
