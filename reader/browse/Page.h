// Items of the input as they are kept for looking at: their octets and what was found out about them.
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

// An item with copies of all that it refers to, as a page gives it.
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

// Some items that follow each other. Filled on one thread; nobody changes it once it is shared. Names of D
// channels and files stay whoever handed them in's, who keeps them for as long as any page lives.
class Page {
  public:
    // `last` is the number of the frame before the first item.
    explicit Page(std::uint64_t last = 0) : last_(last) {}

    // The headers of the item have been read.
    void add(const Seen& seen, const capture::Interface* interface, std::string_view file);
    // All items of another page.
    void append(const Page& other);

    bool empty() const { return kept_.empty(); }
    std::size_t size() const { return kept_.size(); }
    // Of a frame its number, of another item that of the frame before it.
    std::uint64_t number(std::size_t item) const { return kept_[item].number; }
    // Of the last frame, or of that before the first item.
    std::uint64_t lastNumber() const { return last_; }
    bool hasNumber(std::size_t item) const { return kept_[item].isNumbered; }
    // A frame that sets a link up, ends it or asks for frames again, or something that is no frame: ladders
    // may show it beside the messages of a call.
    bool tellsOfLink(std::size_t item) const { return kept_[item].tellsOfLink; }
    std::int64_t at(std::size_t item) const { return kept_[item].at; }

    // Makes `to` the item, its headers read.
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
