// One board: its managers and components, and what they answer. Not locked: the network that owns it is.
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
    Component* at(const Address& address);

    // Carries the command out; none for a command that has no reply.
    std::optional<Message> answer(const Message& command);

  private:
    uint8_t number_;
    std::deque<Component> components_;
};

}  // namespace softboard

#endif
