// The part of Network that plays the frames of captures. One thread plays those of all boards.
#include <iostream>
#include <system_error>

#include "softboard/codes.h"
#include "softboard/network.h"
#include "softboard/wire.h"

namespace softboard {

namespace {

// After this many frames in a row the playing thread gives the lock back for a moment, so that hosts can
// read, write and close. It does not do so after each frame, because on a busy machine each yield costs a
// time slice.
constexpr unsigned mostInARow = 16;

}  // namespace

void Network::updatePlayers() {
    const auto now = std::chrono::steady_clock::now();
    bool playing = false;
    for (auto& [number, board] : boards_) {
        for (Component& component : board.components()) {
            component.updatePlayer(now);
            playing = playing || (component.player && component.player->playing());
        }
    }
    if (playing) {
        startPlaying();
    }
    changed_.notify_all();
}

// The transport's functions are called by C programs, so a thread that cannot be made is reported on the
// standard error stream and not by an exception. It is tried and reported once only.
void Network::startPlaying() {
    if (player_.joinable() || ending_ || threadless_) {
        return;
    }
    try {
        player_ = std::thread(&Network::play, this);
    } catch (const std::system_error& error) {
        threadless_ = true;
        std::cerr << std::string("softboard: no thread to play frames: ") + error.what() + '\n' << std::flush;
    }
}

// Whether the component's next frame may be sent: at least one subscribed queue exists, and none of them has
// mostWaiting unread messages. A frame waits while nobody subscribes, because otherwise nothing would slow
// the player down.
bool Network::heard(const Component& component) const {
    bool any = false;
    const bool waits = !misbehaviour_.bursting() && !misbehaviour_.has(FaultKind::neverWaits);
    for (const Address& target : component.traceTargets()) {
        const Queue* queue = queues_.at(target);
        if (waits && queue != nullptr && queue->waiting.size() >= mostWaiting) {
            return false;
        }
        any = any || queue != nullptr;
    }
    return any;
}

// Returns the component whose next frame is due first among those that may send one; null if there is none.
Component* Network::nextPlaying() {
    Component* next = nullptr;
    for (auto& [number, board] : boards_) {
        for (Component& component : board.components()) {
            const bool ready = component.player && component.player->playing() && heard(component);
            if (ready && (next == nullptr || component.player->due() < next->player->due())) {
                next = &component;
            }
        }
    }
    return next;
}

void Network::playNext(Component& component, Player::Time now) {
    const Player::Shown shown = component.player->next(now);
    const Frame& frame = *shown.frame;
    BodyWriter body;
    body.u32(component.label).u32(frame.transmitted ? 1 : 0).u32(shown.ticks);
    body.u32(static_cast<uint32_t>(frame.octets.size())).octets(frame.octets);
    for (const Address& target : component.traceTargets()) {
        const Message event{0, msgEvtDetected, component.address, target, body.body()};
        for (const Message& wrong : misbehaviour_.aheadOf(event)) {
            toHost(wrong);
        }
        toHost(event);
    }
}

void Network::play() {
    std::unique_lock guard(lock_);
    unsigned inARow = 0;
    while (!ending_) {
        Component* component = misbehaviour_.silent() ? nullptr : nextPlaying();
        if (component == nullptr) {
            changed_.wait(guard);
            continue;
        }
        const auto now = std::chrono::steady_clock::now();
        const auto due = component->player->due();
        if (due > now && !misbehaviour_.bursting()) {
            changed_.wait_until(guard, due);
            continue;
        }
        do {
            playNext(*component, now);
        } while (misbehaviour_.bursting() && component->player->playing());
        if (++inARow % mostInARow == 0) {
            guard.unlock();
            std::this_thread::yield();
            guard.lock();
        }
    }
}

}  // namespace softboard
