// A line of text that the user types.
#ifndef READER_BROWSE_LINEINPUT_H
#define READER_BROWSE_LINEINPUT_H

#include <string>

#include "reader/browse/Key.h"

namespace reader::browse {

// Holds printable ASCII only. The cursor is always at the end.
class LineInput {
  public:
    const std::string& text() const { return text_; }
    void set(std::string text) { text_ = std::move(text); }
    // True if the key changes the text.
    bool press(const Key& key) {
        if (key.code == Key::Code::backspace) {
            if (!text_.empty())
                text_.pop_back();
            return true;
        }
        const bool isText =
            key.code == Key::Code::character && key.character >= U' ' && key.character <= U'~';
        if (isText && text_.size() < most)
            text_ += static_cast<char>(key.character);
        return isText;
    }

  private:
    static constexpr std::size_t most = 4000;

    std::string text_;
};

}  // namespace reader::browse

#endif
