// One attribute that instances are searched by.
#ifndef VELA_COMPATTR_H
#define VELA_COMPATTR_H

#include "vela/Body.h"

namespace vela {

namespace rows {
struct CompAttr {
    U32<"key"> key;
    S32<"value"> value;
};
}  // namespace rows

class CompAttr_t : public Body<noCode, rows::CompAttr> {
  public:
    static constexpr unsigned int componentType = 0;  // the key that a search by type uses

    CompAttr_t() = default;
    CompAttr_t(unsigned int attributeKey, int attributeValue) {
        key = attributeKey;
        value = attributeValue;
    }
};

}  // namespace vela

#endif
