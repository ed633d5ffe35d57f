#include "calls/standardVariant.h"

namespace calls {

isdn::Variant standardVariant(capture::Variant variant, isdn::Variant otherwise) {
    switch (variant) {
        case capture::Variant::att4ess:
            return isdn::Variant::ess4;
        case capture::Variant::ess5:
            return isdn::Variant::ess5;
        case capture::Variant::dms100:
            return isdn::Variant::dms100;
        case capture::Variant::ntt:
            return isdn::Variant::ntt;
        case capture::Variant::net5:
            return isdn::Variant::net5;
        case capture::Variant::ni2:
            return isdn::Variant::ni2;
        case capture::Variant::unknown:
            break;
    }
    return otherwise;
}

}  // namespace calls
