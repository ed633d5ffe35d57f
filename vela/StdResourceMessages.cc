#include "vela/StdResourceMessages.h"

namespace vela {

using Messages = StdResourceMessages;

std::size_t rows::Error::fieldsPresent() const {
    switch (ErrorMsg) {
        case Messages::MsgSetParm_t::code:
        case Messages::MsgSetxParms_t::code:
        case Messages::MsgGetParm_t::code:
        case Messages::MsgGetxParms_t::code:
        case Messages::MsgGetVParm_t::code:
        case Messages::MsgSetVParm_t::code:
            return 3;
        default:
            return 2;
    }
}

}  // namespace vela
