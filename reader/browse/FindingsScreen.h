// The list of findings, as `lapdread check` reports them. Enter on a finding opens its frame.
#ifndef READER_BROWSE_FINDINGSSCREEN_H
#define READER_BROWSE_FINDINGSSCREEN_H

#include <array>
#include <cstdint>
#include <string>
#include <vector>

#include "reader/browse/Cursor.h"
#include "reader/browse/Screen.h"

namespace reader::browse {

class FindingsScreen : public Screen {
  public:
    explicit FindingsScreen(Desk& desk) : Screen(desk) {}

    std::string title() const override;
    void draw(Canvas& canvas, const Area& area) override;
    bool press(const Key& key) override;
    std::span<const KeyHint> keys() const override;
    void changed(const Changes& changes) override;

  private:
    void choose();
    void openFrame();
    const calls::Finding* at(std::size_t line) const;

    calls::Severity least_ = calls::Severity::note;
    std::vector<std::uint64_t> shown_;  // numbers of findings
    std::array<std::size_t, 3> counts_{};
    bool isStale_ = true;
    std::uint64_t current_ = 0;
    bool followsEnd_ = false;
    Cursor cursor_;
    int top_ = 0;
};

}  // namespace reader::browse

#endif
