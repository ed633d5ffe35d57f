// The newest items of the input, for as long as there is room.
#ifndef READER_BROWSE_FRAMESTORE_H
#define READER_BROWSE_FRAMESTORE_H

#include <cstdint>
#include <deque>
#include <memory>
#include <optional>
#include <vector>

#include "reader/browse/Page.h"

namespace reader::browse {

// Items have places, which count from 0 over the whole input. Used on one thread; copies of it share the
// pages, and may be used on another.
class FrameStore {
  public:
    static constexpr std::size_t usualMost = 1'000'000;

    explicit FrameStore(std::size_t most = usualMost) : most_(most) {}

    // Lets the oldest items go if there are too many.
    void add(std::shared_ptr<const Page> page);

    std::uint64_t begin() const { return pages_.empty() ? end_ : pages_.front().begin; }
    std::uint64_t end() const { return end_; }
    // Items that were let go.
    std::uint64_t gone() const { return begin(); }
    // The number of the oldest frame that is kept; 0 if nothing is.
    std::uint64_t firstNumber() const { return pages_.empty() ? 0 : pages_.front().page->number(0); }
    std::uint64_t lastNumber() const {
        return pages_.empty() ? 0 : pages_.back().page->number(pages_.back().page->size() - 1);
    }

    // False if it is not there.
    bool load(std::uint64_t place, Shown& to) const;
    // The place of a frame; nothing if it is not there.
    std::optional<std::uint64_t> placeOf(std::uint64_t number) const;
    // Places in [from, to) of what tells of links, in order; the last `most` of them.
    std::vector<std::uint64_t> tellingOfLinks(std::uint64_t from, std::uint64_t to, std::size_t most) const;

  private:
    struct Part {
        std::uint64_t begin;
        std::shared_ptr<const Page> page;
    };

    const Part* partOf(std::uint64_t place) const;

    // A page that is smaller takes in the next ones.
    static constexpr std::size_t smallPage = 512;

    std::size_t most_;
    std::deque<Part> pages_;
    std::deque<std::uint64_t> links_;  // places of what tells of links
    std::uint64_t end_ = 0;
};

}  // namespace reader::browse

#endif
