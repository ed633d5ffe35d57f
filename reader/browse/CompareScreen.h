// Two messages, or the messages of two calls, side by side; what differs is marked.
#ifndef READER_BROWSE_COMPARESCREEN_H
#define READER_BROWSE_COMPARESCREEN_H

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "reader/Comparison.h"
#include "reader/browse/Cursor.h"
#include "reader/browse/Screen.h"

namespace reader::browse {

class CompareScreen : public Screen {
  public:
    static std::unique_ptr<Screen> ofCalls(Desk& desk, std::uint64_t a, std::uint64_t b);
    static std::unique_ptr<Screen> ofMessages(Desk& desk, std::uint64_t a, std::uint64_t b);

    // A row: a message, an element, or a field with both values.
    struct Row {
        enum class Kind : std::uint8_t { message, element, field };

        Kind kind = Kind::field;
        std::string name{};
        std::string a{};  // empty: it is not there
        std::string b{};
        bool differs = false;
    };

    // The rows must be those of whole messages: each begins with its own row.
    CompareScreen(Desk& desk, std::string title, std::vector<Row> rows);

    std::string title() const override;
    void draw(Canvas& canvas, const Area& area) override;
    bool press(const Key& key) override;
    std::span<const KeyHint> keys() const override;

  private:
    void choose();
    void toNextDifference();

    std::string title_;
    std::vector<Row> rows_;
    std::vector<std::size_t> shown_;  // into rows_
    std::size_t differences_ = 0;
    bool onlyDifferences_ = false;
    Cursor cursor_;
    int top_ = 0;
};

// Rows of pairs of messages: each message, its elements and their fields.
std::vector<CompareScreen::Row> rowsOf(const std::vector<ComparedPair>& pairs);

}  // namespace reader::browse

#endif
