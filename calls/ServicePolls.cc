#include "calls/ServicePolls.h"

#include <utility>

namespace calls {

void ServicePolls::take(const Sample& sample, std::int64_t longest, Marks& marks) {
    const isdn::Octets information = sample.layer2.information;
    const isdn::Layer3 message = isdn::parseLayer3(information);
    const std::size_t from = indexOf(sample.from());
    if (message.type == isdn::message::service) {
        const isdn::Octets channel = message.elements.find(isdn::element::channelIdentification).octets;
        auto& said = said_[from];
        if (said.size() >= mostChannels)
            said.clear();
        Octets now(information.begin(), information.end());
        Octets& before = said[{channel.begin(), channel.end()}];
        marks.keepAlive = before == now;
        before = std::move(now);
        polls_[from].reset();
        if (marks.keepAlive)
            polls_[from] = Poll{sample.number, sample.at};
    } else if (message.type == isdn::message::serviceAcknowledge) {
        const std::optional<Poll> poll = std::exchange(polls_[1 - from], std::nullopt);
        if (poll && sample.at - poll->at <= longest)
            marks.answers = poll->frame;
    }
}

}  // namespace calls
