#include "reader/browse/FrameStore.h"

#include <algorithm>

namespace reader::browse {

void FrameStore::add(std::shared_ptr<const Page> page) {
    if (page->empty())
        return;
    for (std::size_t i = 0; i < page->size(); ++i) {
        if (page->tellsOfLink(i))
            links_.push_back(end_ + i);
    }
    const std::uint64_t begin = end_;
    end_ += page->size();
    if (!pages_.empty() && pages_.back().page->size() + page->size() <= smallPage) {
        auto both = std::make_shared<Page>();
        both->append(*pages_.back().page);
        both->append(*page);
        pages_.back().page = std::move(both);
    } else {
        pages_.push_back({begin, std::move(page)});
    }
    while (pages_.size() > 1 && end_ - pages_[1].begin >= most_)
        pages_.pop_front();
    while (!links_.empty() && links_.front() < this->begin())
        links_.pop_front();
}

const FrameStore::Part* FrameStore::partOf(std::uint64_t place) const {
    if (place < begin() || place >= end_)
        return nullptr;
    const auto after =
        std::upper_bound(pages_.begin(), pages_.end(), place,
                         [](std::uint64_t wanted, const Part& part) { return wanted < part.begin; });
    return &*std::prev(after);
}

bool FrameStore::load(std::uint64_t place, Shown& to) const {
    const Part* const part = partOf(place);
    if (part == nullptr)
        return false;
    Page::load(part->page, place - part->begin, to);
    return true;
}

std::optional<std::uint64_t> FrameStore::placeOf(std::uint64_t number) const {
    auto after = std::upper_bound(
        pages_.begin(), pages_.end(), number,
        [](std::uint64_t wanted, const Part& part) { return wanted < part.page->number(0); });
    // A page may begin with an item that is no frame. Then its number is that of the last frame of the page
    // before it.
    for (; after != pages_.begin(); --after) {
        const Part& part = *std::prev(after);
        for (std::size_t low = 0, high = part.page->size(); low < high;) {
            const std::size_t middle = low + (high - low) / 2;
            if (part.page->number(middle) < number)
                low = middle + 1;
            else
                high = middle;
            if (low == high && low < part.page->size() && part.page->number(low) == number &&
                part.page->hasNumber(low))
                return part.begin + low;
        }
        if (part.page->number(0) < number)
            break;
    }
    return std::nullopt;
}

std::vector<std::uint64_t> FrameStore::tellingOfLinks(std::uint64_t from, std::uint64_t to,
                                                      std::size_t most) const {
    const auto begin = std::lower_bound(links_.begin(), links_.end(), from);
    const auto end = std::lower_bound(begin, links_.end(), to);
    const auto count = std::min<std::ptrdiff_t>(end - begin, static_cast<std::ptrdiff_t>(most));
    return {end - count, end};
}

}  // namespace reader::browse
