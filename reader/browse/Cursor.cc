#include "reader/browse/Cursor.h"

#include <algorithm>

namespace reader::browse {

void Cursor::fit(std::size_t lines, int height) {
    lines_ = lines;
    height_ = static_cast<std::size_t>(std::max(height, 1));
    line_ = std::min(line_, lines == 0 ? 0 : lines - 1);
    top_ = std::min(top_, line_);
    if (line_ >= top_ + height_)
        top_ = line_ + 1 - height_;
    top_ = std::min(top_, lines > height_ ? lines - height_ : 0);
}

bool Cursor::press(const Key& key) {
    const std::size_t last = lines_ == 0 ? 0 : lines_ - 1;
    constexpr std::size_t wheel = 3;
    const auto up = [&](std::size_t by) { line_ -= std::min(by, line_); };
    const auto down = [&](std::size_t by) { line_ = std::min(line_ + by, last); };
    switch (key.code) {
        case Key::Code::up:
            up(1);
            return true;
        case Key::Code::down:
            down(1);
            return true;
        case Key::Code::pageUp:
            up(height_);
            return true;
        case Key::Code::pageDown:
            down(height_);
            return true;
        case Key::Code::wheelUp:
            up(wheel);
            return true;
        case Key::Code::wheelDown:
            down(wheel);
            return true;
        case Key::Code::home:
            line_ = 0;
            return true;
        case Key::Code::end:
            line_ = last;
            return true;
        default:
            return false;
    }
}

}  // namespace reader::browse
