// Items of the input as they are kept in memory: their octets, and what was found out about them.
#ifndef READER_BROWSE_PAGE_H
#define READER_BROWSE_PAGE_H

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "reader/Seen.h"

namespace reader::browse {

class Page;

// An item that was loaded from a page, with everything that it refers to. Keeps the page alive.
class Shown {
  public:
    Shown() = default;
    Shown(const Shown&) = delete;  // its parts refer to each other
    Shown& operator=(const Shown&) = delete;

    const Seen& seen() const { return seen_; }

  private:
    friend class Page;

    Seen seen_;
    capture::Item item_;
    std::shared_ptr<const Page> page_;
};

// Consecutive items. One thread fills a page, and nobody changes it once it is shared. A page refers to names
// of D channels and files and does not own them; the caller of add() keeps them as long as any page exists.
class Page {
  public:
    // `last` is the number of the frame before the first item.
    explicit Page(std::uint64_t last = 0) : last_(last) {}

    // Copies an item whose headers have been read.
    void add(const Seen& seen, const capture::Interface* interface, std::string_view file);
    // Copies all items of another page.
    void append(const Page& other);

    bool empty() const { return kept_.empty(); }
    std::size_t size() const { return kept_.size(); }
    // The number of a frame; for an item that is no frame, the number of the frame before it.
    std::uint64_t number(std::size_t item) const { return kept_[item].number; }
    // The number of the last frame; if there is none, of the frame before the first item.
    std::uint64_t lastNumber() const { return last_; }
    bool hasNumber(std::size_t item) const { return kept_[item].isNumbered; }
    // Whether ladders may show the item beside the messages of a call: a frame that sets a link up, ends it
    // or asks for frames again, or an item that is no frame.
    bool tellsOfLink(std::size_t item) const { return kept_[item].tellsOfLink; }
    std::int64_t at(std::size_t item) const { return kept_[item].at; }

    // Makes `to` the item, and reads its headers.
    static void load(const std::shared_ptr<const Page>& page, std::size_t item, Shown& to);

  private:
    struct Kept {
        std::uint64_t number = 0;
        std::int64_t time = 0;
        std::int64_t at = 0;
        std::int64_t sinceFirst = 0;
        std::optional<std::int64_t> written;
        std::uint64_t count = 0;
        std::uint64_t place = 0;
        std::string_view file;
        const capture::Interface* interface = nullptr;
        std::optional<std::uint32_t> ticks;
        std::uint32_t begin = 0;   // of its octets, then its text, in octets_
        std::uint32_t octets = 0;  // how many
        std::uint32_t text = 0;
        calls::Marks marks;
        capture::Item::Kind kind = capture::Item::Kind::frame;
        capture::Clock frameClock = capture::Clock::none;
        capture::Clock clock = capture::Clock::none;
        std::int64_t frameTime = 0;
        capture::Role frameRole = capture::Role::unknown;
        capture::Place::Unit unit = capture::Place::Unit::line;
        capture::Role role = capture::Role::unknown;
        isdn::Variant variant = isdn::Variant::net5;
        std::optional<bool> command;
        bool transmitted = false;
        bool timeGoesBack = false;
        bool keepAlive = false;
        bool isNumbered = false;
        bool tellsOfLink = false;
    };

    std::vector<Kept> kept_;
    std::vector<std::uint8_t> octets_;
    std::uint64_t last_;
};

}  // namespace reader::browse

#endif
