#include "calls/GatheredFindings.h"

#include <algorithm>
#include <utility>

#include "calls/findingOf.h"

namespace calls {

namespace {

constexpr std::size_t mostChannels = 512;  // the most channels that a finding names

}  // namespace

void GatheredFindings::report(Finding finding) {
    if (!first_) {
        first_ = std::move(finding);
        since_ = now_;
        return;
    }
    ++first_->count;
    std::vector<std::string>& channels = first_->channels;
    for (std::string& channel : finding.channels) {
        const bool isNew = std::find(channels.begin(), channels.end(), channel) == channels.end();
        if (isNew && channels.size() < mostChannels)
            channels.push_back(std::move(channel));
    }
}

void GatheredFindings::complete() {
    if (!first_)
        return;
    Finding all = *std::exchange(first_, std::nullopt);
    if (all.count > 1) {
        const std::string named =
            all.channels.empty() ? std::string() : (all.channels.size() == 1 ? "channel " : "channels ");
        all.sentence = sentence_(all, named + listOf(all.channels));
    }
    constexpr std::uint8_t anyTei = 0;  // all that come here are about one link
    repeated_.report(std::move(all), anyTei, now_);
}

void GatheredFindings::finish() {
    complete();
    repeated_.finish();
}

}  // namespace calls
