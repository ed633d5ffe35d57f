#include "capture/lines.h"

#include <utility>

namespace capture {

Source::State Lines::next(std::string_view& line) {
    source_.consume(std::exchange(toConsume_, 0));
    std::size_t searched = 0;
    while (true) {
        const std::string_view held = source_.held();
        std::size_t end = held.find('\n', searched);
        Source::State state = Source::State::ready;
        if (end == std::string_view::npos && held.size() < longest) {
            searched = held.size();
            state = source_.want(held.size() + 1);
            if (state == Source::State::ready)
                continue;
            if (state == Source::State::pause || held.empty())
                return state;
        }
        if (end == std::string_view::npos)
            end = source_.held().size();
        line = source_.held().substr(0, end);
        toConsume_ = end < source_.held().size() ? end + 1 : end;
        ++number_;
        if (line.ends_with('\r'))
            line.remove_suffix(1);
        return Source::State::ready;
    }
}

}  // namespace capture
