// Copies of items, with their octets and texts, that stay valid when the reader gives its next item.
#ifndef CAPTURE_BATCH_H
#define CAPTURE_BATCH_H

#include <cstdint>
#include <span>
#include <vector>

#include "capture/Item.h"

namespace capture {

// clear() keeps the memory for the next use. Interfaces and file names are not copied; the reader owns them.
class Batch {
  public:
    void add(const Item& item);
    // Valid until the next add or clear.
    std::span<const Item> items() const;
    std::size_t octets() const { return octets_.size(); }
    bool empty() const { return items_.empty(); }
    void clear();

  private:
    mutable std::vector<Item> items_;
    std::vector<std::uint8_t> octets_;  // octets and texts of all items, in their order
    mutable bool areBound_ = false;     // whether the items look into octets_
};

}  // namespace capture

#endif
