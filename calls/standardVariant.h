// The rules that a trunk's switch variant goes by.
#ifndef CALLS_STANDARDVARIANT_H
#define CALLS_STANDARDVARIANT_H

#include "capture/Frame.h"
#include "isdn/Variant.h"

namespace calls {

// `otherwise` are those of a trunk whose variant is not known.
isdn::Variant standardVariant(capture::Variant variant, isdn::Variant otherwise = isdn::Variant::net5);

}  // namespace calls

#endif
