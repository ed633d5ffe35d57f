// The orders in which calls can be sorted.
#ifndef READER_CALLORDER_H
#define READER_CALLORDER_H

#include <cstdint>
#include <span>
#include <string>
#include <string_view>

#include "calls/Call.h"

namespace reader {

struct CallOrder {
    std::string_view name;
    // The call with the lowest value comes first; among equal values, the call with the lowest number.
    std::int64_t (*value)(const calls::Call& call);
};
// All orders. The first one is the order of the calls' beginning.
std::span<const CallOrder> callOrders();

// Throws UsageError if no order has this name.
const CallOrder& callOrderNamed(const std::string& name);

}  // namespace reader

#endif
