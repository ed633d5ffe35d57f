// Writes the frames of a D channel for tests, message by message, with sequence numbers as two healthy link
// layers would send them. Our side is the user side unless a test says otherwise.
#ifndef TESTS_CALLS_CALLSCRIPT_H
#define TESTS_CALLS_CALLSCRIPT_H

#include <array>
#include <cstdint>
#include <deque>
#include <initializer_list>
#include <map>
#include <string>
#include <utility>
#include <vector>

#include "calls/Message.h"

namespace calls::test {

using Bytes = std::vector<std::uint8_t>;

// Elements as Q.931 4.5 lays them out.
inline Bytes bearerSpeech() { return {0x04, 0x03, 0x80, 0x90, 0xA3}; }
inline Bytes bearer64k() { return {0x04, 0x02, 0x88, 0x90}; }
inline Bytes cause(std::uint8_t value, std::uint8_t location = 0) {
    return {0x08, 0x02, static_cast<std::uint8_t>(0x80 | location), static_cast<std::uint8_t>(0x80 | value)};
}
inline Bytes channel(std::uint8_t number, bool exclusive = true) {
    return {0x18, 0x03, static_cast<std::uint8_t>(exclusive ? 0xA9 : 0xA1), 0x83,
            static_cast<std::uint8_t>(0x80 | number)};
}
inline Bytes digits(std::uint8_t id, std::uint8_t typeAndPlan, const std::string& text) {
    Bytes element{id, static_cast<std::uint8_t>(text.size() + 1),
                  static_cast<std::uint8_t>(0x80 | typeAndPlan)};
    element.insert(element.end(), text.begin(), text.end());
    return element;
}
inline Bytes called(const std::string& text) { return digits(0x70, 0x01, text); }
inline Bytes calling(const std::string& text) { return digits(0x6C, 0x21, text); }
inline Bytes callState(std::uint8_t state) { return {0x14, 0x01, state}; }
inline Bytes progress(std::uint8_t description) {
    return {0x1E, 0x02, 0x82, static_cast<std::uint8_t>(0x80 | description)};
}
inline Bytes restartIndicator(std::uint8_t kind) {
    return {0x79, 0x01, static_cast<std::uint8_t>(0x80 | kind)};
}
inline Bytes callIdentity(std::uint8_t id) { return {0x10, 0x01, id}; }
inline Bytes sendingComplete() { return {0xA1}; }

// One frame, with what the state machines are told besides.
struct Sent {
    Bytes octets;
    capture::Frame frame;
    std::uint64_t number = 0;
    std::int64_t at = 0;
};

class CallScript {
  public:
    explicit CallScript(capture::Role role = capture::Role::user) : role_(role) {}

    // The time of the next frames, in milliseconds since the script began.
    CallScript& at(std::int64_t milliseconds) {
        now_ = milliseconds * millisecond;
        return *this;
    }
    // Both sides take no notice of each other's next frame: each N(R) is that of before.
    CallScript& crossing() {
        crossing_ = 2;
        return *this;
    }
    CallScript& tei(std::uint8_t value) {
        tei_ = value;
        return *this;
    }

    // The D channel of the next frames.
    CallScript& on(const std::string& dChannel) {
        interface_ = &interfaces_.try_emplace(dChannel, capture::Interface{dChannel, capture::Variant::net5})
                          .first->second;
        return *this;
    }

    // The link is set up by our side; numbers begin at 0.
    CallScript& linkUp() {
        link() = {};
        return raw(Side::us, true, {0x7F}).raw(Side::peer, false, {0x73});  // SABME, UA
    }
    // RR: everything has arrived.
    CallScript& acknowledge(Side from) { return supervise(from, false, false); }
    // A poll, and the answer of the other side.
    CallScript& poll(Side from) { return supervise(from, true, true).supervise(other(from), false, true); }
    // The recorder does not see the last frame.
    CallScript& unrecorded() {
        frames_.pop_back();
        return *this;
    }
    // A frame that layer 2 sends again, octet for octet.
    CallScript& again(std::size_t frame) {
        const Sent& old = frames_.at(frame);
        return add(old.frame.transmitted ? Side::us : Side::peer, old.octets);
    }

    // From now on references are one octet long.
    CallScript& shortReferences() {
        shortReferences_ = true;
        return *this;
    }

    // A message in an I frame. `originFlag` is 0 from the side that chose the reference, 1 to it.
    CallScript& message(Side from, std::uint8_t type, std::uint16_t reference, bool originFlag,
                        std::initializer_list<Bytes> elements = {}) {
        Link& link = this->link();
        Bytes octets = address(from, true);
        const std::size_t side = from == Side::us ? 0 : 1;
        octets.push_back(static_cast<std::uint8_t>(link.sent[side] << 1));
        octets.push_back(static_cast<std::uint8_t>(link.seen[side] << 1));
        link.sent[side] = (link.sent[side] + 1) & 127;
        if (crossing_ == 0)
            link.seen[1 - side] = link.sent[side];
        else if (--crossing_ == 0)
            link.seen = {link.sent[1], link.sent[0]};
        append(octets, type, reference, originFlag, elements);
        return add(from, std::move(octets));
    }
    // SERVICE or its answer, with protocol discriminator 03 and the global reference.
    CallScript& maintenance(Side from, std::uint8_t type, bool originFlag,
                            std::initializer_list<Bytes> elements) {
        message(from, type, 0, originFlag, elements);
        frames_.back().octets[4] = 0x03;
        return *this;
    }
    // A message to all terminals, in a UI frame.
    CallScript& broadcast(Side from, std::uint8_t type, std::uint16_t reference,
                          std::initializer_list<Bytes> elements = {}) {
        const std::uint8_t before = tei_;
        tei_ = 127;
        Bytes octets = address(from, true);
        tei_ = before;
        octets.push_back(0x03);
        append(octets, type, reference, false, elements);
        return add(from, std::move(octets));
    }
    // A frame of control octets alone, or any octets behind the address.
    CallScript& raw(Side from, bool command, const Bytes& rest) {
        Bytes octets = address(from, command);
        octets.insert(octets.end(), rest.begin(), rest.end());
        return add(from, std::move(octets));
    }

    // Short forms: "us" sends with flag 0 or 1 to a reference.
    CallScript& us(std::uint8_t type, std::uint16_t ref, bool flag,
                   std::initializer_list<Bytes> elements = {}) {
        return message(Side::us, type, ref, flag, elements);
    }
    CallScript& peer(std::uint8_t type, std::uint16_t ref, bool flag,
                     std::initializer_list<Bytes> elements = {}) {
        return message(Side::peer, type, ref, flag, elements);
    }

    const std::deque<Sent>& frames() const { return frames_; }

    // The message that the call machine gets for a frame.
    Message toMessage(const Sent& sent) const {
        Message message;
        message.frame = &sent.frame;
        message.number = sent.number;
        message.at = sent.at;
        message.role = role_;
        message.layer2 = isdn::parseLayer2(sent.octets);
        message.layer3 = isdn::parseLayer3(message.layer2.information);
        return message;
    }

  private:
    struct Link {
        std::array<unsigned, 2> sent{};  // V(S) of us and of the peer
        std::array<unsigned, 2> seen{};  // V(R) of us and of the peer
    };

    Link& link() { return links_[{interface_->name, tei_}]; }

    CallScript& supervise(Side from, bool command, bool pf) {
        Link& link = this->link();
        const std::size_t side = from == Side::us ? 0 : 1;
        link.seen[side] = link.sent[1 - side];
        return raw(from, command, {0x01, static_cast<std::uint8_t>(link.seen[side] << 1 | (pf ? 1 : 0))});
    }

    Bytes address(Side from, bool command) const {
        const bool fromNetwork = (from == Side::us) == (role_ == capture::Role::network);
        const bool cr = command == fromNetwork;  // commands of the network and responses of the user
        return {static_cast<std::uint8_t>(cr ? 0x02 : 0x00), static_cast<std::uint8_t>(tei_ << 1 | 1)};
    }
    void append(Bytes& octets, std::uint8_t type, std::uint16_t reference, bool flag,
                std::initializer_list<Bytes> elements) const {
        if (shortReferences_)
            octets.insert(octets.end(),
                          {0x08, 0x01, static_cast<std::uint8_t>((flag ? 0x80 : 0) | reference), type});
        else
            octets.insert(octets.end(),
                          {0x08, 0x02, static_cast<std::uint8_t>((flag ? 0x80 : 0) | reference >> 8),
                           static_cast<std::uint8_t>(reference), type});
        for (const Bytes& element : elements)
            octets.insert(octets.end(), element.begin(), element.end());
    }
    CallScript& add(Side from, Bytes octets) {
        Sent& sent = frames_.emplace_back();
        sent.octets = std::move(octets);
        sent.number = frames_.size();
        sent.at = now_;
        sent.frame.octets = sent.octets;
        sent.frame.transmitted = from == Side::us;
        sent.frame.role = role_;
        sent.frame.clock = capture::Clock::relative;
        sent.frame.time = now_;
        sent.frame.ticks = static_cast<std::uint32_t>(now_ / capture::nanosecondsPerTick);
        sent.frame.interface = interface_;
        sent.frame.place = {"script", sent.number, capture::Place::Unit::packet};
        return *this;
    }

    capture::Role role_;
    std::map<std::string, capture::Interface> interfaces_{{"trunk", {"trunk", capture::Variant::net5}}};
    capture::Interface* interface_ = &interfaces_.at("trunk");
    std::deque<Sent> frames_;  // a deque leaves them where they are
    std::map<std::pair<std::string, std::uint8_t>, Link> links_;
    std::int64_t now_ = 0;
    std::uint8_t tei_ = 0;
    int crossing_ = 0;
    bool shortReferences_ = false;
};

}  // namespace calls::test

#endif
