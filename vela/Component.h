// Handles on components and on component instances found on a board.
#ifndef VELA_COMPONENT_H
#define VELA_COMPONENT_H

#include "vela/StdResource.h"

namespace vela {

class Component : public StdResource {
  public:
    Component(const CompDesc_t& target, MsgQueue* queue) : StdResource(target, queue) {}
    explicit Component(const StdResource& found) : StdResource(found) {}
    Component(const Component& other) = default;
    ~Component() override { endCallbacks(); }

  private:
    [[maybe_unused]] unsigned int state_ = 0;
};

class TmpInstance;

// On destruction gives back what it reserved itself, and nothing else.
class Instance : public StdResource {
  public:
    // With inUse not 0 reserves the instance at once. Throws Timeout, UnexpectedMsg.
    Instance(const CompDesc_t& target, MsgQueue* queue, int inUse);
    Instance(const CompDesc_t& target, MsgQueue* queue) : Instance(target, queue, 0) {}
    explicit Instance(const StdResource& found) : StdResource(found) {}
    Instance(const Instance& other) : StdResource(other) {}  // reserves nothing of its own
    Instance(const TmpInstance& other, int inUse);           // as a copy, and then as the first
    ~Instance() override;

    // As StdResource's, and remembered.
    void use(unsigned int payload) override;
    void unuse() override;
    void free() override;

  protected:
    void giveUpOwnership() { ownsUse_ = reserved_ = false; }

  private:
    bool ownsUse_ = true;    // what was reserved is this handle's to give back
    bool reserved_ = false;  // and something was
};

// Gives nothing back: its end sends nothing to the board.
class TmpInstance : public Instance {
  public:
    TmpInstance(const CompDesc_t& target, MsgQueue* queue) : Instance(target, queue, 0) {}
    explicit TmpInstance(const StdResource& found) : Instance(found) {}
    TmpInstance(const TmpInstance& other) = default;
    ~TmpInstance() override {
        endCallbacks();
        giveUpOwnership();
    }
};

}  // namespace vela

#endif
