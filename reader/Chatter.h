// What lapdread says about its work, on the standard error stream: never part of a command's data.
#ifndef READER_CHATTER_H
#define READER_CHATTER_H

#include <chrono>
#include <cstdint>
#include <string_view>

namespace reader {

enum class Loudness { quiet, usual, verbose };

// Says lines that begin with "lapdread: ". Not shared between threads.
class Chatter {
  public:
    explicit Chatter(Loudness loudness);

    // Removes the progress bar, if one is shown.
    ~Chatter();

    Chatter(const Chatter&) = delete;
    Chatter& operator=(const Chatter&) = delete;

    // What ends the program, or spoils its result: always said.
    void error(std::string_view text);
    // What is wrong with the command line as the input shows: always said; the exit status is that of wrong
    // usage.
    void wrongUsage(std::string_view text);
    bool hasWrongUsage() const { return wrongUsage_; }
    // What the user should know: said unless --quiet.
    void note(std::string_view text);
    // How the work goes on: said with --verbose.
    void detail(std::string_view text);

    // Draws how much of the work is done, when the standard error stream is a terminal, --quiet was not
    // given, and the work has taken a second. Cheap to call often; `of` may be 0 when nobody knows.
    void progress(std::uint64_t done, std::uint64_t of);
    // The bar would disturb data that goes to the same terminal.
    void forbidProgress() { mayDraw_ = false; }

  private:
    void say(std::string_view text);
    void draw(std::uint64_t done, std::uint64_t of);
    void clearBar();

    using Clock = std::chrono::steady_clock;

    Loudness loudness_;
    bool mayDraw_;
    bool drawn_ = false;
    bool wrongUsage_ = false;
    unsigned calls_ = 0;
    Clock::time_point next_;
};

}  // namespace reader

#endif
