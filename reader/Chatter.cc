#include "reader/Chatter.h"

#include <unistd.h>

#include <algorithm>
#include <string>

#include "reader/text.h"
#include "recording/files.h"

namespace reader {

namespace {

constexpr std::chrono::milliseconds beforeTheFirst{1000};
constexpr std::chrono::milliseconds betweenTwo{200};
constexpr unsigned callsBetweenLooks = 64;
constexpr std::size_t barWidth = 40;

}  // namespace

Chatter::Chatter(Loudness loudness)
    : loudness_(loudness),
      mayDraw_(loudness != Loudness::quiet && isatty(STDERR_FILENO) == 1),
      next_(Clock::now() + beforeTheFirst) {}

Chatter::~Chatter() { clearBar(); }

void Chatter::say(std::string_view text) {
    const std::lock_guard lock(mutex_);
    clearBar();
    std::string line = "lapdread: ";
    appendForTerminal(line, text);
    line += '\n';
    recording::writeAll(STDERR_FILENO, line);
}

void Chatter::error(std::string_view text) { say(text); }

void Chatter::wrongUsage(std::string_view text) {
    say(text);
    wrongUsage_ = true;
}

void Chatter::note(std::string_view text) {
    if (loudness_ != Loudness::quiet)
        say(text);
}

void Chatter::detail(std::string_view text) {
    if (loudness_ == Loudness::verbose)
        say(text);
}

void Chatter::progress(std::uint64_t done, std::uint64_t of) {
    if (!mayDraw_)
        return;
    const std::lock_guard lock(mutex_);
    if (++calls_ % callsBetweenLooks != 0)
        return;
    if (const auto now = Clock::now(); now >= next_) {
        next_ = now + betweenTwo;
        draw(done, of);
    }
}

void Chatter::draw(std::uint64_t done, std::uint64_t of) {
    std::string bar = "\r";
    if (of > 0) {
        const std::uint64_t share = std::min<std::uint64_t>(done, of) * barWidth / of;
        bar += '[' + std::string(share, '#') + std::string(barWidth - share, '.') + "] ";
        appendNumber(bar, std::min<std::uint64_t>(done, of) * 100 / of);
        bar += " %";
    } else {
        appendNumber(bar, done >> 20U);
        bar += " MB read";
    }
    bar += "\x1b[K";
    drawn_ = true;
    recording::writeAll(STDERR_FILENO, bar);
}

void Chatter::clearBar() {
    if (drawn_)
        recording::writeAll(STDERR_FILENO, "\r\x1b[K");
    drawn_ = false;
}

}  // namespace reader
