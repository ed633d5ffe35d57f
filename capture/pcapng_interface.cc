#include "capture/pcapng_interface.h"

#include <algorithm>
#include <limits>

#include "capture/notes.h"

namespace capture::pcapng {

DescribedInterface::DescribedInterface(std::string_view body, Order order)
    : linkType_(numberAt<std::uint16_t>(body, 0, order)),
      snapLength_(numberAt<std::uint32_t>(body, 4, order)) {
    Options options(body.substr(fields), order);
    std::uint16_t code = 0;
    for (std::string_view value; options.next(code, value);)
        take(code, value, order);
    if (linkType_ == linuxLapd || linkType_ == plainLapd)
        link.emplace(linkType_, checkSequence_);
}

void DescribedInterface::take(std::uint16_t code, std::string_view value, Order order) {
    constexpr unsigned bitsInOctet = 8;
    if (code == interfaceName)
        told_.name = value;
    else if (code == interfaceText)
        told_.variant = variantIn(value);
    else if (code == timeResolution && !value.empty())
        resolution_ = Resolution::of(value[0]);
    else if (code == timeOffset && value.size() == sizeof offset_)
        offset_ = static_cast<std::int64_t>(numberAt<std::uint64_t>(value, 0, order));
    else if (code == checkSequenceSize && !value.empty())
        checkSequence_ = static_cast<unsigned char>(value[0]) / bitsInOctet;
    else if (code == comment && value == relativeTimes)
        clock_ = Clock::relative;
    else if (code == comment && value == noTimes)
        clock_ = Clock::none;
}

std::int64_t DescribedInterface::time(std::uint64_t units) const {
    constexpr std::int64_t perSecond = 1'000'000'000;
    constexpr std::int64_t furthest = std::numeric_limits<std::int64_t>::max() / perSecond / 4;
    return std::min(resolution_.nanoseconds(units), furthest * 2 * perSecond) +
           std::clamp(offset_, -furthest, furthest) * perSecond;
}

Interface DescribedInterface::named(const Interface& unnamed, const ReadOptions& options) const {
    Interface known = unnamed;
    if (options.trunk.empty() && !told_.name.empty())
        known.name = told_.name;
    if (known.variant == Variant::unknown)
        known.variant = told_.variant;
    return known;
}

}  // namespace capture::pcapng
