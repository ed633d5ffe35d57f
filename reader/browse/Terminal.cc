#include "reader/browse/Terminal.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/ioctl.h>
#include <termios.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstring>
#include <string>

#include "reader/errors.h"

// Included after all other headers, because it defines many macros.
#define NCURSES_WIDECHAR 1
#define NCURSES_NOMACROS 1
#include <curses.h>

namespace reader::browse {

namespace {

constexpr int escapeDelay = 25;  // milliseconds in which the rest of a key's sequence has to come

// What a signal handler needs to restore the terminal after a crash. There is one terminal.
struct Emergency {
    int descriptor = -1;
    termios modes{};
    std::array<char, 256> text{};  // leaves the program's screen, shows the cursor, ends the mouse's reports
    std::size_t size = 0;
};
Emergency emergency;
constexpr std::array fatalSignals{SIGSEGV, SIGBUS, SIGFPE, SIGILL, SIGABRT};
std::array<struct sigaction, fatalSignals.size()> handlersBefore;

void putBackAndDie(int signal) {
    if (write(emergency.descriptor, emergency.text.data(), emergency.size) < 0) {
        // A write that fails cannot be reported here.
    }
    tcsetattr(emergency.descriptor, TCSANOW, &emergency.modes);
    for (std::size_t i = 0; i < fatalSignals.size(); ++i)
        sigaction(fatalSignals[i], &handlersBefore[i], nullptr);
    static_cast<void>(raise(signal));
}

void prepareEmergency(int descriptor, const termios& modes) {
    std::string text = "\x1b[?1000l\x1b[?1006l";
    for (const char* const name : {"rmkx", "sgr0", "cnorm", "rmcup"}) {
        const char* const sequence = tigetstr(name);
        if (sequence != nullptr &&
            sequence != reinterpret_cast<char*>(-1))  // NOLINT: as terminfo says "none"
            text += sequence;
    }
    emergency.descriptor = descriptor;
    emergency.modes = modes;
    emergency.size = std::min(text.size(), emergency.text.size());
    std::copy_n(text.begin(), emergency.size, emergency.text.begin());
    struct sigaction action {};
    action.sa_handler = putBackAndDie;
    for (std::size_t i = 0; i < fatalSignals.size(); ++i)
        sigaction(fatalSignals[i], &action, &handlersBefore[i]);
}

struct Closer {
    void operator()(std::FILE* file) const { static_cast<void>(std::fclose(file)); }
};
using File = std::unique_ptr<std::FILE, Closer>;

File opened(int descriptor, const char* mode, bool takeTty) {
    const int file = takeTty || isatty(descriptor) == 0 ? open("/dev/tty", O_RDWR | O_CLOEXEC)
                                                        : fcntl(descriptor, F_DUPFD_CLOEXEC, 0);
    if (file < 0)
        throw FileError("browse needs a terminal: " + std::string(std::strerror(errno)));
    return File(fdopen(file, mode));
}

// Call it when the terminal's description has been read.
bool canPlaceCursor() {
    const char* const sequence = tigetstr("cup");
    return sequence != nullptr && *sequence != '\0';
}

constexpr struct {
    Ink ink;
    short color;
} inkColors[] = {
    {Ink::ours, COLOR_GREEN},     {Ink::theirs, COLOR_CYAN}, {Ink::error, COLOR_RED},
    {Ink::warning, COLOR_YELLOW}, {Ink::note, COLOR_CYAN},   {Ink::title, COLOR_BLUE},
};

constexpr struct {
    int code;
    Key::Code key;
} codes[] = {
    {KEY_UP, Key::Code::up},
    {KEY_DOWN, Key::Code::down},
    {KEY_LEFT, Key::Code::left},
    {KEY_RIGHT, Key::Code::right},
    {KEY_PPAGE, Key::Code::pageUp},
    {KEY_NPAGE, Key::Code::pageDown},
    {KEY_HOME, Key::Code::home},
    {KEY_END, Key::Code::end},
    {KEY_ENTER, Key::Code::enter},
    {KEY_BTAB, Key::Code::backTab},
    {KEY_BACKSPACE, Key::Code::backspace},
    {KEY_DC, Key::Code::backspace},
    {KEY_F(1), Key::Code::help},
};

std::optional<Key> keyOfMouse() {
    MEVENT event{};
    if (getmouse(&event) != OK)
        return std::nullopt;
    Key key;
    key.x = event.x;
    key.y = event.y;
    using Clock = std::chrono::steady_clock;
    constexpr std::chrono::milliseconds twice{400};
    static Key last;
    static Clock::time_point lastAt;
    if ((event.bstate & BUTTON4_PRESSED) != 0)
        key.code = Key::Code::wheelUp;
    else if ((event.bstate & BUTTON5_PRESSED) != 0)
        key.code = Key::Code::wheelDown;
    else if ((event.bstate & BUTTON1_PRESSED) == 0)
        return std::nullopt;
    else
        key.code = last.x == key.x && last.y == key.y && Clock::now() - lastAt < twice
                       ? Key::Code::doubleClick
                       : Key::Code::click;
    last = key;
    lastAt = Clock::now();
    return key;
}

std::optional<Key> keyOfCode(int code) {
    if (code == KEY_MOUSE)
        return keyOfMouse();
    const auto* const found =
        std::find_if(std::begin(codes), std::end(codes), [&](const auto& row) { return row.code == code; });
    return found == std::end(codes) ? std::nullopt : std::optional(Key{found->key});
}

std::optional<Key> keyOfCharacter(wint_t character) {
    switch (character) {
        case L'\n':
        case L'\r':
            return Key{Key::Code::enter};
        case L'\t':
            return Key{Key::Code::tab};
        case L'\b':
        case 0x7F:
            return Key{Key::Code::backspace};
        case 0x1B:
            return Key{Key::Code::escape};
        default:
            return Key{Key::Code::character, static_cast<char32_t>(character)};
    }
}

}  // namespace

struct Terminal::Held {
    struct ScreenEnd {
        void operator()(SCREEN* ended) const {
            endwin();
            delscreen(ended);
        }
    };

    File in, out;
    std::unique_ptr<SCREEN, ScreenEnd> screen;
    bool colors = false;

    attr_t attributesOf(const Style& style) const {
        attr_t attributes = A_NORMAL;
        if (style.bold)
            attributes |= A_BOLD;
        if (style.reverse)
            attributes |= A_REVERSE;
        if (style.ink == Ink::faint && colors)
            attributes |= A_DIM;
        return attributes;
    }
};

Terminal::Terminal(const Settings& settings) : held_(std::make_unique<Held>()) {
    held_->in = opened(STDIN_FILENO, "r", settings.keysFromTty);
    held_->out = opened(STDOUT_FILENO, "w", false);
    termios modes{};
    tcgetattr(fileno(held_->out.get()), &modes);
    set_escdelay(escapeDelay);
    held_->screen.reset(newterm(nullptr, held_->out.get(), held_->in.get()));
    if (held_->screen == nullptr || !canPlaceCursor()) {
        held_->screen.reset();
        const char* const name = std::getenv("TERM");
        throw FileError("browse cannot show screens on a terminal of the kind TERM=" +
                        std::string(name == nullptr ? "" : name));
    }
    prepareEmergency(fileno(held_->out.get()), modes);
    cbreak();
    noecho();
    nonl();
    keypad(stdscr, TRUE);
    nodelay(stdscr, TRUE);
    leaveok(stdscr, TRUE);
    curs_set(0);
    if (settings.colors && has_colors()) {
        held_->colors = true;
        start_color();
        use_default_colors();
        for (const auto& row : inkColors)
            init_pair(static_cast<short>(row.ink), row.color, -1);
    }
    if (settings.mouse) {
        mousemask(BUTTON1_PRESSED | BUTTON4_PRESSED | BUTTON5_PRESSED, nullptr);
        mouseinterval(0);  // report a press at once, without waiting for a double click
    }
}

Terminal::~Terminal() {
    for (std::size_t i = 0; i < fatalSignals.size(); ++i)
        sigaction(fatalSignals[i], &handlersBefore[i], nullptr);
}

int Terminal::descriptor() const { return fileno(held_->in.get()); }

std::optional<Key> Terminal::key() {
    for (;;) {
        wint_t character = 0;
        const int result = get_wch(&character);
        if (result == ERR)
            return std::nullopt;
        constexpr wint_t redraw = 0x0C;  // Ctrl-L
        if ((result == KEY_CODE_YES && character == KEY_RESIZE) || (result == OK && character == redraw)) {
            clearok(curscr, TRUE);
            continue;
        }
        const auto key =
            result == KEY_CODE_YES ? keyOfCode(static_cast<int>(character)) : keyOfCharacter(character);
        if (key)
            return key;
    }
}

Canvas Terminal::canvas() const { return {getmaxx(stdscr), getmaxy(stdscr)}; }

void Terminal::show(const Canvas& canvas) {
    for (int y = 0; y < canvas.height(); ++y) {
        for (int x = 0; x < canvas.width(); ++x) {
            const Cell& cell = canvas.at(x, y);
            if (cell.isSecondHalf)
                continue;
            const wchar_t text[] = {static_cast<wchar_t>(cell.character), L'\0'};
            cchar_t shown{};
            const bool isColored =
                held_->colors && cell.style.ink != Ink::plain && cell.style.ink != Ink::faint;
            setcchar(&shown, text, held_->attributesOf(cell.style),
                     isColored ? static_cast<short>(cell.style.ink) : static_cast<short>(0), nullptr);
            mvadd_wch(y, x, &shown);
        }
    }
    ::refresh();
}

void Terminal::forget() { clearok(curscr, TRUE); }

bool Terminal::isGone() const {
    pollfd terminal{descriptor(), POLLIN, 0};
    return ::poll(&terminal, 1, 0) > 0 && (terminal.revents & (POLLHUP | POLLERR | POLLNVAL)) != 0;
}

void Terminal::suspend() {
    endwin();
    static_cast<void>(raise(SIGSTOP));
    clearok(curscr, TRUE);
    ::refresh();
}

}  // namespace reader::browse
