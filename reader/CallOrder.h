// What calls can be put in order by.
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
    // The call with the lowest value comes first; of equal ones that with the lowest number.
    std::int64_t (*value)(const calls::Call& call);
};
// The first one is that of their beginning.
std::span<const CallOrder> callOrders();

// Throws UsageError for a name that is none.
const CallOrder& callOrderNamed(const std::string& name);

}  // namespace reader

#endif
