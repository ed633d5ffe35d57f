// Items that outlive the reader's next one: copies of them, with their octets and texts.
#ifndef CAPTURE_BATCH_H
#define CAPTURE_BATCH_H

#include <cstdint>
#include <span>
#include <vector>

#include "capture/Item.h"

namespace capture {

// Keeps its memory from one use to the next. Interfaces and file names stay the reader's.
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
    std::vector<std::uint8_t> octets_;  // of all items, texts too, in their order
    mutable bool areBound_ = false;     // whether the items look into octets_
};

}  // namespace capture

#endif
