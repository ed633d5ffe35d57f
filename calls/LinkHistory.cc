#include "calls/LinkHistory.h"

namespace calls {

namespace {

constexpr std::array<std::string_view, linkNewsKinds> names{
    "start", "frames lost", "poll unanswered", "FRMR", "down", "DISC", "SABME", "up", "set-up not seen"};

// The event that a frame shows. If it shows several, the first of these tests decides.
std::optional<LinkNews> newsOf(const isdn::Layer2& frame, const Marks& marks) {
    if (marks.linkUp)
        return LinkNews::up;
    if (marks.linkDown)
        return LinkNews::down;
    if (marks.unseenSetUp)
        return LinkNews::unseen;
    if (marks.pollUnanswered)
        return LinkNews::pollUnanswered;
    switch (frame.type) {
        case isdn::FrameType::SABME:
        case isdn::FrameType::SABM:
            return LinkNews::asked;
        case isdn::FrameType::DISC:
            return LinkNews::released;
        case isdn::FrameType::FRMR:
            return LinkNews::rejected;
        default:
            return std::nullopt;
    }
}

}  // namespace

std::string_view nameOf(LinkNews news) { return names[static_cast<std::size_t>(news)]; }

void LinkHistory::take(const std::string& dChannel, const isdn::Layer2& frame, Side from, const Marks& marks,
                       const Moment& moment) {
    if (frame.sapi != isdn::callControlSapi || frame.tei == isdn::groupTei ||
        frame.problem != isdn::Problem::none)
        return;
    enter(dChannel, frame.tei, marks, moment);
    if (const std::optional<LinkNews> news = newsOf(frame, marks))
        add({*news, dChannel, frame.tei, from, moment});
}

void LinkHistory::note(const std::string& dChannel, LinkNews news, const Moment& moment) {
    losses_ += news == LinkNews::lost ? 1 : 0;
    add({news, dChannel, std::nullopt, std::nullopt, moment});
}

void LinkHistory::add(Entry entry) {
    entries_.push_back(std::move(entry));
    if (entries_.size() <= mostEntries)
        return;
    entries_.pop_front();
    ++gone_;
}

void LinkHistory::enter(const std::string& dChannel, std::uint8_t tei, const Marks& marks,
                        const Moment& moment) {
    const Key key(dChannel, tei);
    auto place = links_.find(key);
    if (place == links_.end()) {
        if (links_.size() >= mostLinks)
            return;
        place = links_.emplace(key, Standing()).first;
    }
    Standing& link = place->second;
    if (marks.linkUp)
        ++link.ups;
    const bool isAnew = marks.linkUp || marks.unseenSetUp;
    if (marks.state == link.state && !isAnew)
        return;
    const bool wasUp = link.state == LinkState::up;
    if (wasUp && (isAnew || marks.state != LinkState::unknown))
        ++link.downs;
    link.state = marks.state;
    link.since = moment;
    link.sawSetUp = marks.linkUp;
}

}  // namespace calls
