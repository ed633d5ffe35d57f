// What the application writes: to the screen, and to the log.
#ifndef TESTS_APP_CHANNELS_H
#define TESTS_APP_CHANNELS_H

#include <cstdio>
#include <cstdlib>
#include <iostream>
#include <sstream>
#include <string>

#include "decoder/lines.h"
#include "decoder/state.h"

namespace app::testing {

// For its lifetime standard output is kept here.
class Screen {
  public:
    Screen() : terminal_(std::cout.rdbuf(kept_.rdbuf())) {}
    ~Screen() { std::cout.rdbuf(terminal_); }
    Screen(const Screen&) = delete;
    Screen& operator=(const Screen&) = delete;

    std::string text() const { return kept_.str(); }

  private:
    std::ostringstream kept_;
    std::streambuf* terminal_;
};

// For its lifetime the log is kept here. Holds only what was handed to the log: composed lines that were left
// behind are missing.
class Log {
  public:
    Log() : stream_(open_memstream(&data_, &size_)) {
        decoder::ofp = stream_;
        decoder::writeLog = decoder::writeToStream;  // whatever log a test before this one has left
        decoder::file_output = true;
    }
    ~Log() {
        decoder::ofp = nullptr;
        decoder::file_output = false;
        (void)std::fclose(stream_);
        std::free(data_);  // NOLINT(*-no-malloc): the C library's own
    }
    Log(const Log&) = delete;
    Log& operator=(const Log&) = delete;

    std::string text() const {
        (void)std::fflush(stream_);
        return {data_, size_};
    }

  private:
    char* data_ = nullptr;
    std::size_t size_ = 0;
    std::FILE* stream_ = nullptr;
};

// The text with every date and time of 24 characters replaced by DATE.
std::string dated(const std::string& text);

// The indent of a transmitted frame's lines.
inline const std::string blanks(33, ' ');

}  // namespace app::testing

#endif
