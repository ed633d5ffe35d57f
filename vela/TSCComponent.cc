#include "vela/TSCComponent.h"

namespace vela {

MsgBody* TSCComponent::MsgBodyLookup(unsigned int msgType) {
    MsgBody* const body = Bodies::make(msgType);
    return body != nullptr ? body : Component::MsgBodyLookup(msgType);
}

}  // namespace vela
