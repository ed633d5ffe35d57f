// The root of the layer's exceptions: thrown by value, printed with operator<<.
#ifndef VELA_EXCEPTION_H
#define VELA_EXCEPTION_H

#include "vela/virtualObject.h"

namespace vela {

class Exception : public virtualObject {
  public:
    // `name` is a string literal: it is kept, never copied or freed.
    explicit Exception(const char* name = "Exception") : name_(name) {}

    void toStream(std::ostream* out) const override;  // the name

  private:
    const char* name_;
};

}  // namespace vela

#endif
