// The terminal: shows a canvas, and gives keys. It is put back however the program ends.
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
        bool keysFromTty = false;  // standard input is what is read
    };

    // Takes the terminal over: that of standard input and output, or /dev/tty where these are none. Throws
    // FileError if there is none that can show screens.
    explicit Terminal(const Settings& settings);
    ~Terminal();
    Terminal(const Terminal&) = delete;
    Terminal& operator=(const Terminal&) = delete;

    // For poll().
    int descriptor() const;
    // The next key that was pressed; nothing if there is none just now.
    std::optional<Key> key();
    // As large as the terminal is now.
    Canvas canvas() const;
    void show(const Canvas& canvas);
    // The next show() draws everything anew.
    void forget();
    // The terminal has gone: the connection was closed.
    bool isGone() const;
    // Gives the terminal back, stops the program as the shell wants it, and goes on when it is continued.
    void suspend();

  private:
    struct Held;
    std::unique_ptr<Held> held_;
};

}  // namespace reader::browse

#endif
