#include "vela/Exception.h"

#include <ostream>

namespace vela {

void Exception::toStream(std::ostream* out) const { *out << name_; }

}  // namespace vela
