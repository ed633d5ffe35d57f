// The telephony service component: owns a trunk's lines and channels.
#ifndef VELA_TSCCOMPONENT_H
#define VELA_TSCCOMPONENT_H

#include "vela/Component.h"

namespace vela {

class TSCComponent : public Component {
  public:
    explicit TSCComponent(const Component& found) : Component(found) {}
    ~TSCComponent() override { endCallbacks(); }
};

}  // namespace vela

#endif
