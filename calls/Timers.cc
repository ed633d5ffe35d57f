#include "calls/Timers.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <charconv>

namespace calls {

namespace {

constexpr std::array names{
    TimerName{"T200", &Timers::t200, "Q.921 5.9.1"},
    TimerName{"T201", &Timers::t201, "Q.921 5.9.2"},
    TimerName{"T203", &Timers::t203, "Q.921 5.9.8"},
    TimerName{"T301", &Timers::t301, "Q.931 9.1"},
    TimerName{"T302", &Timers::t302, "Q.931 9.1"},
    TimerName{"T303", &Timers::t303, "Q.931 9.1"},
    TimerName{"T304-network", &Timers::t304Network, "Q.931 9.1"},
    TimerName{"T304-user", &Timers::t304User, "Q.931 9.2"},
    TimerName{"T305", &Timers::t305, "Q.931 9.1"},
    TimerName{"T306", &Timers::t306, "Q.931 9.1"},
    TimerName{"T307", &Timers::t307, "Q.931 9.1"},
    TimerName{"T308", &Timers::t308, "Q.931 9.1"},
    TimerName{"T309", &Timers::t309, "Q.931 9.1"},
    TimerName{"T310-network", &Timers::t310Network, "Q.931 9.1"},
    TimerName{"T310-user", &Timers::t310User, "Q.931 9.2"},
    TimerName{"T312", &Timers::t312, "Q.931 9.1"},
    TimerName{"T313", &Timers::t313, "Q.931 9.2"},
    TimerName{"T314", &Timers::t314, "Q.931 9.1"},
    TimerName{"T316", &Timers::t316, "Q.931 9.1"},
    TimerName{"T318", &Timers::t318, "Q.931 9.2"},
    TimerName{"T319", &Timers::t319, "Q.931 9.2"},
    TimerName{"T322", &Timers::t322, "Q.931 9.1"},
};

struct Unit {
    std::string_view name;
    std::int64_t nanoseconds;
};
constexpr std::array units{Unit{"", second}, Unit{"s", second}, Unit{"ms", millisecond},
                           Unit{"min", 60 * second}};

bool same(std::string_view a, std::string_view b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end(),
                      [](unsigned char x, unsigned char y) { return std::tolower(x) == std::tolower(y); });
}

std::int64_t durationOf(std::string_view text) {
    double number = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    const std::string_view unit(end, static_cast<std::size_t>(text.data() + text.size() - end));
    const auto* const known =
        std::find_if(units.begin(), units.end(), [&](const Unit& u) { return same(u.name, unit); });
    constexpr double longest = 86400 * 7;
    if (error != std::errc() || known == units.end() || !(number > 0) ||
        number * static_cast<double>(known->nanoseconds) > longest * static_cast<double>(second))
        throw BadTimer("\"" + std::string(text) + "\" is no duration: a number with s, ms or min is needed");
    return static_cast<std::int64_t>(number * static_cast<double>(known->nanoseconds));
}

}  // namespace

std::span<const TimerName> timerNames() { return names; }

void setTimer(Timers& timers, std::string_view setting) {
    const std::size_t equals = setting.find('=');
    if (equals == std::string_view::npos)
        throw BadTimer("\"" + std::string(setting) + "\" sets no timer: write T305=4s");
    const std::string_view name = setting.substr(0, equals);
    bool known = false;
    for (const TimerName& timer : names) {
        if (same(timer.name, name) || same(timer.name.substr(0, timer.name.find('-')), name)) {
            timers.*timer.value = durationOf(setting.substr(equals + 1));
            known = true;
        }
    }
    if (!known)
        throw BadTimer("there is no timer \"" + std::string(name) + "\"");
}

}  // namespace calls
