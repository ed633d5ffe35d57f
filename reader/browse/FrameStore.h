// Keeps the newest items of the input, up to a number of them.
#ifndef READER_BROWSE_FRAMESTORE_H
#define READER_BROWSE_FRAMESTORE_H

#include <cstdint>
#include <deque>
#include <memory>
#include <optional>
#include <vector>

#include "reader/browse/Page.h"

namespace reader::browse {

// The place of an item is its number in the whole input, counted from 0. Used on one thread. A copy shares
// the pages, which never change, so another thread may use it.
class FrameStore {
  public:
    static constexpr std::size_t usualMost = 1'000'000;

    explicit FrameStore(std::size_t most = usualMost) : most_(most) {}

    // Adds the items of a page, and drops the oldest pages that are not needed to keep `most` items.
    void add(std::shared_ptr<const Page> page);

    std::uint64_t begin() const { return pages_.empty() ? end_ : pages_.front().begin; }
    std::uint64_t end() const { return end_; }
    // How many items were dropped.
    std::uint64_t gone() const { return begin(); }
    // The number of the oldest frame that is kept; 0 if nothing is.
    std::uint64_t firstNumber() const { return pages_.empty() ? 0 : pages_.front().page->number(0); }
    std::uint64_t lastNumber() const {
        return pages_.empty() ? 0 : pages_.back().page->number(pages_.back().page->size() - 1);
    }

    // Makes `to` the item at this place. Returns false if it is not kept.
    bool load(std::uint64_t place, Shown& to) const;
    // The place of the frame with this number; nothing if it is not kept.
    std::optional<std::uint64_t> placeOf(std::uint64_t number) const;
    // The places in [from, to) of items for which Page::tellsOfLink is true, in order; the last `most` of
    // them.
    std::vector<std::uint64_t> tellingOfLinks(std::uint64_t from, std::uint64_t to, std::size_t most) const;

  private:
    struct Part {
        std::uint64_t begin;
        std::shared_ptr<const Page> page;
    };

    const Part* partOf(std::uint64_t place) const;

    // Pages are joined as long as they have no more items together.
    static constexpr std::size_t smallPage = 512;

    std::size_t most_;
    std::deque<Part> pages_;
    std::deque<std::uint64_t> links_;  // places of items for which tellsOfLink is true
    std::uint64_t end_ = 0;
};

}  // namespace reader::browse

#endif
