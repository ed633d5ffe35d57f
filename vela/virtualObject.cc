#include "vela/virtualObject.h"

#include <ostream>

namespace vela {

void virtualObject::toStream(std::ostream*) const {}

std::ostream& operator<<(std::ostream& out, const virtualObject& object) {
    object.toStream(&out);
    return out;
}

}  // namespace vela
