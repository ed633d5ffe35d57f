// The standard that a trunk's switch variant follows.
#ifndef CALLS_STANDARDVARIANT_H
#define CALLS_STANDARDVARIANT_H

#include "capture/Frame.h"
#include "isdn/Variant.h"

namespace calls {

// Returns `otherwise` for a trunk whose variant is not known.
isdn::Variant standardVariant(capture::Variant variant, isdn::Variant otherwise = isdn::Variant::net5);

}  // namespace calls

#endif
