// A key that the user pressed, or what the mouse did.
#ifndef READER_BROWSE_KEY_H
#define READER_BROWSE_KEY_H

#include <cstdint>

namespace reader::browse {

struct Key {
    enum class Code : std::uint8_t {
        character,
        up,
        down,
        left,
        right,
        pageUp,
        pageDown,
        home,
        end,
        enter,
        escape,
        tab,
        backTab,
        backspace,
        help,
        click,        // at x, y
        doubleClick,  // the same
        wheelUp,
        wheelDown
    };

    Code code = Code::character;
    char32_t character = 0;
    int x = 0;
    int y = 0;

    bool is(char32_t wanted) const { return code == Code::character && character == wanted; }
};

}  // namespace reader::browse

#endif
