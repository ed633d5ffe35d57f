// Components and component instances that were found on a board.
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

// A component instance. The destructor gives back what this object itself has reserved in the board, and
// nothing else.
class Instance : public StdResource {
  public:
    // If inUse is not 0, reserves the instance. Throws Timeout, UnexpectedMsg.
    Instance(const CompDesc_t& target, MsgQueue* queue, int inUse);
    Instance(const CompDesc_t& target, MsgQueue* queue) : Instance(target, queue, 0) {}
    explicit Instance(const StdResource& found) : StdResource(found) {}
    Instance(const Instance& other) : StdResource(other) {}  // a copy has reserved nothing itself
    Instance(const TmpInstance& other, int inUse);           // a copy; reserves as the first constructor does
    ~Instance() override;

    // The functions of StdResource. The object also remembers what it has reserved.
    void use(unsigned int payload) override;
    void unuse() override;
    void free() override;

  protected:
    void giveUpOwnership() { ownsUse_ = reserved_ = false; }

  private:
    bool ownsUse_ = true;    // the destructor gives back what was reserved
    bool reserved_ = false;  // something was reserved
};

// An instance whose destructor gives nothing back and sends nothing to the board.
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
