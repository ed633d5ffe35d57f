#include "capture/Batch.h"

#include "capture/octets.h"

namespace capture {

void Batch::add(const Item& item) {
    items_.push_back(item);
    octets_.insert(octets_.end(), item.frame.octets.begin(), item.frame.octets.end());
    octets_.insert(octets_.end(), item.text.begin(), item.text.end());
    areBound_ = false;
}

// Octets move while the batch grows, so items get their views only when they are asked for.
std::span<const Item> Batch::items() const {
    if (!areBound_) {
        std::span<const std::uint8_t> rest = octets_;
        for (Item& item : items_) {
            const std::size_t octets = item.frame.octets.size();
            const std::size_t text = item.text.size();
            item.frame.octets = rest.first(octets);
            item.text = textOf(rest.subspan(octets, text));
            rest = rest.subspan(octets + text);
        }
        areBound_ = true;
    }
    return items_;
}

void Batch::clear() {
    items_.clear();
    octets_.clear();
}

}  // namespace capture
