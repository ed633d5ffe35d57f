// A frame: its fields in words beside its octets, of which those of the field under the cursor are in
// brackets. Below a segment it shows the message that the segment belongs to, with that message's octets.
#ifndef READER_BROWSE_MESSAGESCREEN_H
#define READER_BROWSE_MESSAGESCREEN_H

#include <array>
#include <cstdint>
#include <string>
#include <vector>

#include "reader/browse/Cursor.h"
#include "reader/browse/Screen.h"

namespace reader::browse {

class MessageScreen : public Screen {
  public:
    // The keys for the next and the previous frame go through `frames`; if it is empty, through all frames.
    MessageScreen(Desk& desk, std::uint64_t frame, std::vector<std::uint64_t> frames);

    std::string title() const override;
    void draw(Canvas& canvas, const Area& area) override;
    bool press(const Key& key) override;
    std::span<const KeyHint> keys() const override;

  private:
    // A field, or a heading.
    struct Row {
        std::string text{};
        std::vector<std::string> words{};  // the whole field, its place in the octets, and the clause
        std::size_t begin = 0;             // its first octet in the block
        std::size_t size = 0;              // how many octets it has in the block; 0: none
        std::size_t block = 0;             // which of blocks_ holds it
        Style style{};
    };
    class Rows;

    void load(std::uint64_t frame);
    void addJoined(isdn::Variant variant);
    void step(bool forward);
    const std::vector<std::uint8_t>& shownOctets() const;
    void drawOctets(Canvas& canvas, const Area& area) const;

    std::uint64_t frame_ = 0;
    std::vector<std::uint64_t> frames_;
    std::vector<std::string> headline_;
    std::vector<Row> rows_;
    std::array<std::vector<std::uint8_t>, 2> blocks_;  // the frame; the message put together of segments
    bool isThere_ = false;
    Cursor cursor_;
    int rowsTop_ = 0;
};

}  // namespace reader::browse

#endif
