// A frame: its fields in words beside its octets, those of the field under the cursor lit.
#ifndef READER_BROWSE_MESSAGESCREEN_H
#define READER_BROWSE_MESSAGESCREEN_H

#include <cstdint>
#include <string>
#include <vector>

#include "reader/browse/Cursor.h"
#include "reader/browse/Screen.h"

namespace reader::browse {

class MessageScreen : public Screen {
  public:
    // `frames` are those that "next" and "previous" lead to; empty: all.
    MessageScreen(Desk& desk, std::uint64_t frame, std::vector<std::uint64_t> frames);

    std::string title() const override;
    void draw(Canvas& canvas, const Area& area) override;
    bool press(const Key& key) override;
    std::span<const KeyHint> keys() const override;

  private:
    // A field, or a heading.
    struct Row {
        std::string text{};
        std::vector<std::string> words{};  // the whole of it, where it stands, and the clause
        std::size_t begin = 0;
        std::size_t size = 0;  // octets of the frame; 0: none
        Style style{};
    };
    class Rows;

    void load(std::uint64_t frame);
    void step(bool forward);
    void drawOctets(Canvas& canvas, const Area& area) const;

    std::uint64_t frame_ = 0;
    std::vector<std::uint64_t> frames_;
    std::vector<std::string> headline_;
    std::vector<Row> rows_;
    std::vector<std::uint8_t> octets_;
    bool isThere_ = false;
    Cursor cursor_;
    int rowsTop_ = 0;
};

}  // namespace reader::browse

#endif
