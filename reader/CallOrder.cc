#include "reader/CallOrder.h"

#include <algorithm>

#include "reader/errors.h"

namespace reader {

namespace {

constexpr CallOrder orders[] = {
    {"start", [](const calls::Call& call) { return static_cast<std::int64_t>(call.number); }},
    {"duration", [](const calls::Call& call) { return -call.duration.value_or(-1); }},
    {"connect", [](const calls::Call& call) { return -call.connect.value_or(-1); }},
    {"response", [](const calls::Call& call) { return -call.firstResponse.value_or(-1); }},
    {"cause",
     [](const calls::Call& call) { return call.cause ? std::int64_t{call.cause->value} : std::int64_t{0}; }},
    {"channel",
     [](const calls::Call& call) {
         const auto& channel = call.channel();
         return channel && channel->channels.any()
                    ? static_cast<std::int64_t>(channel->channels._Find_first())
                    : std::int64_t{-1};
     }},
};

}  // namespace

std::span<const CallOrder> callOrders() { return orders; }

const CallOrder& callOrderNamed(const std::string& name) {
    const auto* const found = std::find_if(std::begin(orders), std::end(orders),
                                           [&](const CallOrder& order) { return order.name == name; });
    if (found == std::end(orders))
        throw UsageError("calls cannot be sorted by " + name +
                         "; start, duration, connect, response, cause, channel");
    return *found;
}

}  // namespace reader
