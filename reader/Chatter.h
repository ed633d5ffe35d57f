// Writes what lapdread says about its work to the standard error stream. This is never part of a command's
// data.
#ifndef READER_CHATTER_H
#define READER_CHATTER_H

#include <atomic>
#include <chrono>
#include <cstdint>
#include <mutex>
#include <string_view>

namespace reader {

enum class Loudness { quiet, usual, verbose };

// Writes lines that begin with "lapdread: ". Any thread may call error(), wrongUsage(), note(), detail() and
// progress().
class Chatter {
  public:
    explicit Chatter(Loudness loudness);

    // Removes the progress bar, if one is shown.
    ~Chatter();

    Chatter(const Chatter&) = delete;
    Chatter& operator=(const Chatter&) = delete;

    // Says what ends the program or spoils its result. It is always said.
    void error(std::string_view text);
    // Says that the command line does not fit the input. It is always said, and the exit status becomes that
    // of wrong usage.
    void wrongUsage(std::string_view text);
    bool hasWrongUsage() const { return wrongUsage_; }
    // Says what the user should know, unless --quiet is given.
    void note(std::string_view text);
    // Says how the work goes on, if --verbose is given.
    void detail(std::string_view text);

    // Draws a bar that shows how much of the work is done, if the standard error stream is a terminal,
    // --quiet is not given, and the work has taken a second. Calling it often costs little. `of` is 0 if the
    // size of the work is not known.
    void progress(std::uint64_t done, std::uint64_t of);
    // Never draw the bar, because data go to the same terminal.
    void forbidProgress() { mayDraw_ = false; }

  private:
    void say(std::string_view text);
    void draw(std::uint64_t done, std::uint64_t of);
    void clearBar();

    using Clock = std::chrono::steady_clock;

    Loudness loudness_;
    bool mayDraw_;
    std::mutex mutex_;  // guards the stream and everything below
    bool drawn_ = false;
    std::atomic<bool> wrongUsage_ = false;
    unsigned calls_ = 0;
    Clock::time_point next_;
};

}  // namespace reader

#endif
