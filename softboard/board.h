// One simulated board: its managers and components, and how they answer commands.
//
// A board has no lock. The Network that owns it calls it under the network's lock.
#ifndef SOFTBOARD_BOARD_H
#define SOFTBOARD_BOARD_H

#include <deque>
#include <optional>

#include "softboard/component.h"

namespace softboard {

class Board {
  public:
    explicit Board(uint8_t number) : number_(number) { components_.push_back(tscComponent(number)); }

    void add(Component component) { components_.push_back(std::move(component)); }

    uint8_t number() const { return number_; }
    // The managers' address.
    Address address() const { return {0, number_, 0, 0, 0}; }
    std::deque<Component>& components() { return components_; }
    // Null when no component has the address. The board keeps the ownership.
    Component* at(const Address& address);

    // Carries the command out and returns the reply; none for a command that has no reply.
    std::optional<Message> answer(const Message& command);

  private:
    uint8_t number_;
    std::deque<Component> components_;
};

}  // namespace softboard

#endif
